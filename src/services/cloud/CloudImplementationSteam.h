// Cloud storage over the platform's remote storage. Unlike the other services
// it keeps the interface pointer it got at Initialize.
#pragma once

#include "services/cloud/CloudImplementation.h"

class ISteamRemoteStorage;

class CloudImplementationSteam : public CloudImplementation {
public:
    int32_t GetServiceType() override;
    const char* GetPlatformName() override;
    bool Initialize() override;
    bool WriteFile(const char* name, const void* data, int32_t size) override;
    HostBuffer* ReadFile(const char* name) override;
    bool DeleteFile(const char* name) override;

    ISteamRemoteStorage* remoteStorage = nullptr;
};
