// Interface lookup through the inline accessors, and the small per-interface behaviours.
#include <cstring>
#include <iterator>

#include "SimFixture.h"

namespace {

using simclient::Interface;

class Interfaces : public SimWorld {};

// The accessor of each interface, in the order of simclient::Interface.
bool (*const kAvailable[])() = {
    [] { return SteamClient() != nullptr; },        [] { return SteamUser() != nullptr; },
    [] { return SteamUtils() != nullptr; },         [] { return SteamApps() != nullptr; },
    [] { return SteamFriends() != nullptr; },       [] { return SteamUserStats() != nullptr; },
    [] { return SteamRemoteStorage() != nullptr; }, [] { return SteamUGC() != nullptr; },
};
static_assert(std::size(kAvailable) == simclient::kInterfaceCount);
bool Available(Interface which)
{
    return kAvailable[int(which)]();
}

// A stale cached pointer after an availability change would show up here.
TEST_F(Interfaces, AvailabilityChangesAreSeenThroughCachedAccessors)
{
    for (int i = 0; i < simclient::kInterfaceCount; ++i) {
        auto which = static_cast<Interface>(i);
        SCOPED_TRACE(i);
        EXPECT_TRUE(Available(which));
        world.SetInterfaceAvailable(which, false);
        EXPECT_FALSE(Available(which));
        for (int j = 0; j < simclient::kInterfaceCount; ++j)
            if (j != i) {
                EXPECT_TRUE(Available(static_cast<Interface>(j))) << "other " << j;
            }
        world.SetInterfaceAvailable(which, true);
        EXPECT_TRUE(Available(which));
    }
}

TEST_F(Interfaces, LookupNeedsInitAndTheRightVersion)
{
    EXPECT_EQ(SteamInternal_FindOrCreateUserInterface(SteamAPI_GetHSteamUser(), "SteamUser020"), nullptr);
    EXPECT_EQ(SteamInternal_CreateInterface("SteamClient021"), nullptr);
    EXPECT_NE(SteamInternal_FindOrCreateUserInterface(0, STEAMUTILS_INTERFACE_VERSION), nullptr);
    SteamAPI_Shutdown();
    EXPECT_EQ(SteamUser(), nullptr);
    EXPECT_EQ(SteamClient(), nullptr);
    ASSERT_TRUE(SteamAPI_Init());
    EXPECT_NE(SteamUser(), nullptr);
}

// The tour plays what the module reads here besides: the account id, the server time,
// the language, the branch, a disabled overlay, a stat set and read, a store that confirms
// an unlock, and a cloud file written, read, deleted and gone.

TEST_F(Interfaces, UserAndUtils)
{
    world.SetLocalUser(76561197960265728ull + 77, false, "Me");
    world.SetAppId(1234);
    EXPECT_FALSE(SteamUser()->BLoggedOn());
    EXPECT_EQ(SteamUtils()->GetAppID(), 1234u);
    SteamUtils()->SetOverlayNotificationPosition(k_EPositionTopRight);
    EXPECT_EQ(world.NotificationPosition(), k_EPositionTopRight);
}

TEST_F(Interfaces, LanguageAndBetaBranch)
{
    world.SetGameLanguage(std::nullopt);
    EXPECT_EQ(SteamApps()->GetCurrentGameLanguage(), nullptr);

    char buffer[8];
    std::memset(buffer, 'X', sizeof buffer);
    EXPECT_FALSE(SteamApps()->GetCurrentBetaName(buffer, sizeof buffer));
    EXPECT_EQ(buffer[0], 'X') << "written without a beta";
    world.SetBetaName("public-test");
    char small[5];
    std::memset(small, 'X', sizeof small);
    EXPECT_TRUE(SteamApps()->GetCurrentBetaName(small, 4));
    EXPECT_STREQ(small, "pub");
    EXPECT_EQ(small[4], 'X') << "wrote past the given size";
}

TEST_F(Interfaces, DownloadableContent)
{
    world.SetDlcs({{10, true, true, "Ten"}, {20, false, false, "Twenty"}});
    EXPECT_EQ(SteamApps()->GetDLCCount(), 2);
    EXPECT_TRUE(SteamApps()->BIsDlcInstalled(10));
    EXPECT_FALSE(SteamApps()->BIsDlcInstalled(20));
    EXPECT_FALSE(SteamApps()->BIsDlcInstalled(30));
    AppId_t app = 0;
    bool available = true;
    char name[16] = {};
    EXPECT_TRUE(SteamApps()->BGetDLCDataByIndex(1, &app, &available, name, sizeof name));
    EXPECT_EQ(app, 20u);
    EXPECT_FALSE(available);
    EXPECT_STREQ(name, "Twenty");
    EXPECT_FALSE(SteamApps()->BGetDLCDataByIndex(2, &app, &available, name, sizeof name));
    world.SetDlcInstalled(20, true);
    EXPECT_TRUE(SteamApps()->BIsDlcInstalled(20));
}

TEST_F(Interfaces, OverlayRequestsAreRecorded)
{
    SteamFriends()->ActivateGameOverlayToStore(55, k_EOverlayToStoreFlag_AddToCartAndShow);
    SteamFriends()->ActivateGameOverlayToWebPage("https://example.test/");
    ASSERT_EQ(world.StoreOverlayRequests().size(), 1u);
    EXPECT_EQ(world.StoreOverlayRequests()[0].first, 55u);
    ASSERT_EQ(world.WebPageRequests().size(), 1u);
    EXPECT_EQ(world.WebPageRequests()[0].first, "https://example.test/");
    static std::string received;
    EXPECT_FALSE(world.EmitWarning(1, "ignored"));
    SteamClient()->SetWarningMessageHook([](int, const char* text) { received = text; });
    EXPECT_TRUE(world.EmitWarning(1, "careful"));
    EXPECT_EQ(received, "careful");
}

TEST_F(Interfaces, StatsAndAchievementStore)
{
    world.DefineStat("kills", 3);
    world.DefineAchievement("A", false);
    world.DefineAchievement("B", true);
    int32 value = -1;
    EXPECT_FALSE(SteamUserStats()->GetStat("missing", &value));
    EXPECT_EQ(value, -1);
    EXPECT_TRUE(SteamUserStats()->GetStat("kills", &value));
    EXPECT_EQ(value, 3);
    EXPECT_TRUE(SteamUserStats()->SetStat("kills", int32(9)));
    EXPECT_EQ(world.Stat("kills"), 9);
    EXPECT_FALSE(SteamUserStats()->SetAchievement("missing"));
    EXPECT_TRUE(SteamUserStats()->SetAchievement("A"));
    EXPECT_TRUE(SteamUserStats()->SetAchievement("B"));  // already unlocked: not "new"

    Listener<UserStatsStored_t> s;
    Listener<UserAchievementStored_t> a;
    EXPECT_TRUE(SteamUserStats()->StoreStats());
    SteamAPI_RunCallbacks();
    EXPECT_EQ(s.calls, 1);
    EXPECT_EQ(a.calls, 1);
    EXPECT_STREQ(a.last.m_rgchAchievementName, "A");
    EXPECT_TRUE(SteamUserStats()->StoreStats());
    SteamAPI_RunCallbacks();
    EXPECT_EQ(a.calls, 1) << "an unlock is reported by one store only";
}

TEST_F(Interfaces, CloudFiles)
{
    ISteamRemoteStorage* rs = SteamRemoteStorage();
    EXPECT_TRUE(rs->FileWrite("save", "hello", 5));
    char out[8] = {};
    EXPECT_EQ(rs->FileRead("save", out, 2), 2);
    EXPECT_STREQ(out, "he");
    EXPECT_EQ(rs->FileRead("none", out, 8), 0);
    rs->SetCloudEnabledForApp(false);
    EXPECT_EQ(world.CloudEnabledForApp(), false);
}

}  // namespace
