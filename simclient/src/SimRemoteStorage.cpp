// ISteamRemoteStorage: whole named files kept in memory.
#include <algorithm>
#include <cstring>

#include "Args.h"
#include "SimInterfaces.h"
#include "WorldState.h"

namespace simclient {
namespace {

class SimSteamRemoteStorage final : public ISteamRemoteStorage {
public:
    bool FileWrite(const char* pchFile, const void* pvData, int32 cubData) override
    {
        CallScope call(SIM_CALL("FileWrite"), Args(pchFile, cubData));
        if (call.faults.fail || !pchFile || !*pchFile || cubData < 0 ||
            static_cast<uint32>(cubData) > k_unMaxCloudFileChunkSize || (cubData > 0 && !pvData))
            return false;
        const uint8* bytes = static_cast<const uint8*>(pvData);
        call.state.files[pchFile].assign(bytes, bytes + cubData);
        return true;
    }

    int32 FileRead(const char* pchFile, void* pvData, int32 cubDataToRead) override
    {
        CallScope call(SIM_CALL("FileRead"), Args(pchFile, cubDataToRead));
        if (call.faults.fail || !pchFile || !pvData || cubDataToRead <= 0)
            return 0;
        auto found = call.state.files.find(pchFile);
        if (found == call.state.files.end())
            return 0;
        std::size_t n = std::min<std::size_t>(found->second.size(), std::size_t(cubDataToRead));
        if (call.faults.shortRead)
            n = std::min<std::size_t>(n, std::size_t(*call.faults.shortRead));
        if (n)
            std::memcpy(pvData, found->second.data(), n);
        return static_cast<int32>(n);
    }

    bool FileDelete(const char* pchFile) override
    {
        CallScope call(SIM_CALL("FileDelete"), Args(pchFile));
        if (call.faults.fail || !pchFile)
            return false;
        return call.state.files.erase(pchFile) > 0;
    }

    bool FileExists(const char* pchFile) override
    {
        CallScope call(SIM_CALL("FileExists"), Args(pchFile));
        if (call.faults.fail || !pchFile)
            return false;
        return call.state.files.count(pchFile) > 0;
    }

    int32 GetFileSize(const char* pchFile) override
    {
        CallScope call(SIM_CALL("GetFileSize"), Args(pchFile));
        if (call.faults.fail || !pchFile)
            return 0;
        auto found = call.state.files.find(pchFile);
        return found == call.state.files.end() ? 0 : static_cast<int32>(found->second.size());
    }

    void SetCloudEnabledForApp(bool bEnabled) override
    {
        CallScope call(SIM_CALL("SetCloudEnabledForApp"), Args(bEnabled));
        call.state.cloudEnabledForApp = bEnabled;
    }
};

}  // namespace

ISteamRemoteStorage* SimRemoteStorage()
{
    static SimSteamRemoteStorage instance;
    return &instance;
}

}  // namespace simclient
