// Score downloads from the engine's call to the scores event: the request kinds
// and ranges, the event's fields and rows, players' names, failures, and the
// threads (downloads in flight together, configuration while the engine asks).
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "LeaderboardFixture.h"

namespace leaderboard_test {
namespace {

using simengine::PostedEvent;

std::string LogLineAfter(const std::vector<std::string>& lines, const std::string& prefix)
{
    for (const std::string& line : lines)
        if (line.rfind(prefix, 0) == 0)
            return line;
    return "";
}

TEST_F(LeaderboardTest, RequestKindsRangesAndEventFields)
{
    AddBoard("Top", 150);
    world.SetLocalUser(Player(1002), true, "Me");  // third on the board
    world.SetFriends({Player(1005), Player(1007)});
    StartService(ConfigWith({"id=\"Top\""}));
    struct Row {
        const char* name;
        int32_t start, count, filter;
        bool aroundUser;
        const char* download;  // handle, kind, first, last
        int32_t eventFilter, eventStart, total, count_;
        const char* word;
    };
    const Row rows[] = {
        {"top ten", 1, 10, 0, false, "1, 0, 1, 10", 0, 1, 150, 10, "GLOBAL"},
        {"start 0 reads from 1", 0, 3, 0, false, "1, 0, 1, 3", 0, 1, 150, 3, "GLOBAL"},
        {"negative start", -7, 1, 0, false, "1, 0, 1, 1", 0, 1, 150, 1, "GLOBAL"},
        {"count 0", 5, 0, 0, false, "1, 0, 5, 5", 0, 5, 150, 1, "GLOBAL"},
        {"150 rows give 100", 1, 150, 0, false, "1, 0, 1, 150", 0, 1, 150, 100, "GLOBAL"},
        {"friends", 1, 10, 1, false, "1, 2, 1, 10", 1, 1, 3, 3, "FRIENDS"},
        {"third filter", 1, 10, 2, false, "1, 2, 1, 10", 0, 3, 3, 3, "GLOBAL"},
        {"filter 5 uses the global client", 4, 2, 5, false, "1, 2, 4, 5", 0, 3, 150, 3, "GLOBAL"},
        {"around the user", 0, 10, 0, true, "1, 1, -5, 4", 0, 1, 150, 7, "GLOBAL"},
        {"around the user, 7", 0, 7, 0, true, "1, 1, -3, 3", 0, 1, 150, 6, "GLOBAL"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        world.ClearJournal();
        const uint64_t mark = engine.Records().Mark();
        if (row.aroundUser)
            EXPECT_TRUE(service->RequestScoresAroundUser(77, row.count, "Top"));
        else
            EXPECT_TRUE(service->RequestScores(row.start, row.count, row.filter, "Top"));
        ServeQueues();
        DeliverAndJoin();
        EXPECT_EQ(CallArgs("DownloadLeaderboardEntries"), std::vector<std::string>{row.download});
        const auto events = engine.Records().Since(mark).Events(19);
        ASSERT_EQ(events.size(), 1u);
        const simengine::ScoresFields& scores = *events[0].scores;
        EXPECT_EQ(events[0].status, 1);
        EXPECT_EQ(scores.category, "Top");
        EXPECT_EQ(scores.filter, row.eventFilter);
        EXPECT_EQ(scores.start, row.eventStart);
        EXPECT_EQ(scores.total, row.total);
        EXPECT_EQ(scores.count, row.count_);
        ASSERT_EQ(scores.rows.size(), static_cast<size_t>(row.count_));
        const std::string line = "Sending event with scores " + std::to_string(row.eventStart) + ".." +
                                 std::to_string(row.eventStart + row.count_ - 1) + " (" +
                                 std::to_string(row.count_) + " scores of " + std::to_string(row.total) +
                                 ") for category 'Top' with filter '" + row.word + "'";
        EXPECT_EQ(LogLineAfter(engine.Records().Since(mark).LogTexts(), "Sending event"), line);
        // The unnamed bytes of the record are zero.
        for (size_t i = 8; i < 16; ++i)
            EXPECT_EQ(events[0].raw[i], 0);
        for (size_t i = 48; i < 72; ++i)
            EXPECT_EQ(events[0].raw[i], 0);
    }
}

TEST_F(LeaderboardTest, RowsCarryScoresRanksDetailsIdsAndPlainNames)
{
    const uint64 wide = Player(0x80000001u);  // low 32 bits print negative
    const uint64 longName = Player(2);
    const uint64 lastLead = Player(3);
    const uint64 exact = Player(4);
    world.SetPersonaName(wide, "Zo\xC3\xAB");
    world.SetPersonaName(longName, std::string(300, 'L'));
    world.SetPersonaName(lastLead, "Ab\xE2");
    world.SetPersonaName(exact, std::string(64, 'E'));
    std::vector<int32> details(47);
    for (int i = 0; i < 47; ++i)
        details[i] = 1000 + i;
    world.AddLeaderboard("Rows", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{wide, 30, {7, 8}, k_UGCHandleInvalid},
                          {longName, 20, details, k_UGCHandleInvalid},
                          {lastLead, 10, {}, k_UGCHandleInvalid},
                          {exact, -5, {}, k_UGCHandleInvalid}});
    StartService(ConfigWith({"id=\"Rows\""}));
    const auto events = EventsOf(1, 10, 0, "Rows");
    ASSERT_EQ(events.size(), 1u);
    const auto& rows = events[0].scores->rows;
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[0].userId, "-2147483647");
    EXPECT_EQ(rows[0].userName, "Zo ");
    EXPECT_EQ(rows[0].score, 30);
    EXPECT_EQ(rows[0].rank, 1);
    EXPECT_EQ(rows[0].detailsSize, 188);
    EXPECT_EQ(rows[0].reserved, 0);
    EXPECT_EQ(rows[0].details[0], 7);
    EXPECT_EQ(rows[0].details[4], 8);
    EXPECT_EQ(rows[0].details[8], 0);  // fewer than 47 details: the rest cleared
    EXPECT_EQ(rows[1].userName, std::string(63, 'L'));
    EXPECT_EQ(rows[1].details[46 * 4], 1046 & 0xFF);
    EXPECT_EQ(rows[2].userName, "Ab ");
    EXPECT_EQ(rows[3].userName, std::string(63, 'E'));
    EXPECT_EQ(rows[3].userId, "4");
    EXPECT_EQ(rows[3].score, 0);  // negative scores are raised to 0
    EXPECT_EQ(rows[3].rank, 4);
}

TEST_F(LeaderboardTest, EmptyBoardStillEndsInAnEvent)
{
    AddBoard("Empty", 0);
    StartService(ConfigWith({"id=\"Empty\""}));
    const uint64_t mark = engine.Records().Mark();
    for (int32_t filter : {0, 1}) {
        const auto events = EventsOf(1, 10, filter, "Empty");
        ASSERT_EQ(events.size(), 1u);
        EXPECT_EQ(events[0].scores->count, 0);
        EXPECT_EQ(events[0].scores->start, 0);
        EXPECT_TRUE(events[0].scores->entriesNull);
    }
    const std::vector<std::string> expected = {
        "OnDownloadScore: Downloaded 0 scores",
        "Sending event with no scores (0 scores in category) for category 'Empty' with filter 'GLOBAL'",
        "OnDownloadScore: Downloaded 0 scores",
        "Sending event with no scores (0 scores in category) for category 'Empty' with filter 'FRIENDS'",
    };
    EXPECT_EQ(engine.Records().Since(mark).LogTexts(), expected);
}

TEST_F(LeaderboardTest, RequestBeforeTheFindIsLostInSilence)
{
    AddBoard("Late", 5);
    engine.SetFeatureEnabled("LEADERBOARDS", true);
    engine.Files().AddMemoryFile(kConfigPath, ConfigWith({"id=\"Late\""}));
    ASSERT_TRUE(Start());
    service = ServiceAt<LeaderboardsImplementation>(2);
    ASSERT_TRUE(service->Initialize());
    engine.Threads().Join(kConfigThread);
    AwaitQueueThreadsAsleep();
    EXPECT_TRUE(service->RequestScores(1, 5, 0, "Late"));  // found, but no handle yet
    ServeQueues();
    DeliverAndJoin();  // the find arrives now
    EXPECT_EQ(PlatformCalls("DownloadLeaderboardEntries"), 0u);
    EXPECT_TRUE(engine.Records().All().Events(19).empty());
    EXPECT_EQ(EventsOf(1, 5, 0, "Late").size(), 1u);
}

TEST_F(LeaderboardTest, DownloadFailuresAndMissingMemory)
{
    AddBoard("Faulty", 3);
    StartService(ConfigWith({"id=\"Faulty\""}));

    world.InjectFault("DownloadLeaderboardEntries", simclient::Fault::ZeroHandle());
    EXPECT_TRUE(EventsOf(1, 3, 0, "Faulty").empty());

    // An I/O failure is not looked at: the rows that came are delivered.
    world.InjectFault("DownloadLeaderboardEntries", simclient::Fault::IoFailure());
    auto events = EventsOf(1, 3, 0, "Faulty");
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0].scores->count, 3);

    // No memory for the records: the event comes without rows.
    EXPECT_TRUE(service->RequestScores(1, 3, 0, "Faulty"));
    ServeQueues();
    engine.Memory().FailNextAllocations(1);
    uint64_t mark = engine.Records().Mark();
    DeliverAndJoin();
    events = engine.Records().Since(mark).Events(19);
    ASSERT_EQ(events.size(), 1u);
    EXPECT_EQ(events[0].scores->count, 0);
    EXPECT_TRUE(events[0].scores->entriesNull);
    EXPECT_EQ(events[0].scores->category, "Faulty");
    EXPECT_EQ(events[0].scores->total, 3);

    // Nor for the category.
    EXPECT_TRUE(service->RequestScores(1, 3, 0, "Faulty"));
    ServeQueues();
    engine.Memory().FailNextAllocations(2);
    mark = engine.Records().Mark();
    DeliverAndJoin();
    events = engine.Records().Since(mark).Events(19);
    ASSERT_EQ(events.size(), 1u);
    EXPECT_FALSE(events[0].scores->category.has_value());
}

TEST_F(LeaderboardTest, NamesThatArriveLateAreAwaitedWithABound)
{
    const uint64 late = Player(1);
    const uint64 never = Player(2);
    world.SetPersonaNameArrives(late, "Latecomer", simclient::Delay::Pumps(2));
    world.SetPersonaNameNever(never);
    world.AddLeaderboard("Names", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{late, 2, {}, k_UGCHandleInvalid}, {never, 1, {}, k_UGCHandleInvalid}});
    StartService(ConfigWith({"id=\"Names\""}));
    EXPECT_TRUE(service->RequestScores(1, 2, 0, "Names"));
    ServeQueues();
    module->Update();  // the handler asks for the names and starts the results thread
    ASSERT_TRUE(engine.Time().WaitUntilSleeping(kResultsThread));
    module->Update();
    module->Update();  // the first name has arrived
    engine.Time().Advance(1);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping(kResultsThread));  // now waiting for the second
    engine.Time().Advance(4998);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping(kResultsThread));
    EXPECT_TRUE(engine.Records().All().Events(19).empty());
    EXPECT_LE(engine.Time().SleepCalls(kResultsThread), 3u);  // a pause between asks, no spinning
    engine.Time().Advance(1);  // five seconds since the wait began: the name is taken as it is
    engine.Threads().Join(kResultsThread);
    const auto events = engine.Records().All().Events(19);
    ASSERT_EQ(events.size(), 1u);
    ASSERT_EQ(events[0].scores->rows.size(), 2u);
    EXPECT_EQ(events[0].scores->rows[0].userName, "Latecomer");
    EXPECT_EQ(events[0].scores->rows[1].userName, "[unknown]");
}

TEST_F(LeaderboardTest, DownloadsInFlightCompleteInAnyOrder)
{
    std::vector<std::string> nodes;
    for (int board = 0; board < 8; ++board) {
        AddBoard("B" + std::to_string(board), board + 1, 1000 + 100 * board);
        nodes.push_back("id=\"B" + std::to_string(board) + "\"");
    }
    StartService(ConfigWith(nodes));
    std::mt19937 random(11);
    for (int board = 0; board < 8; ++board)
        world.InjectFault("DownloadLeaderboardEntries",
                          simclient::Fault::ExtraLatency(static_cast<int>(random() % 6)).Skip(board));
    for (int board = 0; board < 8; ++board)
        EXPECT_TRUE(service->RequestScores(1, 100, 0, ("B" + std::to_string(board)).c_str()));
    ServeQueues();
    for (int pump = 0; pump < 8; ++pump)
        module->Update();
    engine.Threads().Join(kResultsThread);
    const auto events = engine.Records().All().Events(19);
    ASSERT_EQ(events.size(), 8u);
    std::vector<std::string> seen;
    for (const PostedEvent& event : events) {
        const std::string category = *event.scores->category;
        seen.push_back(category);
        EXPECT_EQ(event.scores->count, std::stoi(category.substr(1)) + 1) << category;
    }
    std::vector<std::string> sorted = seen;
    std::sort(sorted.begin(), sorted.end());
    EXPECT_NE(seen, sorted);  // the latencies reorder the results
    EXPECT_EQ(std::unique(sorted.begin(), sorted.end()), sorted.end());
}

TEST_F(LeaderboardTest, EngineAsksWhileAThousandCategoriesAreConfigured)
{
    std::vector<std::string> nodes;
    nodes.reserve(1000);
    for (int i = 0; i < 1000; ++i)
        nodes.push_back("id=\"C" + std::to_string(i) + "\"");
    AddBoard("C999", 2);
    engine.SetFeatureEnabled("LEADERBOARDS", true);
    engine.Files().AddMemoryFile(kConfigPath, ConfigWith(nodes));
    ASSERT_TRUE(Start());
    service = ServiceAt<LeaderboardsImplementation>(2);
    ASSERT_TRUE(service->Initialize());
    // The engine's thread scans the lists while they grow; the last category
    // becomes known once its clients are published.
    int refusals = 0;
    ScoreEntry record{};
    while (!service->RequestScores(1, 2, refusals % 3, "C999")) {
        service->SubmitScore(0, &record, "C500");
        ++refusals;
        ASSERT_LT(refusals, 10000000) << "the configuration never published the last category";
    }
    engine.Threads().Join(kConfigThread);
    EXPECT_TRUE(service->RequestScores(1, 2, 1, "C0"));
    EXPECT_EQ(PlatformCalls("FindOrCreateLeaderboard"), 1000u);
}

TEST_F(LeaderboardTest, UnloadReleasesWhatIsQueuedOrInFlight)
{
    AddBoard("Busy", 4);
    StartService(ConfigWith({"id=\"Busy\""}));
    EXPECT_TRUE(service->RequestScores(1, 4, 0, "Busy"));
    ServeQueues();                                         // in flight
    EXPECT_TRUE(service->RequestScores(1, 4, 1, "Busy"));  // queued
    ScoreEntry record{};
    service->SubmitScore(0, &record, "Busy");
    service->Shutdown();  // safe at any time, also twice
    service->Shutdown();
    EXPECT_GT(world.BoundCallResultCount(), 0u);
    module->Shutdown();
    engine.QuitAndJoin();
    ASSERT_TRUE(loader.Unload());
    EXPECT_EQ(world.BoundCallResultCount(), 0u);  // pending results were cancelled, not left dangling
    EXPECT_TRUE(engine.Records().All().Events(19).empty());
    SetUp();
}

}  // namespace
}  // namespace leaderboard_test
