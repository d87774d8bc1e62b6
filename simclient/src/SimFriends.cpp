// ISteamFriends: persona names, and the overlay requests: recorded, and a store request
// opens the overlay and plays the scripted visit (World::SetStoreVisit).
#include <algorithm>

#include "Args.h"
#include "SimInterfaces.h"
#include "WorldState.h"

namespace simclient {
namespace {

void PostOverlay(WorldData& d, bool active)
{
    d.overlayShown = active;
    GameOverlayActivated_t overlay{};
    overlay.m_bActive = active ? 1 : 0;
    d.PostNow(overlay);
}

// At the pump after a store request: the overlay opens, then the user acts as scripted.
void PlayStoreVisit(WorldData& d, const std::optional<StoreVisit>& visit, AppId_t product)
{
    if (!d.overlayShown)
        PostOverlay(d, true);
    if (!visit)
        return;
    if (visit->buyAfter) {
        const Delay installAfter = visit->installAfter;
        d.RunAfter(*visit->buyAfter, [installAfter, product](WorldData& bought) {
            bought.RunAfter(installAfter, [product](WorldData& installing) {
                for (Dlc& dlc : installing.dlcs)
                    if (dlc.appId == product)
                        dlc.installed = true;
            });
        });
    }
    d.RunAfter(visit->closeAfter, [](WorldData& closing) {
        if (closing.overlayShown)
            PostOverlay(closing, false);
    });
}

class SimSteamFriends final : public ISteamFriends {
public:
    const char* GetFriendPersonaName(CSteamID steamIDFriend) override
    {
        CallScope call(SIM_CALL("GetFriendPersonaName"), Args(steamIDFriend));
        WorldState& s = call.state;
        uint64 id = steamIDFriend.ConvertToUint64();
        if (call.faults.fail)
            return "";
        if (id == s.userId)
            return s.Intern(s.personaName);
        auto found = s.personas.find(id);
        if (found == s.personas.end() || found->second.arrival != Persona::Arrival::Known)
            return "[unknown]";
        return s.Intern(found->second.name);
    }

    void ActivateGameOverlayToWebPage(const char* pchURL, EActivateGameOverlayToWebPageMode eMode) override
    {
        CallScope call(SIM_CALL("ActivateGameOverlayToWebPage"), Args(pchURL, eMode));
        call.state.webRequests.emplace_back(pchURL ? pchURL : "", eMode);
    }

    void ActivateGameOverlayToStore(AppId_t nAppID, EOverlayToStoreFlag eFlag) override
    {
        CallScope call(SIM_CALL("ActivateGameOverlayToStore"), Args(nAppID, eFlag));
        WorldState& s = call.state;
        s.storeRequests.emplace_back(nAppID, eFlag);
        if (call.faults.fail || !s.overlayEnabled)
            return;
        std::optional<StoreVisit> visit = s.storeVisit;
        s.ScheduleAt(Due::Pump(s.pump + 1),
                     [visit, nAppID](WorldData& d) { PlayStoreVisit(d, visit, nAppID); });
        s.SyncQueuedCount();
    }

    // True while the name is not known. The first such request starts the one lookup
    // (World::SetPersonaNameArrives); its end makes the name known and posts the change.
    bool RequestUserInformation(CSteamID steamIDUser, bool bRequireNameOnly) override
    {
        CallScope call(SIM_CALL("RequestUserInformation"), Args(steamIDUser, bRequireNameOnly));
        WorldState& s = call.state;
        uint64 id = steamIDUser.ConvertToUint64();
        if (call.faults.fail || id == s.userId)
            return false;
        auto found = s.personas.find(id);
        if (found == s.personas.end())  // nobody the world knows: the lookup finds no name
            found = s.personas
                        .emplace(id, Persona{"[unknown]", Persona::Arrival::OnRequest,
                                             Delay::Pumps(static_cast<uint64_t>(s.latency)), false})
                        .first;
        Persona& persona = found->second;
        if (persona.arrival == Persona::Arrival::Known)
            return false;
        if (persona.arrival == Persona::Arrival::OnRequest && !persona.lookingUp) {
            persona.lookingUp = true;
            Delay delay = persona.delay;
            if (delay.clock == Clock::Pump)
                delay.amount = static_cast<uint64_t>(
                    std::max<int64_t>(1, static_cast<int64_t>(delay.amount) + call.faults.extraLatency));
            s.ScheduleAt(s.DueAfter(delay), [id](WorldData& d) {
                auto it = d.personas.find(id);
                if (it == d.personas.end() || it->second.arrival != Persona::Arrival::OnRequest)
                    return;
                it->second.arrival = Persona::Arrival::Known;
                it->second.lookingUp = false;
                PersonaStateChange_t change{};
                change.m_ulSteamID = id;
                change.m_nChangeFlags = k_EPersonaChangeName;
                d.PostNow(change);
            });
            s.SyncQueuedCount();
        }
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
