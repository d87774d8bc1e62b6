// ISteamApps: language, beta branch and downloadable content.
#include <algorithm>
#include <cstring>

#include "Args.h"
#include "SimInterfaces.h"
#include "WorldState.h"

namespace simclient {
namespace {

// Copies `text` into a caller's buffer of `size` bytes, truncating, always terminated.
void CopyOut(const std::string& text, char* out, int size)
{
    if (!out || size <= 0)
        return;
    std::size_t n = std::min<std::size_t>(text.size(), static_cast<std::size_t>(size) - 1);
    std::memcpy(out, text.data(), n);
    out[n] = '\0';
}

class SimSteamApps final : public ISteamApps {
public:
    const char* GetCurrentGameLanguage() override
    {
        CallScope call(SIM_CALL("GetCurrentGameLanguage"), "");
        if (call.faults.fail || !call.state.language)
            return nullptr;
        return call.state.Intern(*call.state.language);
    }

    bool GetCurrentBetaName(char* pchName, int cchNameBufferSize) override
    {
        CallScope call(SIM_CALL("GetCurrentBetaName"), Args(pchName, cchNameBufferSize));
        if (call.faults.fail || !call.state.beta)
            return false;
        CopyOut(*call.state.beta, pchName, cchNameBufferSize);
        return true;
    }

    bool BIsDlcInstalled(AppId_t appID) override
    {
        CallScope call(SIM_CALL("BIsDlcInstalled"), Args(appID));
        if (call.faults.fail)
            return false;
        for (const Dlc& dlc : call.state.dlcs)
            if (dlc.appId == appID)
                return dlc.installed;
        return false;
    }

    int GetDLCCount() override
    {
        CallScope call(SIM_CALL("GetDLCCount"), "");
        return call.faults.fail ? 0 : static_cast<int>(call.state.dlcs.size());
    }

    bool BGetDLCDataByIndex(int iDLC, AppId_t* pAppID, bool* pbAvailable, char* pchName,
                            int cchNameBufferSize) override
    {
        CallScope call(SIM_CALL("BGetDLCDataByIndex"),
                       Args(iDLC, pAppID, pbAvailable, pchName, cchNameBufferSize));
        const auto& dlcs = call.state.dlcs;
        if (call.faults.fail || iDLC < 0 || iDLC >= static_cast<int>(dlcs.size()))
            return false;
        const Dlc& dlc = dlcs[static_cast<std::size_t>(iDLC)];
        if (pAppID)
            *pAppID = dlc.appId;
        if (pbAvailable)
            *pbAvailable = dlc.available;
        CopyOut(dlc.name, pchName, cchNameBufferSize);
        return true;
    }
};

}  // namespace

ISteamApps* SimApps()
{
    static SimSteamApps instance;
    return &instance;
}

}  // namespace simclient
