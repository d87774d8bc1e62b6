// The leaderboard service's local rules: download ranges, the plain text of
// names, the event's start, the configuration words and the client lists.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "services/leaderboards/ClientList.h"
#include "services/leaderboards/DownloadResults.h"
#include "services/leaderboards/ScoreRequest.h"
#include "services/leaderboards/SteamLeaderboardsImplementation.h"
#include "services/leaderboards/SteamScoreClient.h"

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
    }
    return clients;
}

TEST(LeaderboardRules, FindClientScansInOrderAcrossChunks)
{
    std::vector<std::string> names;
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

}  // namespace
