#include "frame/CommandChannel.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>

#include <steam/steam_api.h>

#include "foundation/DecimalText.h"
#include "foundation/InlineString.h"
#include "foundation/ListToken.h"
#include "foundation/TextFormat.h"
#include "frame/LanguageMapping.h"
#include "frame/SteamManager.h"
#include "host/HostReport.h"
#include "host/HostServices.h"
#include "services/achievements/SteamAchievements.h"

namespace {

// A token of 2048 bytes or more does not fit and counts as missing.
constexpr int32_t kTokenBufferSize = 2048;
constexpr int32_t kRingSize = 8;

// "GetStatisticsInt" answers from a ring, so eight answers stay readable at once.
char statisticRing[kRingSize][128];
int32_t statisticRingIndex = 0;
char playerIdText[64];
char serverTimeText[64];
char branchName[256];

bool Equals(const char* text, const char* expected)
{
    return text != nullptr && std::strcmp(text, expected) == 0;
}

// Token `index` of `list`, copied out at once; a missing token leaves the text null.
InlineString TakeToken(const char* list, const char* separator, int32_t index)
{
    char buffer[kTokenBufferSize];
    InlineString token;
    token.Assign(GetListToken(buffer, kTokenBufferSize, list, separator, index));
    return token;
}

// Statistics reached through this channel carry the prefix "stat_" on the platform.
InlineString StatisticKey(const char* name)
{
    InlineString key;
    key.Assign("stat_");
    key.Append(name);
    return key;
}

const char* OpenStoreWithAppId(const char* argument)
{
    InlineString token = TakeToken(argument, ";", 0);
    bool hasToken = token.text != nullptr && token.text[0] != '\0';
    if (hasToken) {
        AppId_t appId = static_cast<AppId_t>(DecimalToInt32(token.text));
        if (SteamUtils() != nullptr && SteamUtils()->IsOverlayEnabled()) {
            if (SteamFriends() != nullptr)
                SteamFriends()->ActivateGameOverlayToStore(appId, k_EOverlayToStoreFlag_None);
            return nullptr;
        }
    }
    // Without the overlay the store opens as an address, with the token as written.
    char url[256];
    FormatToBuffer(url, sizeof url, "steam://purchase/%s", token.text != nullptr ? token.text : "");
    HostCommandIfPresent("OpenURL", url);  // before Initialize there is no engine to ask
    return nullptr;
}

const char* GetPlayerOnlineId()
{
    uint32 accountId = LocalAccountId();
    FormatToBuffer(playerIdText, sizeof playerIdText, "%d", static_cast<int32_t>(accountId));
    return accountId != 0 ? playerIdText : nullptr;
}

const char* GetServerTime()
{
    if (SteamUtils() == nullptr)
        return nullptr;
    FormatToBuffer(serverTimeText, sizeof serverTimeText, "%d",
                   static_cast<int32_t>(SteamUtils()->GetServerRealTime()));
    return serverTimeText;
}

const char* UnlockAchievement(const char* argument)
{
    InlineString name = TakeToken(argument, ",", 1);
    UnlockAchievementIfConnected(name.text);
    return "OK";  // whatever happened
}

const char* GetStatisticsInt(const char* argument)
{
    InlineString name = TakeToken(argument, ",", 1);
    if (!steamManager.initialised)
        return nullptr;
    InlineString key = StatisticKey(name.text);
    int32 value = 0;
    if (SteamUserStats() != nullptr)
        SteamUserStats()->GetStat(key.text, &value);  // a failure leaves 0
    if (value == 0)
        return nullptr;
    char* result = statisticRing[statisticRingIndex];
    FormatToBuffer(result, sizeof statisticRing[0], "%d", value);
    statisticRingIndex = (statisticRingIndex + 1) % kRingSize;
    return result;
}

const char* SetStatisticsInt(const char* argument)
{
    InlineString name = TakeToken(argument, ",", 1);
    InlineString valueText = TakeToken(argument, ",", 2);
    int32_t value = valueText.text != nullptr ? DecimalToInt32(valueText.text) : 0;
    if (steamManager.initialised) {
        InlineString key = StatisticKey(name.text);
        // Stored later by the updater thread, not here.
        if (SteamUserStats() != nullptr)
            SteamUserStats()->SetStat(key.text, value);
    }
    return nullptr;
}

const char* GameCenter(const char* argument)
{
    InlineString action = TakeToken(argument, ",", 0);
    if (action.text == nullptr)
        return nullptr;
    if (Equals(action.text, "UnlockAchievement"))
        return UnlockAchievement(argument);
    if (Equals(action.text, "ShowAchievements"))
        return nullptr;
    if (Equals(action.text, "IsAvailable"))
        return SteamAPI_IsSteamRunning() ? "OK" : nullptr;
    if (Equals(action.text, "GetStatisticsInt"))
        return GetStatisticsInt(argument);
    if (Equals(action.text, "SetStatisticsInt"))
        return SetStatisticsInt(argument);
    return nullptr;
}

const char* GetBranchName()
{
    if (SteamApps() == nullptr)
        return nullptr;
    return SteamApps()->GetCurrentBetaName(branchName, sizeof branchName) ? branchName : nullptr;
}

}  // namespace

const char* DispatchCommand(const char* name, const char* argument)
{
    // With the client gone the whole channel answers null.
    if (!SteamAPI_IsSteamRunning() || name == nullptr)
        return nullptr;
    if (Equals(name, "Steam")) {
        if (Equals(argument, "RunCallbacks"))
            SteamAPI_RunCallbacks();
        return nullptr;
    }
    if (Equals(name, "OpenStoreWithAppId"))
        return OpenStoreWithAppId(argument);
    if (Equals(name, "GetPlayerOnlineID"))
        return GetPlayerOnlineId();
    if (Equals(name, "GetServerTime"))
        return GetServerTime();
    if (Equals(name, "GameCenter"))
        return GameCenter(argument);
    if (Equals(name, "GetLanguage"))
        return CurrentLanguageLocaleCode();
    if (Equals(name, "GetBranchName"))
        return GetBranchName();
    return nullptr;
}
