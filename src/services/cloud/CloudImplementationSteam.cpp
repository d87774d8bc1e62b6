#include "services/cloud/CloudImplementationSteam.h"

#include <steam/steam_api.h>

#include "host/HostServices.h"

int32_t CloudImplementationSteam::GetServiceType()
{
    return kServiceCloud;
}

const char* CloudImplementationSteam::GetPlatformName()
{
    return "Steam";
}

bool CloudImplementationSteam::Initialize()
{
    remoteStorage = SteamRemoteStorage();
    if (remoteStorage == nullptr)
        return false;
    remoteStorage->SetCloudEnabledForApp(true);  // every start turns the app's cloud on
    return true;
}

bool CloudImplementationSteam::WriteFile(const char* name, const void* data, int32_t size)
{
    return remoteStorage->FileWrite(name, data, size);
}

HostBuffer* CloudImplementationSteam::ReadFile(const char* name)
{
    if (!remoteStorage->FileExists(name))
        return nullptr;
    int32 size = remoteStorage->GetFileSize(name);
    HostBuffer* buffer = hostServices->CreateBuffer(static_cast<uint32_t>(size));
    // All or nothing: a short read never hands the engine part of a file.
    if (remoteStorage->FileRead(name, buffer->data, size) == size)
        return buffer;
    hostServices->ReleaseBuffer(buffer);
    return nullptr;
}

bool CloudImplementationSteam::DeleteFile(const char* name)
{
    return remoteStorage->FileDelete(name);
}
