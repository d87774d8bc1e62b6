// The leaderboard service's local rules: download ranges, the plain text of
// names, the event's start, the configuration words and the client lists.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "data/HashedName.h"
#include "host/HostServices.h"
#include "services/leaderboards/ClientList.h"
#include "services/leaderboards/DownloadResults.h"
#include "services/leaderboards/LeaderboardQueues.h"
#include "services/leaderboards/ScoreEntry.h"
#include "services/leaderboards/ScoreRequest.h"
#include "services/leaderboards/SteamLeaderboardsImplementation.h"
#include "services/leaderboards/SteamScoreClient.h"
#include "simclient/World.h"
#include "simengine/Engine.h"

namespace {

TEST(LeaderboardRules, DownloadRangeTable)
{
    struct Row {
        int32_t start, count, filter;
        ELeaderboardDataRequest kind;
        int32_t first, last;
    };
    const Row rows[] = {
        {1, 10, 0, k_ELeaderboardDataRequestGlobal, 1, 10},
        {5, 0, 0, k_ELeaderboardDataRequestGlobal, 5, 5},
        {5, 1, 0, k_ELeaderboardDataRequestGlobal, 5, 5},
        {5, -3, 0, k_ELeaderboardDataRequestGlobal, 5, 5},
        {0, 10, 0, k_ELeaderboardDataRequestGlobalAroundUser, -5, 4},
        {0, 7, 0, k_ELeaderboardDataRequestGlobalAroundUser, -3, 3},
        {0, 1, 0, k_ELeaderboardDataRequestGlobalAroundUser, 0, 0},
        {0, 0, 0, k_ELeaderboardDataRequestGlobalAroundUser, 0, -1},
        {0, -3, 0, k_ELeaderboardDataRequestGlobalAroundUser, 1, -3},  // truncation towards zero
        {1, 10, 1, k_ELeaderboardDataRequestFriends, 1, 10},
        {0, 10, 2, k_ELeaderboardDataRequestFriends, 0, 9},  // the filter is tested first
        {3, 4, 5, k_ELeaderboardDataRequestFriends, 3, 6},
        {INT32_MAX - 1, 10, 0, k_ELeaderboardDataRequestGlobal, INT32_MAX - 1, INT32_MAX},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::Message() << row.start << " " << row.count << " " << row.filter);
        const DownloadRange range = ScoreDownloadRange(row.start, row.count, row.filter);
        EXPECT_EQ(range.kind, row.kind);
        EXPECT_EQ(range.first, row.first);
        EXPECT_EQ(range.last, row.last);
    }
}

TEST(LeaderboardRules, PlainTextOfNames)
{
    struct Row {
        std::string name;
        std::string plain;
    };
    const Row rows[] = {
        {"Zo\xC3\xAB", "Zo "},
        {"a\xE2\x82\xAC"
         "b",
         "a b"},
        {"\xF0\x9F\x98\x80!", " !"},
        {"x\x80y", "x\x80y"},      // a lone continuation byte stays
        {"end\xC3", "end "},       // lead byte as the very last byte
        {"end\xF0\x9F", "end "},   // a sequence cut short by the end
        {"\xFF\xFE", "\xFF\xFE"},  // not lead bytes of the three forms
        {"", ""},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        char buffer[kPlainNameSize];
        PlainTextName(row.name.c_str(), buffer);
        EXPECT_EQ(std::string(buffer), row.plain);
    }
    char buffer[kPlainNameSize];
    std::memset(buffer, 'q', sizeof buffer);
    PlainTextName(nullptr, buffer);
    EXPECT_STREQ(buffer, "");

    // Long names end at 255 bytes; the buffer's last byte is the terminator.
    const std::string longName(300, 'n');
    PlainTextName(longName.c_str(), buffer);
    EXPECT_EQ(std::string(buffer), std::string(255, 'n'));
    const std::string longWide = std::string(254, 'w') + "\xC3\xAB\xC3\xAB";
    PlainTextName(longWide.c_str(), buffer);
    EXPECT_EQ(std::string(buffer), std::string(254, 'w') + " ");
}

TEST(LeaderboardRules, EventStartTable)
{
    struct Row {
        int32_t filter, count, firstRank, start;
    };
    const Row rows[] = {
        {1, 3, 17, 1}, {0, 3, 17, 17}, {2, 3, 17, 17}, {5, 3, -4, -4}, {1, 0, 17, 0}, {0, 0, 17, 0},
    };
    for (const Row& row : rows)
        EXPECT_EQ(ScoresEventStart(row.filter, row.count, row.firstRank), row.start)
            << row.filter << " " << row.count;
}

TEST(LeaderboardRules, ConfigurationWords)
{
    EXPECT_EQ(SortMethodOf(nullptr), k_ELeaderboardSortMethodDescending);
    EXPECT_EQ(SortMethodOf("ASCENDING"), k_ELeaderboardSortMethodAscending);
    EXPECT_EQ(SortMethodOf("LOWEST_SCORE_FIRST"), k_ELeaderboardSortMethodAscending);
    EXPECT_EQ(SortMethodOf("ASCENDING "), k_ELeaderboardSortMethodDescending);
    EXPECT_EQ(DisplayTypeOf(nullptr), k_ELeaderboardDisplayTypeNumeric);
    EXPECT_EQ(DisplayTypeOf("SECONDS"), k_ELeaderboardDisplayTypeTimeSeconds);
    EXPECT_EQ(DisplayTypeOf("MILLISECONDS"), k_ELeaderboardDisplayTypeTimeMilliSeconds);
    EXPECT_EQ(DisplayTypeOf("Seconds"), k_ELeaderboardDisplayTypeNumeric);
}

// Clients made by hand, as the configuration thread would publish them.
std::vector<std::unique_ptr<SteamScoreClient>> MakeClients(const std::vector<std::string>& names)
{
    std::vector<std::unique_ptr<SteamScoreClient>> clients;
    for (const std::string& name : names) {
        clients.push_back(std::make_unique<SteamScoreClient>());
        std::strncpy(clients.back()->name, name.c_str(), sizeof clients.back()->name - 1);
        clients.back()->nameHash = HashText(clients.back()->name);
    }
    return clients;
}

TEST(LeaderboardRules, FindClientScansInOrderAcrossChunks)
{
    std::vector<std::string> names;
    names.reserve(200);
    for (int i = 0; i < 200; ++i)
        names.push_back("cat" + std::to_string(i % 150));  // the last 50 repeat earlier names
    auto clients = MakeClients(names);
    SteamLeaderboardsImplementation service;
    for (auto& client : clients)
        service.globalClients.Add(client.get());
    service.thirdClients.Add(clients[3].get());
    EXPECT_EQ(service.globalClients.Count(), 200);
    EXPECT_EQ(service.FindClient("cat0", 0), clients[0].get());  // first of two
    EXPECT_EQ(service.FindClient("cat149", 7), clients[149].get());
    EXPECT_EQ(service.FindClient("cat64", 0), clients[64].get());  // first of the second chunk
    EXPECT_EQ(service.FindClient("cat3", 2), clients[3].get());
    EXPECT_EQ(service.FindClient("cat4", 2), nullptr);
    EXPECT_EQ(service.FindClient("cat3", 1), nullptr);
    EXPECT_EQ(service.FindClient("CAT3", 0), nullptr);
    EXPECT_EQ(service.FindClient(nullptr, 0), nullptr);
    EXPECT_EQ(service.FindClient("cat150", 0), nullptr);
}

// Nothing in the engine's table feeds the user queue; its thread and handler are
// driven here directly, in this process, on the manual clock.
TEST(LeaderboardRules, UserDownloadPostsOneRecordWithOrWithoutARow)
{
    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
    world.Reset();
    engine.Reset();
    world.SetAppId(480);
    world.SetLocalUser(0x0110000100000000ull + 1, true, "Me");
    const CSteamID ranked(0x0110000100000000ull + 5);
    const CSteamID unranked(0x0110000100000000ull + 0xFFFFFFFFull);
    world.SetPersonaName(ranked.ConvertToUint64(), "Fiv\xC3\xAB");
    world.SetPersonaName(unranked.ConvertToUint64(), "Nobody");
    world.AddLeaderboard("U", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{0x0110000100000000ull + 2, 99, {}, k_UGCHandleInvalid},
                          {ranked.ConvertToUint64(), -42, {3, 4}, k_UGCHandleInvalid}});
    hostServices = engine.Table();
    ASSERT_TRUE(SteamAPI_Init());
    requestMutex = hostServices->threads->CreateMutex("STEAM_LEADERBOARDS_REQUEST");
    SteamScoreClient client;
    client.filter = 2;
    std::strcpy(client.name, "U");
    client.leaderboard.store(1);
    hostServices->threads->StartThread("Steam_Leaderboards_RequestUser", &RequestUserThread, nullptr, 0);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping("Steam_Leaderboards_RequestUser"));
    QueueUserRequest(&client, ranked);
    QueueUserRequest(&client, unranked);
    engine.Time().Advance(1);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping("Steam_Leaderboards_RequestUser"));
    SteamAPI_RunCallbacks();
    engine.QuitAndJoin();

    const auto events = engine.Records().All().Events(19);
    ASSERT_EQ(events.size(), 2u);
    const simengine::ScoresFields& withRow = *events[0].scores;
    EXPECT_EQ(withRow.category, "U");
    EXPECT_EQ(withRow.filter, 0);
    EXPECT_EQ(withRow.start, 2);  // the row's rank, for a filter other than 1
    EXPECT_EQ(withRow.count, 1);
    EXPECT_EQ(withRow.total, 2);
    ASSERT_EQ(withRow.rows.size(), 1u);
    EXPECT_EQ(withRow.rows[0].userName, "Fiv\xC3\xAB");  // no plain-text conversion here
    EXPECT_EQ(withRow.rows[0].userId, "5");
    EXPECT_EQ(withRow.rows[0].score, -42);  // unchanged
    EXPECT_EQ(withRow.rows[0].rank, 2);
    EXPECT_EQ(withRow.rows[0].detailsSize, 188);
    EXPECT_EQ(withRow.rows[0].details[4], 4);
    const simengine::ScoresFields& withoutRow = *events[1].scores;
    EXPECT_EQ(withoutRow.start, 1);
    EXPECT_EQ(withoutRow.count, 1);
    ASSERT_EQ(withoutRow.rows.size(), 1u);
    EXPECT_EQ(withoutRow.rows[0].userName, "Nobody");
    EXPECT_EQ(withoutRow.rows[0].userId, "-1");
    EXPECT_EQ(withoutRow.rows[0].score, 0);
    EXPECT_EQ(withoutRow.rows[0].detailsSize, 0);
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
    SteamAPI_Shutdown();
    hostServices = nullptr;
    world.Reset();
    engine.Reset();
}

}  // namespace
