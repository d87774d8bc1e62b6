// Service 2's table, its configuration and its score clients, as the engine sees them.
#include <gtest/gtest.h>

#include <string>

#include "LeaderboardFixture.h"

namespace leaderboard_test {
namespace {

template <class Result, class... Args> Result CallSlot(void* object, int slot, Args... args)
{
    void** table = *reinterpret_cast<void***>(object);
    using Function = Result (*)(void*, Args...);
    return reinterpret_cast<Function>(table[slot])(object, args...);
}

TEST_F(LeaderboardTest, OperationsInTableOrder)
{
    AddBoard("Speed", 3);
    world.SetLocalUser(kIndividualAccountBase + 0xFFFFFFFFu, true, "Me");
    ASSERT_TRUE(Start());
    BaseImplementation* object = module->GetImplementation(2);
    ASSERT_NE(object, nullptr);
    // Two destructor slots, then the base's other six, then the service's eleven.
    EXPECT_EQ(CallSlot<int32_t>(object, 2), 2);
    EXPECT_STREQ(CallSlot<const char*>(object, 3), "Steam");
    EXPECT_EQ(CallSlot<const char*>(object, 11), nullptr);  // GetUserId before Initialize
    EXPECT_EQ(CallSlot<int32_t>(object, 18), 30);
    EXPECT_TRUE(CallSlot<bool>(object, 7));
    engine.SetFeatureEnabled("LEADERBOARDS", true);
    engine.Files().AddMemoryFile(kConfigPath, ConfigWith({"id=\"Speed\""}));
    EXPECT_TRUE(CallSlot<bool>(object, 4));
    engine.Threads().Join(kConfigThread);
    AwaitQueueThreadsAsleep();
    module->Update();
    CallSlot<void>(object, 5);
    CallSlot<void>(object, 6);
    EXPECT_STREQ(CallSlot<const char*>(object, 11), "-1");
    EXPECT_FALSE(CallSlot<bool>(object, 12));
    CallSlot<void>(object, 13);
    CallSlot<void>(object, 14);
    EXPECT_EQ(CallSlot<int32_t>(object, 15), 2);
    EXPECT_FALSE(CallSlot<bool>(object, 16));
    CallSlot<void>(object, 17);

    const uint64_t mark = engine.Records().Mark();
    EXPECT_FALSE(CallSlot<bool>(object, 9, int32_t{1}, int32_t{3}, int32_t{0}, "Nope"));
    EXPECT_TRUE(CallSlot<bool>(object, 9, int32_t{1}, int32_t{3}, int32_t{0}, "Speed"));
    EXPECT_TRUE(CallSlot<bool>(object, 10, int32_t{99}, int32_t{3}, "Speed"));
    ScoreEntry record{};
    record.score = 50;
    CallSlot<void>(object, 8, int32_t{0}, static_cast<const ScoreEntry*>(&record), "Speed");
    engine.Time().Advance(1);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping(kRequestThread));
    ASSERT_TRUE(engine.Time().WaitUntilSleeping(kSubmitThread));
    module->Update();
    engine.Threads().Join(kResultsThread);
    EXPECT_EQ(engine.Records().Since(mark).Events(19).size(), 2u);
    EXPECT_EQ(CallArgs("DownloadLeaderboardEntries").size(), 2u);
    EXPECT_EQ(PlatformCalls("UploadLeaderboardScore"), 1u);
}

TEST_F(LeaderboardTest, ServiceStateFollowsThePlatform)
{
    StartService(ConfigWith({}));
    EXPECT_EQ(service->GetServiceState(), 2);
    world.SetSteamRunning(false);
    EXPECT_EQ(service->GetServiceState(), 0);
    EXPECT_EQ(service->GetFixedLimit(), 30);
}

TEST_F(LeaderboardTest, StartsMutexesUserIdAndThreadsInOrder)
{
    StartService(ConfigWith({}));
    std::vector<std::string> names;
    for (const auto& start : engine.Records().All().ThreadStarts())
        names.push_back(start.name);
    const std::vector<std::string> expected = {"SteamStats_Updater", kConfigThread, kRequestThread,
                                               kSubmitThread, kUserThread};
    EXPECT_EQ(names, expected);
    EXPECT_STREQ(service->GetUserId(), "1234");
    EXPECT_EQ(engine.Mutexes().Counts("STEAM_LEADERBOARDS_REQUEST").creates, 1);
    EXPECT_EQ(engine.Mutexes().Counts("STEAM_LEADERBOARDS_SUBMIT").creates, 1);
}

TEST_F(LeaderboardTest, SortAndDisplayWordsAreExact)
{
    struct Row {
        const char* attributes;
        int sort;
        int display;
    };
    const Row rows[] = {
        {"", 2, 1},
        {"sort=\"ASCENDING\" display_type=\"NUMERIC\"", 1, 1},
        {"sort=\"LOWEST_SCORE_FIRST\" display_type=\"SECONDS\"", 1, 2},
        {"sort=\"ascending\" display_type=\"MILLISECONDS\"", 2, 3},
        {"sort=\"DESCENDING\" display_type=\"milliseconds\"", 2, 1},
    };
    std::vector<std::string> nodes;
    for (size_t i = 0; i < std::size(rows); ++i)
        nodes.push_back("id=\"B" + std::to_string(i) + "\" " + rows[i].attributes);
    StartService(ConfigWith(nodes));
    const std::vector<std::string> finds = CallArgs("FindOrCreateLeaderboard");
    ASSERT_EQ(finds.size(), std::size(rows));
    for (size_t i = 0; i < std::size(rows); ++i) {
        SCOPED_TRACE(rows[i].attributes);
        EXPECT_EQ(finds[i], "\"B" + std::to_string(i) + "\", " + std::to_string(rows[i].sort) + ", " +
                                std::to_string(rows[i].display));
    }
}

TEST_F(LeaderboardTest, ConfigurationFailuresAndTheirMessages)
{
    struct Row {
        const char* name;
        bool feature;
        const char* file;  // null: no file at all
        std::vector<std::string> reports;
        size_t finds;
    };
    const std::string missing = "Unable to locate leaderboards.xml! Leaderboards will not work.";
    const Row rows[] = {
        {"feature off", false, "<root><array id=\"CATEGORIES\"><node id=\"A\"/></array></root>", {}, 0},
        {"no CATEGORIES", true, "<root><array id=\"OTHER\"><node id=\"A\"/></array></root>", {missing}, 0},
        {"empty CATEGORIES", true, "<root><array id=\"CATEGORIES\"></array></root>", {}, 0},
        {"node without id",
         true,
         "<root><array id=\"CATEGORIES\"><node sort=\"x\"/><node id=\"A\"/></array></root>",
         {},
         1},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        TearDown();
        SetUp();
        engine.Files().AddMemoryFile(kConfigPath, std::string(kXmlHead) + row.file);
        ASSERT_TRUE(Start());
        service = ServiceAt<LeaderboardsImplementation>(2);
        engine.SetFeatureEnabled("LEADERBOARDS", row.feature);
        ASSERT_TRUE(service->Initialize());
        engine.Threads().Join(kConfigThread);
        std::vector<std::string> reports;
        for (const auto& line : engine.Records().All().Logs(simengine::LogKind::Report))
            reports.push_back(line.text);
        EXPECT_EQ(reports, row.reports);
        EXPECT_EQ(PlatformCalls("FindOrCreateLeaderboard"), row.finds);
        EXPECT_EQ(engine.Records().All().FileOpens().size(), row.feature ? 1u : 0u);
        EXPECT_FALSE(service->RequestScores(1, 1, 0, "A") && row.finds == 0);
    }
}

TEST_F(LeaderboardTest, FindLogsOneLinePerClient)
{
    world.AddLeaderboard("Good", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric);
    world.AddLeaderboard("Broken", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric);
    world.AddLeaderboard("Lost", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric);
    world.InjectFault("FindOrCreateLeaderboard", simclient::Fault::IoFailure().Skip(1));
    world.InjectFault("FindOrCreateLeaderboard", simclient::Fault::ZeroHandle().Skip(2));
    StartService(ConfigWith({"id=\"Good\"", "id=\"Broken\"", "id=\"Lost\""}));
    const std::string found =
        "OnCreateLeaderboard: Found leaderboard (handle = 1, name = Good), no errors detected";
    const std::string failed =
        "OnCreateLeaderboard: Did not found leaderboard (handle = 2), IO failure detected";
    std::vector<std::string> lines;
    for (const auto& line : engine.Records().All().Logs(simengine::LogKind::Log))
        if (line.text.rfind("OnCreateLeaderboard", 0) == 0)
            lines.push_back(std::to_string(line.level) + " " + line.text);
    const std::vector<std::string> expected = {"0 " + found,  "0 " + found,  "0 " + found,
                                               "2 " + failed, "2 " + failed, "2 " + failed};
    EXPECT_EQ(lines, expected);
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
    // Only the found board can be downloaded; the others swallow requests in silence.
    AddBoard("unused", 0);
    EXPECT_TRUE(service->RequestScores(1, 5, 0, "Broken"));
    EXPECT_TRUE(service->RequestScores(1, 5, 0, "Lost"));
    ServeQueues();
    DeliverAndJoin();
    EXPECT_EQ(PlatformCalls("DownloadLeaderboardEntries"), 0u);
    EXPECT_TRUE(engine.Records().All().Events(19).empty());
}

TEST_F(LeaderboardTest, NotFoundLeaderboardLogsNoErrorsDetected)
{
    world.InjectFault("FindOrCreateLeaderboard", simclient::Fault::Result(k_EResultFail));
    StartService(ConfigWith({"id=\"Gone\""}));
    size_t lines = 0;
    for (const auto& line : engine.Records().All().LogsAtLevel(2))
        lines += line.text.find("Did not found leaderboard") != std::string::npos &&
                 line.text.find("no errors detected") != std::string::npos;
    EXPECT_EQ(lines, 3u);
}

TEST_F(LeaderboardTest, CategoryLookupRules)
{
    const std::string name31(31, 'x');
    const std::string name32 = std::string(31, 'y') + "z";
    StartService(ConfigWith({"id=\"" + name31 + "\"", "id=\"" + name32 + "\"", "id=\"Dup\"", "id=\"Dup\""}));
    EXPECT_EQ(CallArgs("FindOrCreateLeaderboard")[1], "\"" + name32 + "\", 2, 1");  // given whole
    EXPECT_EQ(PlatformCalls("FindOrCreateLeaderboard"), 4u);
    const uint64_t mark = engine.Records().Mark();
    EXPECT_TRUE(service->RequestScores(1, 1, 0, name31.c_str()));
    EXPECT_FALSE(service->RequestScores(1, 1, 0, name32.c_str()));
    EXPECT_TRUE(service->RequestScores(1, 1, 0, name32.substr(0, 31).c_str()));
    EXPECT_TRUE(service->RequestScores(1, 1, 7, "Dup"));
    EXPECT_FALSE(service->RequestScores(1, 1, 0, "dup"));
    EXPECT_FALSE(service->RequestScores(1, 1, 1, nullptr));
    EXPECT_FALSE(service->RequestScoresAroundUser(0, 1, "DUP"));
    std::vector<std::string> reports;
    for (const auto& line : engine.Records().Since(mark).LogsAtLevel(1))
        reports.push_back(line.text);
    ASSERT_EQ(reports.size(), 4u);
    EXPECT_EQ(reports[0], "RequestScore - client for category " + name32 + " not found.");
    EXPECT_EQ(reports[1], "RequestScore - client for category dup not found.");
}

}  // namespace
}  // namespace leaderboard_test
