// The two abstract interfaces the engine knows: the module and its services.
//
// The engine calls every operation by its position in the table of virtual
// operations, so the order of declarations below is a binary interface.
#pragma once

#include <cstdint>

struct HostServices;
class BaseImplementation;

class ExtensionModule {
public:
    virtual ~ExtensionModule() {}
    virtual int32_t GetModuleType() { return 2; }
    virtual int32_t GetInterfaceStamp() { return 0x3C42000; }
    virtual const char* GetName() = 0;
    virtual bool Initialize(HostServices* services) = 0;
    virtual void Shutdown() = 0;
    virtual bool IsOverlayActive() { return false; }
    virtual void Update() = 0;
    virtual const char* Command(const char* name, const char* argument)
    {
        (void)name;
        (void)argument;
        return nullptr;
    }
    virtual BaseImplementation* GetImplementation(int32_t serviceNumber) = 0;
};

// Service numbers of GetImplementation.
enum ServiceNumber : int32_t {
    kServiceCloud = 1,
    kServiceLeaderboards = 2,
    kServiceAchievements = 3,
    kServiceStore = 4,
    kServiceWorkshop = 6,
};

class BaseImplementation {
public:
    virtual ~BaseImplementation() {}
    virtual int32_t GetServiceType() = 0;
    virtual const char* GetPlatformName() = 0;
    virtual bool Initialize() { return true; }
    virtual void Shutdown() {}
    virtual void Update() {}
    virtual bool IsAvailable() { return true; }
};

// The one export of the module.
extern "C" ExtensionModule* OB_GetExtensionModuleInterface();
using GetExtensionModuleInterfaceFn = ExtensionModule* (*)();
