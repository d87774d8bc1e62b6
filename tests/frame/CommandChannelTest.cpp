// The string commands: each answer on its paths, and the platform calls behind it.
#include <gtest/gtest.h>

#include <optional>

#include "ModuleHarness.h"

namespace {

class CommandChannel : public ModuleTest {
protected:
    std::optional<std::string> Run(const char* name, const char* argument)
    {
        const char* answer = module->Command(name, argument);
        if (answer == nullptr)
            return std::nullopt;
        return std::string(answer);
    }

    std::vector<simengine::CommandCall> OpenedUrls() { return engine.Records().All().Commands("OpenURL"); }
};

TEST_F(CommandChannel, WithTheClientGoneEveryCommandAnswersNull)
{
    ASSERT_TRUE(Start());
    world.DefineStat("stat_kills", 5);
    world.SetSteamRunning(false);
    world.ClearJournal();
    const std::pair<const char*, const char*> commands[] = {
        {"Steam", "RunCallbacks"},
        {"OpenStoreWithAppId", "440"},
        {"GetPlayerOnlineID", nullptr},
        {"GetServerTime", nullptr},
        {"GameCenter", "IsAvailable"},
        {"GameCenter", "UnlockAchievement,WIN"},
        {"GameCenter", "GetStatisticsInt,kills"},
        {"GetLanguage", nullptr},
        {"GetBranchName", nullptr},
    };
    for (const auto& [name, argument] : commands) {
        SCOPED_TRACE(name);
        EXPECT_EQ(Run(name, argument), std::nullopt);
    }
    std::vector<std::string> afterRunningCheck = world.GetJournal().Names();
    afterRunningCheck.erase(
        std::remove(afterRunningCheck.begin(), afterRunningCheck.end(), "SteamAPI_IsSteamRunning"),
        afterRunningCheck.end());
    EXPECT_TRUE(afterRunningCheck.empty()) << afterRunningCheck.front();
    EXPECT_TRUE(OpenedUrls().empty());
}

TEST_F(CommandChannel, NullAndUnknownInputsAnswerNull)
{
    ASSERT_TRUE(Start());
    world.ClearJournal();
    // Null names and arguments and "ShowAchievements" are the scenario commands/channel_edges.
    EXPECT_EQ(Run("GameCenter", "Dance,now"), std::nullopt);
    EXPECT_EQ(Run("gamecenter", "IsAvailable"), std::nullopt);
    EXPECT_EQ(Run("NoSuchCommand", "x"), std::nullopt);
    EXPECT_EQ(Run("Steam", "runcallbacks"), std::nullopt);
    EXPECT_EQ(Run("Steam", nullptr), std::nullopt);
    EXPECT_EQ(PlatformCalls("SteamAPI_RunCallbacks"), 0u);
    EXPECT_EQ(Run("Steam", "RunCallbacks"), std::nullopt);
    EXPECT_EQ(PlatformCalls("SteamAPI_RunCallbacks"), 1u);
    EXPECT_EQ(Run("GameCenter", "IsAvailable"), "OK");
}

TEST_F(CommandChannel, BeforeInitializeCommandsAnswerWithoutTheEngine)
{
    // No table yet: the store address cannot be opened, and nothing may crash.
    EXPECT_EQ(Run("OpenStoreWithAppId", "440"), std::nullopt);
    EXPECT_EQ(Run("GetLanguage", nullptr), std::nullopt);
    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt,kills"), std::nullopt);
    EXPECT_EQ(Run("GameCenter", "IsAvailable"), "OK");
    EXPECT_TRUE(engine.Records().All().Entries().empty());
}

TEST_F(CommandChannel, UnlockAchievementAlwaysAnswersOk)
{
    world.DefineAchievement("WIN");
    EXPECT_EQ(Run("GameCenter", "UnlockAchievement,WIN"), "OK");  // not connected yet
    EXPECT_EQ(PlatformCalls("SetAchievement"), 0u);
    ASSERT_TRUE(Start());
    EXPECT_EQ(Run("GameCenter", "UnlockAchievement"), "OK");
    EXPECT_EQ(PlatformCalls("SetAchievement"), 0u);
    EXPECT_EQ(Run("GameCenter", "UnlockAchievement,WIN"), "OK");
    EXPECT_EQ(world.AchievementUnlocked("WIN"), true);
    // Names pass unchanged: no prefix for achievements.
    EXPECT_EQ(world.GetJournal().Calls("SetAchievement").at(0).args, "\"WIN\"");
}

TEST_F(CommandChannel, StatisticsUseThePrefixedKey)
{
    world.DefineStat("stat_kills", 0);
    world.DefineStat("stat_", 3);
    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt,kills"), std::nullopt);  // not connected
    EXPECT_EQ(PlatformCalls("GetStat"), 0u);
    ASSERT_TRUE(Start());

    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt,kills"), std::nullopt);  // 0 reads as null
    EXPECT_EQ(world.GetJournal().Calls("GetStat").at(0).args.rfind("\"stat_kills\"", 0), 0u);
    EXPECT_EQ(Run("GameCenter", "SetStatisticsInt,kills,42"), std::nullopt);
    EXPECT_EQ(world.Stat("stat_kills"), 42);
    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt,kills"), "42");
    EXPECT_EQ(Run("GameCenter", "SetStatisticsInt,kills"), std::nullopt);  // no value: 0
    EXPECT_EQ(world.Stat("stat_kills"), 0);
    EXPECT_EQ(Run("GameCenter", "SetStatisticsInt,kills,-7x"), std::nullopt);
    EXPECT_EQ(world.Stat("stat_kills"), -7);
    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt,kills"), "-7");
    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt"), "3");  // missing name: the key is "stat_"
    EXPECT_EQ(Run("GameCenter", "GetStatisticsInt,unknown"), std::nullopt);
    // Nothing is stored by a command.
    EXPECT_EQ(PlatformCalls("StoreStats"), 0u);
}

TEST_F(CommandChannel, EightStatisticResultsStayReadableTheNinthReusesTheFirst)
{
    for (int i = 1; i <= 9; ++i)
        world.DefineStat("stat_s" + std::to_string(i), i * 11);
    ASSERT_TRUE(Start());
    std::vector<const char*> answers;
    for (int i = 1; i <= 9; ++i)
        answers.push_back(module->Command("GameCenter", ("GetStatisticsInt,s" + std::to_string(i)).c_str()));
    for (int i = 0; i < 8; ++i) {
        SCOPED_TRACE(i);
        ASSERT_NE(answers[i], nullptr);
        if (i > 0) {
            EXPECT_STREQ(answers[i], std::to_string((i + 1) * 11).c_str());
        }
    }
    EXPECT_EQ(answers[8], answers[0]);
    EXPECT_STREQ(answers[0], "99");
}

TEST_F(CommandChannel, OpenStoreWithAppId)
{
    struct Row {
        const char* name;
        bool overlayEnabled;
        const char* argument;
        std::optional<AppId_t> storeAppId;  // the overlay was used
        std::optional<std::string> url;     // the address was opened instead
    };
    const Row rows[] = {
        {"overlay", true, "440", 440u, std::nullopt},
        {"overlay, first token only", true, "440;9", 440u, std::nullopt},
        {"overlay, no digits parse as 0", true, "abc", 0u, std::nullopt},
        {"no overlay", false, "440", std::nullopt, "steam://purchase/440"},
        {"empty first token", true, ";440", std::nullopt, "steam://purchase/"},
        {"null argument", true, nullptr, std::nullopt, "steam://purchase/"},
    };
    ASSERT_TRUE(Start());
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        world.SetOverlayEnabled(row.overlayEnabled);
        size_t storeBefore = world.StoreOverlayRequests().size();
        size_t urlsBefore = OpenedUrls().size();
        EXPECT_EQ(Run("OpenStoreWithAppId", row.argument), std::nullopt);
        auto store = world.StoreOverlayRequests();
        auto urls = OpenedUrls();
        if (row.storeAppId) {
            ASSERT_EQ(store.size(), storeBefore + 1);
            EXPECT_EQ(store.back().first, *row.storeAppId);
            EXPECT_EQ(store.back().second, k_EOverlayToStoreFlag_None);
            EXPECT_EQ(urls.size(), urlsBefore);
        } else {
            EXPECT_EQ(store.size(), storeBefore);
            ASSERT_EQ(urls.size(), urlsBefore + 1);
            EXPECT_EQ(urls.back().argument, row.url);
        }
    }
}

TEST_F(CommandChannel, PlayerIdServerTimeBranch)
{
    ASSERT_TRUE(Start());
    EXPECT_EQ(Run("GetPlayerOnlineID", nullptr), "1234");
    world.SetLocalUser(kIndividualAccountBase + 0x80000000ull, true, "Big");
    EXPECT_EQ(Run("GetPlayerOnlineID", "ignored"), "-2147483648");
    world.SetLocalUser(kIndividualAccountBase, true, "Zero");
    EXPECT_EQ(Run("GetPlayerOnlineID", nullptr), std::nullopt);

    world.SetServerTime(0);
    EXPECT_EQ(Run("GetServerTime", nullptr), "0");
    world.SetServerTime(1700000000);
    EXPECT_EQ(Run("GetServerTime", nullptr), "1700000000");

    world.SetBetaName(std::string("public-beta"));
    EXPECT_EQ(Run("GetBranchName", nullptr), "public-beta");
    world.SetBetaName(std::nullopt);
    EXPECT_EQ(Run("GetBranchName", nullptr), std::nullopt);

    world.SetInterfaceAvailable(simclient::Interface::User, false);
    world.SetInterfaceAvailable(simclient::Interface::Utils, false);
    world.SetInterfaceAvailable(simclient::Interface::Apps, false);
    world.SetBetaName(std::string("public-beta"));
    EXPECT_EQ(Run("GetPlayerOnlineID", nullptr), std::nullopt);
    EXPECT_EQ(Run("GetServerTime", nullptr), std::nullopt);
    EXPECT_EQ(Run("GetBranchName", nullptr), std::nullopt);
}

TEST_F(CommandChannel, LanguageAnswersAndLogLine)
{
    struct Row {
        std::optional<std::string> platformWord;
        const char* code;
        const char* logLine;
    };
    const Row rows[] = {
        {std::string("german"), "de", "ExtensionModuleSteam - language: german (de)"},
        {std::string("latam"), "es", "ExtensionModuleSteam - language: latam (es)"},
        {std::string("German"), "en", "ExtensionModuleSteam - language: German (en)"},
        {std::string(""), "en", "ExtensionModuleSteam - language:  (en)"},
        {std::nullopt, "null", "ExtensionModuleSteam - language: null (null)"},
    };
    ASSERT_TRUE(Start());
    for (const Row& row : rows) {
        SCOPED_TRACE(row.logLine);
        world.SetGameLanguage(row.platformWord);
        uint64_t mark = engine.Records().Mark();
        EXPECT_EQ(Run("GetLanguage", nullptr), row.code);
        auto logs = engine.Records().Since(mark).Logs();
        ASSERT_EQ(logs.size(), 1u);
        EXPECT_EQ(logs[0].level, 0);
        EXPECT_EQ(logs[0].text, row.logLine);
    }
    world.SetInterfaceAvailable(simclient::Interface::Apps, false);
    uint64_t mark = engine.Records().Mark();
    EXPECT_EQ(Run("GetLanguage", nullptr), std::nullopt);
    EXPECT_TRUE(engine.Records().Since(mark).Logs().empty());
}

}  // namespace
