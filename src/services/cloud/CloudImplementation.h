// Service number 1 as the engine sees it: whole named files in the cloud.
#pragma once

#include <cstdint>

#include "frame/ExtensionModule.h"

struct HostBuffer;

class CloudImplementation : public BaseImplementation {
public:
    virtual bool WriteFile(const char* name, const void* data, int32_t size) = 0;
    // A buffer of the engine's, which it owns from then on; null when unreadable.
    virtual HostBuffer* ReadFile(const char* name) = 0;
    virtual bool DeleteFile(const char* name) = 0;
};
