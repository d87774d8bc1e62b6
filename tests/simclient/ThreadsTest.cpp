// Concurrent SDK calls from worker threads while the main thread pumps: run under
// ThreadSanitizer to catch unguarded world state.
#include <atomic>
#include <set>
#include <thread>
#include <vector>

#include "SimFixture.h"

namespace {

class Threads : public SimWorld {};

TEST_F(Threads, WorkersCallWhileMainThreadPumps)
{
    world.DefineStat("n", 0);
    world.AddLeaderboard("b", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric);
    // Warm the accessors' caches on this thread before the workers use them.
    ASSERT_NE(SteamUserStats(), nullptr);
    ASSERT_NE(SteamRemoteStorage(), nullptr);
    Listener<UserStatsStored_t> c;

    constexpr int kWorkers = 4, kCalls = 200;
    std::atomic<int> running{kWorkers};
    std::vector<std::thread> workers;
    workers.reserve(kWorkers);
    for (int w = 0; w < kWorkers; ++w)
        workers.emplace_back([&, w] {
            for (int i = 0; i < kCalls; ++i) {
                SteamUserStats()->SetStat("n", int32(i));
                SteamUserStats()->StoreStats();
                SteamUserStats()->UploadLeaderboardScore(1, k_ELeaderboardUploadScoreMethodKeepBest, i,
                                                         nullptr, 0);
                SteamRemoteStorage()->FileWrite(w % 2 ? "odd" : "even", &i, sizeof i);
            }
            --running;
        });
    while (running > 0)
        SteamAPI_RunCallbacks();
    for (std::thread& t : workers)
        t.join();
    SteamAPI_RunCallbacks();

    EXPECT_EQ(c.calls, kWorkers * kCalls);
    EXPECT_EQ(world.GetJournal().Count("StoreStats"), size_t(kWorkers * kCalls));
    EXPECT_EQ(world.LeaderboardRows("b").at(0).score, kCalls - 1);
    std::set<simclient::ThreadSerial> threads;
    for (const auto& e : world.GetJournal().Calls("FileWrite"))
        threads.insert(e.thread);
    EXPECT_EQ(threads.size(), size_t(kWorkers));
}

}  // namespace
