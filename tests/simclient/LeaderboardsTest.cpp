// Generated boards, names that arrive late or never, and the faults of the leaderboard
// calls, as code under test meets them through the SDK.
#include <algorithm>
#include <atomic>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "SimFixture.h"
#include "simclient/GeneratedPlayers.h"

namespace {

using simclient::Delay;
using simclient::Fault;
using simclient::GeneratedPlayerId;
using simclient::LeaderboardRow;

class Leaderboards : public SimWorld {
protected:
    SteamLeaderboard_t Find(const char* name)
    {
        auto found = Await<LeaderboardFindResult_t>(SteamUserStats()->FindOrCreateLeaderboard(
            name, k_ELeaderboardSortMethodNone, k_ELeaderboardDisplayTypeNone));
        EXPECT_TRUE(found.m_bLeaderboardFound);
        return found.m_hSteamLeaderboard;
    }
    // Polls a name the way a results thread does: one request, then the name.
    std::string Ask(uint64 id, bool* stillMissing = nullptr)
    {
        const bool missing = SteamFriends()->RequestUserInformation(CSteamID(id), true);
        if (stillMissing)
            *stillMissing = missing;
        return SteamFriends()->GetFriendPersonaName(CSteamID(id));
    }
};

TEST_F(Leaderboards, GeneratedBoardsHoldWhatTheyPromise)
{
    for (int count : {1, 150, 100000}) {
        SCOPED_TRACE(count);
        world.Reset();
        ASSERT_TRUE(SteamAPI_Init());
        world.AddGeneratedLeaderboard("gen", k_ELeaderboardSortMethodDescending,
                                      k_ELeaderboardDisplayTypeNumeric, count, 7);
        const std::vector<LeaderboardRow> rows = world.LeaderboardRows("gen");
        ASSERT_EQ(rows.size(), static_cast<std::size_t>(count));
        std::set<uint64> ids;
        std::set<std::size_t> detailSizes;
        bool ties = false, negative = false;
        for (std::size_t i = 0; i < rows.size(); ++i) {
            ids.insert(rows[i].steamId);
            detailSizes.insert(rows[i].details.size());
            negative |= rows[i].score < 0;
            if (i > 0) {
                ASSERT_GE(rows[i - 1].score, rows[i].score) << "rank order at " << i;
                ties |= rows[i - 1].score == rows[i].score;
            }
        }
        EXPECT_EQ(ids.size(), rows.size());
        EXPECT_LE(*detailSizes.rbegin(), 64u);
        if (count >= 150) {
            EXPECT_TRUE(ties);
            EXPECT_TRUE(negative);
        }
        if (count == 100000) {  // the whole range of detail counts turns up
            EXPECT_EQ(detailSizes.size(), 65u);
        }
        // Same seed, same board; another seed moves the scores but keeps the players.
        const auto again = simclient::GeneratePlayers(count, 7);
        const auto other = simclient::GeneratePlayers(count, 8);
        std::map<uint64, int32> scoreOf;
        for (const auto& row : again.rows)
            scoreOf[row.steamId] = row.score;
        for (const auto& row : rows)
            ASSERT_EQ(scoreOf.at(row.steamId), row.score);
        if (count > 1) {
            bool differs = false;
            for (std::size_t i = 0; i < other.rows.size(); ++i) {
                EXPECT_EQ(other.rows[i].steamId, again.rows[i].steamId);
                differs |= other.rows[i].score != again.rows[i].score;
            }
            EXPECT_TRUE(differs);
        }
        // The players' names are known at once, and a download gives the first 100 rows.
        const int last = count - 1;
        EXPECT_EQ(Ask(GeneratedPlayerId(last)), simclient::GeneratedPlayerName(last));
        const SteamLeaderboard_t board = Find("gen");
        EXPECT_EQ(SteamUserStats()->GetLeaderboardEntryCount(board), count);
        auto got = Await<LeaderboardScoresDownloaded_t>(
            SteamUserStats()->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 1, 100));
        EXPECT_EQ(got.m_cEntryCount, std::min(count, 100));
    }
}

TEST_F(Leaderboards, GeneratedNamesCoverTheAwkwardCases)
{
    std::set<std::size_t> lengths;
    bool twoByte = false, threeByte = false;
    for (int i = 0; i < 100; ++i) {
        const std::string name = simclient::GeneratedPlayerName(i);
        lengths.insert(name.size());
        twoByte |= name.find("\xC3\xAB") != std::string::npos;
        threeByte |= name.find("\xE6\x9D\xB1") != std::string::npos;
    }
    EXPECT_TRUE(twoByte);
    EXPECT_TRUE(threeByte);
    EXPECT_EQ(*lengths.rbegin(), 80u);
}

// Late names for a whole board: each player's name comes `delay` after that player's first
// request, by pumps or by the engine's clock, or never.
TEST_F(Leaderboards, NamesOfAllPlayersArriveLateOrNever)
{
    uint64_t nowMs = 0;
    struct Case {
        const char* name;
        std::function<void(simclient::World&)> setUp;
        int pumpsUntilKnown;  // 0: never
        uint64_t msPerPump;
    };
    const Case cases[] = {
        {"after 3 pumps", [](simclient::World& w) { w.SetAllPersonaNamesArrive(Delay::Pumps(3)); }, 3, 0},
        {"after 100 engine ms", [](simclient::World& w) { w.SetAllPersonaNamesArrive(Delay::EngineMs(100)); },
         4, 30},
        {"never", [](simclient::World& w) { w.SetAllPersonaNamesNever(); }, 0, 0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        world.Reset();
        ASSERT_TRUE(SteamAPI_Init());
        world.SetTimeSource([&nowMs] { return nowMs; });
        world.AddGeneratedLeaderboard("gen", k_ELeaderboardSortMethodAscending,
                                      k_ELeaderboardDisplayTypeNumeric, 150, 3);
        c.setUp(world);
        const uint64 early = GeneratedPlayerId(10), late = GeneratedPlayerId(149);
        SteamAPI_RunCallbacks();  // reads the clock: the delays count from here
        bool missing = false;
        EXPECT_EQ(Ask(early, &missing), "[unknown]");
        EXPECT_TRUE(missing);
        for (int pump = 1; pump <= 6; ++pump) {
            nowMs += c.msPerPump;
            SteamAPI_RunCallbacks();
            if (pump == 1)  // the second player asks a pump later, and so gets the name a pump later
                Ask(late);
            const bool earlyKnown = c.pumpsUntilKnown > 0 && pump >= c.pumpsUntilKnown;
            const bool lateKnown = c.pumpsUntilKnown > 0 && pump >= c.pumpsUntilKnown + 1;
            EXPECT_EQ(Ask(early, &missing), earlyKnown ? simclient::GeneratedPlayerName(10) : "[unknown]")
                << "pump " << pump;
            EXPECT_EQ(missing, !earlyKnown);
            EXPECT_EQ(Ask(late), lateKnown ? simclient::GeneratedPlayerName(149) : "[unknown]")
                << "pump " << pump;
        }
        world.SetTimeSource({});
    }
}

// Names are handed out byte for byte, whatever their length or a sequence cut at the end.
TEST_F(Leaderboards, AwkwardNamesComeOutWhole)
{
    const std::string names[] = {
        std::string(63, 'a'),           std::string(64, 'b'),
        std::string(300, 'c'),          "Zo\xC3\xAB",
        "ends in a lead byte \xC3",     "ends in a three-byte lead \xE6",
        std::string(255, 'd') + "\xF0",
    };
    uint64 id = 76561197960265728ull + 500;
    for (const std::string& name : names) {
        ++id;
        world.SetPersonaNameArrives(id, name, Delay::Pumps(1));
        EXPECT_EQ(Ask(id), "[unknown]");
        SteamAPI_RunCallbacks();
        const char* got = SteamFriends()->GetFriendPersonaName(CSteamID(id));
        ASSERT_NE(got, nullptr);
        EXPECT_EQ(std::string(got), name);
    }
}

TEST_F(Leaderboards, EachCallKindFailsAsAsked)
{
    world.AddLeaderboard("b", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{GeneratedPlayerId(0), 5, {}}, {GeneratedPlayerId(1), 3, {}}});
    const SteamLeaderboard_t board = Find("b");
    ISteamUserStats* us = SteamUserStats();
    CSteamID someone(GeneratedPlayerId(0));
    const std::map<std::string, std::function<SteamAPICall_t()>> calls = {
        {"FindOrCreateLeaderboard",
         [&] {
             return us->FindOrCreateLeaderboard("b", k_ELeaderboardSortMethodNone,
                                                k_ELeaderboardDisplayTypeNone);
         }},
        {"DownloadLeaderboardEntries",
         [&] { return us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 1, 1); }},
        {"DownloadLeaderboardEntriesForUsers",
         [&] { return us->DownloadLeaderboardEntriesForUsers(board, &someone, 1); }},
        {"UploadLeaderboardScore",
         [&] {
             return us->UploadLeaderboardScore(board, k_ELeaderboardUploadScoreMethodKeepBest, 9, nullptr, 0);
         }},
    };
    for (const auto& entry : calls) {
        const std::string& name = entry.first;
        const std::function<SteamAPICall_t()>& call = entry.second;
        SCOPED_TRACE(name);
        world.InjectFault(name, Fault::ZeroHandle());
        EXPECT_EQ(call(), k_uAPICallInvalid);
        world.InjectFault(name, Fault::IoFailure());
        SteamAPICall_t handle = call();
        ASSERT_NE(handle, k_uAPICallInvalid);
        // The failure values of each result, and the I/O flag, as the handler gets them.
        int fieldsSeen = 0;
        auto check = [&](bool expectIo) {
            if (name == "FindOrCreateLeaderboard") {
                ResultCatcher<LeaderboardFindResult_t> r(handle);
                SteamAPI_RunCallbacks();
                ASSERT_EQ(r.calls, 1);
                EXPECT_EQ(r.lastIoFailure, expectIo);
                fieldsSeen += r.last.m_bLeaderboardFound;
            } else if (name == "UploadLeaderboardScore") {
                ResultCatcher<LeaderboardScoreUploaded_t> r(handle);
                SteamAPI_RunCallbacks();
                ASSERT_EQ(r.calls, 1);
                EXPECT_EQ(r.lastIoFailure, expectIo);
                fieldsSeen += r.last.m_bSuccess;
            } else {
                ResultCatcher<LeaderboardScoresDownloaded_t> r(handle);
                SteamAPI_RunCallbacks();
                ASSERT_EQ(r.calls, 1);
                EXPECT_EQ(r.lastIoFailure, expectIo);
                fieldsSeen += r.last.m_cEntryCount;
            }
        };
        check(true);
        EXPECT_EQ(fieldsSeen, 1) << "an I/O failure alone keeps the result's content";
        fieldsSeen = 0;
        world.InjectFault(name, Fault::Fail());
        handle = call();
        check(false);
        EXPECT_EQ(fieldsSeen, 0) << "a failing result says no";
    }
    EXPECT_EQ(world.LeaderboardRows("b")[0].score, 9);  // the I/O-failed upload still counted
    EXPECT_EQ(world.DownloadedEntrySets(), 0u);
}

// Extra latency makes results of several downloads arrive out of order; random latency
// and chance are repeatable for a seed.
TEST_F(Leaderboards, LatencyReordersResultsRepeatably)
{
    world.AddGeneratedLeaderboard("gen", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                                  30, 1);
    const SteamLeaderboard_t board = Find("gen");
    ISteamUserStats* us = SteamUserStats();
    world.InjectFault("DownloadLeaderboardEntries", Fault::ExtraLatency(2));
    std::vector<int> order;
    struct Tagged {
        std::vector<int>* order;
        int tag;
        void OnResult(LeaderboardScoresDownloaded_t*, bool) { order->push_back(tag); }
    };
    Tagged first{&order, 1}, second{&order, 2};
    CCallResult<Tagged, LeaderboardScoresDownloaded_t> r1, r2;
    r1.Set(us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 1, 5), &first,
           &Tagged::OnResult);
    r2.Set(us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 6, 9), &second,
           &Tagged::OnResult);
    for (int i = 0; i < 4; ++i)
        SteamAPI_RunCallbacks();
    EXPECT_EQ(order, (std::vector<int>{2, 1}));

    auto pattern = [&](uint64 seed) {
        world.ClearFaults();
        world.SetFaultSeed(seed);
        world.InjectFault("UploadLeaderboardScore", Fault::ZeroHandle().Chance(30).Always());
        std::string hits;
        for (int i = 0; i < 300; ++i)
            hits += us->UploadLeaderboardScore(board, k_ELeaderboardUploadScoreMethodKeepBest, i, nullptr,
                                               0) == k_uAPICallInvalid
                        ? 'x'
                        : '.';
        return hits;
    };
    const std::string a = pattern(5), b = pattern(5), c = pattern(6);
    EXPECT_EQ(a, b);
    EXPECT_NE(a, c);
    const auto hits = std::count(a.begin(), a.end(), 'x');
    EXPECT_GT(hits, 45);
    EXPECT_LT(hits, 135);

    world.ClearFaults();
    for (int i = 0; i < 3; ++i)  // deliver the uploads
        SteamAPI_RunCallbacks();
    ASSERT_EQ(world.PendingCount(), 0u);
    world.InjectFault("DownloadLeaderboardEntries", Fault::RandomLatency(5).Always());
    for (int i = 0; i < 40; ++i)
        us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 1, 1);
    int deliveredPerPump[8] = {};
    for (int& delivered : deliveredPerPump) {
        const std::size_t pending = world.PendingCount();
        SteamAPI_RunCallbacks();
        delivered = static_cast<int>(pending - world.PendingCount());
    }
    EXPECT_EQ(world.PendingCount(), 0u);
    int pumpsWithResults = 0;
    for (int delivered : deliveredPerPump)
        pumpsWithResults += delivered > 0;
    EXPECT_GE(pumpsWithResults, 4) << "results spread over the pumps";
}

// Five kinds of threads at once, as the leaderboard service has them: finds, downloads,
// uploads, name polls, and the engine's thread pumping. Run under ThreadSanitizer.
TEST_F(Leaderboards, FiveKindsOfThreadsAtOnce)
{
    world.AddGeneratedLeaderboard("gen", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                                  200, 2);
    world.SetAllPersonaNamesArrive(Delay::Pumps(2));
    world.InjectFault("DownloadLeaderboardEntries", Fault::RandomLatency(3).Chance(50).Always());
    world.InjectFault("UploadLeaderboardScore", Fault::IoFailure().Chance(20).Always());
    const SteamLeaderboard_t board = Find("gen");
    ASSERT_NE(SteamFriends(), nullptr);
    constexpr int kCalls = 300;
    std::atomic<int> running{4}, namesKnown{0};
    std::vector<std::thread> threads;
    threads.emplace_back([&] {
        for (int i = 0; i < kCalls; ++i)
            SteamUserStats()->FindOrCreateLeaderboard("gen", k_ELeaderboardSortMethodNone,
                                                      k_ELeaderboardDisplayTypeNone);
        --running;
    });
    threads.emplace_back([&] {
        for (int i = 0; i < kCalls; ++i)
            SteamUserStats()->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 1, 100);
        --running;
    });
    threads.emplace_back([&] {
        for (int i = 0; i < kCalls; ++i)
            SteamUserStats()->UploadLeaderboardScore(board, k_ELeaderboardUploadScoreMethodKeepBest, i,
                                                     nullptr, 0);
        --running;
    });
    threads.emplace_back([&] {
        for (int p = 0; p < 200; ++p) {
            const CSteamID id(GeneratedPlayerId(p));
            while (SteamFriends()->RequestUserInformation(id, true))
                std::this_thread::yield();
            namesKnown +=
                std::string(SteamFriends()->GetFriendPersonaName(id)) == simclient::GeneratedPlayerName(p);
        }
        --running;
    });
    while (running > 0)
        SteamAPI_RunCallbacks();
    for (std::thread& t : threads)
        t.join();
    for (int i = 0; i < 10; ++i)
        SteamAPI_RunCallbacks();
    EXPECT_EQ(namesKnown, 200);
    EXPECT_EQ(world.PendingCount(), 0u);
    EXPECT_EQ(world.DownloadedEntrySets(), 0u) << "sets of unbound results are released too";
    EXPECT_EQ(world.LeaderboardRows("gen").size(), 201u);  // the local user joined once
}

}  // namespace
