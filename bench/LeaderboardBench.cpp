// Leaderboard calls of the simulated client on a board of 100,000 rows: an upload
// that moves the user's row, and a download of 100 given users. Each iteration also
// pumps once, delivering the result (and releasing a downloaded set).
//
//   build/bench/bin/leaderboard_bench
#include <cstdint>
#include <vector>

#include <benchmark/benchmark.h>
#include <simclient/World.h>
#include <steam/steam_api.h>

namespace {

constexpr int kRows = 100000;
constexpr uint64 kFirstUser = 76561197960265728ull + 1000;

void SetUpBoard()
{
    simclient::World& world = simclient::GetWorld();
    world.Reset();
    world.SetJournalEnabled(false);
    std::vector<simclient::LeaderboardRow> rows;
    uint32_t seed = 7;
    for (int i = 0; i < kRows; ++i) {
        seed = seed * 1103515245u + 12345u;
        rows.push_back({kFirstUser + static_cast<uint64>(i), static_cast<int32>(seed % 50000), {}, 0});
    }
    world.AddLeaderboard("big", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         std::move(rows));
    world.SetLocalUser(kFirstUser + kRows / 2, true, "Me");
    SteamAPI_Init();
}

void BM_UploadOnLargeBoard(benchmark::State& state)
{
    SetUpBoard();
    ISteamUserStats* stats = SteamUserStats();
    int32 score = 0;
    for (auto _ : state) {
        score = (score + 7919) % 50000;  // the row moves across the whole board
        benchmark::DoNotOptimize(
            stats->UploadLeaderboardScore(1, k_ELeaderboardUploadScoreMethodForceUpdate, score, nullptr, 0));
        SteamAPI_RunCallbacks();
    }
    SteamAPI_Shutdown();
}
BENCHMARK(BM_UploadOnLargeBoard);

void BM_UsersDownloadOnLargeBoard(benchmark::State& state)
{
    SetUpBoard();
    ISteamUserStats* stats = SteamUserStats();
    std::vector<CSteamID> users;
    for (int i = 0; i < 100; ++i)
        users.emplace_back(kFirstUser + static_cast<uint64>(i) * (kRows / 100));
    for (auto _ : state) {
        benchmark::DoNotOptimize(
            stats->DownloadLeaderboardEntriesForUsers(1, users.data(), static_cast<int>(users.size())));
        SteamAPI_RunCallbacks();
    }
    SteamAPI_Shutdown();
}
BENCHMARK(BM_UsersDownloadOnLargeBoard);

void BM_FriendsDownloadOnLargeBoard(benchmark::State& state)
{
    SetUpBoard();
    std::vector<uint64> friends;
    for (int i = 0; i < 100; ++i)
        friends.push_back(kFirstUser + static_cast<uint64>(i) * 997);
    simclient::GetWorld().SetFriends(friends);
    ISteamUserStats* stats = SteamUserStats();
    for (auto _ : state) {
        benchmark::DoNotOptimize(
            stats->DownloadLeaderboardEntries(1, k_ELeaderboardDataRequestFriends, 0, 0));
        SteamAPI_RunCallbacks();
    }
    SteamAPI_Shutdown();
}
BENCHMARK(BM_FriendsDownloadOnLargeBoard);

}  // namespace

BENCHMARK_MAIN();
