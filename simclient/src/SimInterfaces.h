// The simulated interface objects, one static instance each.
#ifndef SIMCLIENT_SIM_INTERFACES_H
#define SIMCLIENT_SIM_INTERFACES_H

#include <steam/steam_api.h>

namespace simclient {

ISteamClient* SimClient();
ISteamUser* SimUser();
ISteamUtils* SimUtils();
ISteamApps* SimApps();
ISteamFriends* SimFriends();
ISteamUserStats* SimUserStats();
ISteamRemoteStorage* SimRemoteStorage();
ISteamUGC* SimUGC();

}  // namespace simclient

#endif  // SIMCLIENT_SIM_INTERFACES_H
