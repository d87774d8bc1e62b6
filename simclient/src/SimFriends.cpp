// ISteamFriends: persona names and the overlay requests (recorded, never shown).
#include "Args.h"
#include "SimInterfaces.h"
#include "WorldState.h"

namespace simclient {
namespace {

class SimSteamFriends final : public ISteamFriends {
public:
    const char* GetFriendPersonaName(CSteamID steamIDFriend) override
    {
        CallScope call("GetFriendPersonaName", Args(steamIDFriend));
        WorldState& s = call.state;
        uint64 id = steamIDFriend.ConvertToUint64();
        if (call.faults.fail)
            return "";
        if (id == s.userId)
            return s.personaName.c_str();
        auto found = s.personas.find(id);
        if (found == s.personas.end() || !found->second.second)
            return "[unknown]";
        return found->second.first.c_str();
    }

    void ActivateGameOverlayToWebPage(const char* pchURL, EActivateGameOverlayToWebPageMode eMode) override
    {
        CallScope call("ActivateGameOverlayToWebPage", Args(pchURL, eMode));
        call.state.webRequests.emplace_back(pchURL ? pchURL : "", eMode);
    }

    void ActivateGameOverlayToStore(AppId_t nAppID, EOverlayToStoreFlag eFlag) override
    {
        CallScope call("ActivateGameOverlayToStore", Args(nAppID, eFlag));
        call.state.storeRequests.emplace_back(nAppID, eFlag);
    }

    // True (and a PersonaStateChange_t later) only when the name still has to be fetched.
    bool RequestUserInformation(CSteamID steamIDUser, bool bRequireNameOnly) override
    {
        CallScope call("RequestUserInformation", Args(steamIDUser, bRequireNameOnly));
        WorldState& s = call.state;
        uint64 id = steamIDUser.ConvertToUint64();
        if (call.faults.fail)
            return false;
        auto found = s.personas.find(id);
        if (id == s.userId || (found != s.personas.end() && found->second.second))
            return false;
        PersonaStateChange_t change{};
        change.m_ulSteamID = id;
        change.m_nChangeFlags = k_EPersonaChangeName;
        s.QueueCallback(PersonaStateChange_t::k_iCallback, &change, sizeof change, call.faults.extraLatency,
                        [&s, id] {
                            auto it = s.personas.find(id);
                            if (it != s.personas.end())
                                it->second.second = true;
                        });
        return true;
    }
};

}  // namespace

ISteamFriends* SimFriends()
{
    static SimSteamFriends instance;
    return &instance;
}

}  // namespace simclient
