// Leaderboard ranking/upload rules and the workshop item round trip.
#include <algorithm>
#include <iterator>
#include <string>

#include "SimFixture.h"

namespace {

// The platform gives install folders in the system's own form.
std::string NativeFolder(std::string folder)
{
#if defined(_WIN32)
    std::replace(folder.begin(), folder.end(), '/', '\\');
#endif
    return folder;
}

class LeaderboardsWorkshop : public SimWorld {
protected:
    uint64 Id(uint32 account) { return 76561197960265728ull + account; }
};

// Reads a downloaded set inside its handler, where it is readable.
struct EntryReader {
    std::vector<int> scores;
    SteamLeaderboardEntries_t set = 0;
    void OnResult(LeaderboardScoresDownloaded_t* d, bool)
    {
        set = d->m_hSteamLeaderboardEntries;
        for (int i = 0; i < d->m_cEntryCount; ++i) {
            LeaderboardEntry_t e{};
            int32 details[2] = {};
            EXPECT_TRUE(SteamUserStats()->GetDownloadedLeaderboardEntry(set, i, &e, details, 2));
            scores.push_back(e.m_nScore);
            if (e.m_nScore == 50) {  // the best row of the board
                EXPECT_EQ(e.m_nGlobalRank, 1);
                EXPECT_EQ(details[0], 7);
            }
        }
    }
};

TEST_F(LeaderboardsWorkshop, DownloadRanges)
{
    world.SetLocalUser(Id(3), true, "Me");
    world.SetFriends({Id(1), Id(1), Id(42)});
    world.AddLeaderboard("hi", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{Id(1), 10, {}}, {Id(2), 50, {7}}, {Id(3), 30, {}}, {Id(4), 20, {}}});
    ISteamUserStats* us = SteamUserStats();
    auto found = Await<LeaderboardFindResult_t>(
        us->FindOrCreateLeaderboard("hi", k_ELeaderboardSortMethodNone, k_ELeaderboardDisplayTypeNone));
    ASSERT_TRUE(found.m_bLeaderboardFound);
    const SteamLeaderboard_t board = found.m_hSteamLeaderboard;
    CSteamID users[] = {CSteamID(Id(1)), CSteamID(Id(2)), CSteamID(Id(1)), CSteamID(Id(99))};
    struct Row {
        const char* name;
        SteamAPICall_t call;
        std::vector<int> scores;
    };
    const Row rows[] = {
        {"global top two",
         us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 1, 2),
         {50, 30}},
        {"global clamps",
         us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobal, 0, 99),
         {50, 30, 20, 10}},
        {"around user",
         us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestGlobalAroundUser, -1, 1),
         {50, 30, 20}},
        {"friends and me, once each",
         us->DownloadLeaderboardEntries(board, k_ELeaderboardDataRequestFriends, 0, 0),
         {30, 10}},
        {"given users by rank, once each", us->DownloadLeaderboardEntriesForUsers(board, users, 4), {50, 10}},
    };
    constexpr std::size_t kRows = std::size(rows);
    EntryReader readers[kRows];
    CCallResult<EntryReader, LeaderboardScoresDownloaded_t> results[kRows];
    for (std::size_t i = 0; i < kRows; ++i)
        results[i].Set(rows[i].call, &readers[i], &EntryReader::OnResult);
    EXPECT_EQ(world.DownloadedEntrySets(), kRows);  // each held until its result is handled
    SteamAPI_RunCallbacks();
    EXPECT_EQ(world.DownloadedEntrySets(), 0u);
    for (std::size_t i = 0; i < kRows; ++i) {
        SCOPED_TRACE(rows[i].name);
        EXPECT_EQ(readers[i].scores, rows[i].scores);
        LeaderboardEntry_t e{};
        EXPECT_FALSE(us->GetDownloadedLeaderboardEntry(readers[i].set, 0, &e, nullptr, 0))
            << "kept after the handler";
    }
}

TEST_F(LeaderboardsWorkshop, DownloadedSetsAreReleased)
{
    world.AddLeaderboard("b", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{Id(1), 10, {}}});
    ISteamUserStats* us = SteamUserStats();
    for (int i = 0; i < 10000; ++i)
        Await<LeaderboardScoresDownloaded_t>(
            us->DownloadLeaderboardEntries(1, k_ELeaderboardDataRequestGlobal, 1, 1));
    us->DownloadLeaderboardEntries(1, k_ELeaderboardDataRequestGlobal, 1, 1);  // nobody bound: released too
    world.InjectFault("DownloadLeaderboardEntries", simclient::Fault::Drop());
    us->DownloadLeaderboardEntries(1, k_ELeaderboardDataRequestGlobal, 1, 1);  // never answered: never kept
    SteamAPI_RunCallbacks();
    EXPECT_EQ(world.DownloadedEntrySets(), 0u);
    us->DownloadLeaderboardEntries(1, k_ELeaderboardDataRequestGlobal, 1, 1);
    world.Reset();
    EXPECT_EQ(world.DownloadedEntrySets(), 0u);
}

// Names handed out stay readable while the boards they came from move in memory.
TEST_F(LeaderboardsWorkshop, NamePointersOutliveGrowthAndReset)
{
    world.AddLeaderboard("first", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric);
    const char* name = SteamUserStats()->GetLeaderboardName(1);
    for (int i = 0; i < 100; ++i)
        SteamUserStats()->FindOrCreateLeaderboard(("grow" + std::to_string(i)).c_str(),
                                                  k_ELeaderboardSortMethodAscending,
                                                  k_ELeaderboardDisplayTypeNumeric);
    EXPECT_STREQ(name, "first");
    world.SetPersonaName(Id(5), "Before");
    const char* persona = SteamFriends()->GetFriendPersonaName(CSteamID(Id(5)));
    world.SetPersonaName(Id(5), "After");
    world.Reset();
    EXPECT_STREQ(name, "first");
    EXPECT_STREQ(persona, "Before");
}

TEST_F(LeaderboardsWorkshop, UploadKeepBestAndForce)
{
    world.AddLeaderboard("lo", k_ELeaderboardSortMethodAscending, k_ELeaderboardDisplayTypeTimeSeconds,
                         {{Id(9), 100, {}}});
    ISteamUserStats* us = SteamUserStats();
    SteamLeaderboard_t board = 1;
    struct Row {
        const char* name;
        ELeaderboardUploadScoreMethod method;
        int score;
        bool changed;
        int rank;
    };
    const Row rows[] = {
        {"first score", k_ELeaderboardUploadScoreMethodKeepBest, 120, true, 2},
        {"worse kept", k_ELeaderboardUploadScoreMethodKeepBest, 130, false, 2},
        {"better taken", k_ELeaderboardUploadScoreMethodKeepBest, 90, true, 1},
        {"a tie goes after the earlier row", k_ELeaderboardUploadScoreMethodForceUpdate, 100, true, 2},
        {"forced worse", k_ELeaderboardUploadScoreMethodForceUpdate, 200, true, 2},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        auto up = Await<LeaderboardScoreUploaded_t>(
            us->UploadLeaderboardScore(board, row.method, row.score, nullptr, 0));
        EXPECT_TRUE(up.m_bSuccess);
        EXPECT_EQ(bool(up.m_bScoreChanged), row.changed);
        EXPECT_EQ(up.m_nGlobalRankNew, row.rank);
    }
    world.InjectFault("UploadLeaderboardScore", simclient::Fault::Result(k_EResultFail));
    EXPECT_FALSE(
        Await<LeaderboardScoreUploaded_t>(
            us->UploadLeaderboardScore(board, k_ELeaderboardUploadScoreMethodForceUpdate, 1, nullptr, 0))
            .m_bSuccess);
    EXPECT_EQ(world.LeaderboardRows("lo")[1].score, 200);
}

// Many users uploading few distinct scores: ranks and order must follow the rule
// "better first, equal scores in the order they were set", checked against a plain model.
TEST_F(LeaderboardsWorkshop, UploadsFollowTheRankRuleUnderManyTies)
{
    world.AddLeaderboard("t", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric);
    struct ModelRow {
        uint64 user;
        int score;
    };
    std::vector<ModelRow> model;  // in rank order
    uint32 seed = 12345;
    auto next = [&](uint32 n) { return (seed = seed * 1103515245u + 12345u) / 65536u % n; };
    for (int i = 0; i < 300; ++i) {
        const uint64 user = Id(next(40));
        const int score = static_cast<int>(next(8));
        const bool force = next(2) == 0;
        world.SetLocalUser(user, true, "U");
        auto up = Await<LeaderboardScoreUploaded_t>(SteamUserStats()->UploadLeaderboardScore(
            1, force ? k_ELeaderboardUploadScoreMethodForceUpdate : k_ELeaderboardUploadScoreMethodKeepBest,
            score, nullptr, 0));
        auto mine =
            std::find_if(model.begin(), model.end(), [&](const ModelRow& r) { return r.user == user; });
        ASSERT_EQ(up.m_nGlobalRankPrevious, mine == model.end() ? 0 : int(mine - model.begin()) + 1);
        if (mine == model.end() || force || score > mine->score) {
            if (mine != model.end())
                model.erase(mine);
            auto at =
                std::find_if(model.begin(), model.end(), [&](const ModelRow& r) { return r.score < score; });
            mine = model.insert(at, ModelRow{user, score});
        }
        ASSERT_EQ(up.m_nGlobalRankNew, int(mine - model.begin()) + 1) << "upload " << i;
    }
    std::vector<simclient::LeaderboardRow> rows = world.LeaderboardRows("t");
    ASSERT_EQ(rows.size(), model.size());
    for (std::size_t i = 0; i < rows.size(); ++i)
        EXPECT_EQ(rows[i].steamId, model[i].user) << "row " << i;
}

TEST_F(LeaderboardsWorkshop, WorkshopSubscriptionsAndInstallInfo)
{
    simclient::WorkshopItem item;
    item.id = 77;
    item.title = "Map";
    item.subscribed = true;
    item.state = k_EItemStateInstalled;
    item.folder = "/ugc/77";
    item.sizeOnDisk = 1234;
    world.AddWorkshopItem(item);
    ISteamUGC* ugc = SteamUGC();
    ASSERT_EQ(ugc->GetNumSubscribedItems(), 1u);
    PublishedFileId_t ids[4] = {};
    ASSERT_EQ(ugc->GetSubscribedItems(ids, 4), 1u);
    EXPECT_EQ(ids[0], 77u);
    EXPECT_EQ(ugc->GetItemState(77), uint32(k_EItemStateSubscribed | k_EItemStateInstalled));
    uint64 size = 0;
    uint32 stamp = 0;
    char folder[5];
    EXPECT_TRUE(ugc->GetItemInstallInfo(77, &size, folder, sizeof folder, &stamp));
    EXPECT_EQ(std::string(folder), NativeFolder("/ugc"));
    EXPECT_EQ(size, 1234u);

    auto unsub = Await<RemoteStorageUnsubscribePublishedFileResult_t>(ugc->UnsubscribeItem(77));
    EXPECT_EQ(unsub.m_eResult, k_EResultOK);
    EXPECT_EQ(ugc->GetNumSubscribedItems(), 0u);
    auto missing = Await<RemoteStorageSubscribePublishedFileResult_t>(ugc->SubscribeItem(5));
    EXPECT_EQ(missing.m_eResult, k_EResultFileNotFound);

    PublishedFileId_t query[] = {77, 5};
    UGCQueryHandle_t q = ugc->CreateQueryUGCDetailsRequest(query, 2);
    auto done = Await<SteamUGCQueryCompleted_t>(ugc->SendQueryUGCRequest(q));
    EXPECT_EQ(done.m_unNumResultsReturned, 2u);
    SteamUGCDetails_t details;
    ASSERT_TRUE(ugc->GetQueryUGCResult(q, 0, &details));
    EXPECT_STREQ(details.m_rgchTitle, "Map");
    ASSERT_TRUE(ugc->GetQueryUGCResult(q, 1, &details));
    EXPECT_EQ(details.m_eResult, k_EResultFileNotFound);
    EXPECT_TRUE(ugc->ReleaseQueryUGCRequest(q));
}

TEST_F(LeaderboardsWorkshop, CreateAndSubmitItem)
{
    ISteamUGC* ugc = SteamUGC();
    world.SetNeedsLegalAgreement(true);
    auto created = Await<CreateItemResult_t>(ugc->CreateItem(480, k_EWorkshopFileTypeCommunity));
    ASSERT_EQ(created.m_eResult, k_EResultOK);
    EXPECT_TRUE(created.m_bUserNeedsToAcceptWorkshopLegalAgreement);
    UGCUpdateHandle_t u = ugc->StartItemUpdate(480, created.m_nPublishedFileId);
    EXPECT_TRUE(ugc->SetItemTitle(u, "New"));
    const char* tags[] = {"a", "b"};
    SteamParamStringArray_t tagArray{tags, 2};
    EXPECT_TRUE(ugc->SetItemTags(u, &tagArray));
    world.SetUpdateProgress(k_EItemUpdateStatusUploadingContent, 5, 10);
    uint64 done = 0, total = 0;
    EXPECT_EQ(ugc->GetItemUpdateProgress(u, &done, &total), k_EItemUpdateStatusUploadingContent);
    EXPECT_EQ(total, 10u);
    auto submitted = Await<SubmitItemUpdateResult_t>(ugc->SubmitItemUpdate(u, "note"));
    EXPECT_EQ(submitted.m_eResult, k_EResultOK);
    auto item = world.GetWorkshopItem(created.m_nPublishedFileId);
    ASSERT_TRUE(item.has_value());
    EXPECT_EQ(item->title, "New");
    EXPECT_EQ(item->tags, "a,b");
    ASSERT_EQ(world.Submissions().size(), 1u);
    EXPECT_EQ(world.Submissions()[0].changeNote, "note");
}

// A planned download passes pending, then downloading with rising bytes, and ends
// installed in its folder; a planned upload walks its statuses, then answers.
TEST_F(LeaderboardsWorkshop, DownloadAndUploadMoveByThemselves)
{
    ISteamUGC* ugc = SteamUGC();
    simclient::WorkshopItem item;
    item.id = 90;
    item.subscribed = true;
    world.AddWorkshopItem(item);
    ASSERT_TRUE(world.StartWorkshopDownload(90, {20, 10, simclient::Delay::Pumps(1), "/ugc/90"}));
    const uint32 sub = k_EItemStateSubscribed;
    struct Seen {
        uint32 state;
        uint64 done;
    } expected[] = {{sub | k_EItemStateDownloadPending, 0},
                    {sub | k_EItemStateNeedsUpdate | k_EItemStateDownloading, 0},
                    {sub | k_EItemStateNeedsUpdate | k_EItemStateDownloading, 10},
                    {sub | k_EItemStateInstalled, 20}};
    for (const Seen& row : expected) {
        SCOPED_TRACE(row.state);
        EXPECT_EQ(ugc->GetItemState(90), row.state);
        uint64 done = 99, total = 0;
        EXPECT_TRUE(ugc->GetItemDownloadInfo(90, &done, &total));
        EXPECT_EQ(done, row.done);
        EXPECT_EQ(total, 20u);
        SteamAPI_RunCallbacks();
    }
    char folder[16] = {};
    EXPECT_TRUE(ugc->GetItemInstallInfo(90, nullptr, folder, sizeof folder, nullptr));
    EXPECT_EQ(std::string(folder), NativeFolder("/ugc/90"));

    world.SetWorkshopUpload(
        simclient::WorkshopUpload{4, 2, simclient::Delay::Pumps(1), k_EResultLimitExceeded});
    UGCUpdateHandle_t u = ugc->StartItemUpdate(480, 90);
    ResultCatcher<SubmitItemUpdateResult_t> catcher(ugc->SubmitItemUpdate(u, "note"));
    const EItemUpdateStatus statuses[] = {
        k_EItemUpdateStatusPreparingConfig,      k_EItemUpdateStatusPreparingContent,
        k_EItemUpdateStatusUploadingContent,     k_EItemUpdateStatusUploadingContent,
        k_EItemUpdateStatusUploadingPreviewFile, k_EItemUpdateStatusCommittingChanges};
    const uint64 bytes[] = {0, 0, 0, 2, 4, 4};
    for (int i = 0; i < 6; ++i) {
        SCOPED_TRACE(i);
        uint64 done = 99, total = 0;
        EXPECT_EQ(ugc->GetItemUpdateProgress(u, &done, &total), statuses[i]);
        EXPECT_EQ(done, bytes[i]);
        EXPECT_EQ(total, 4u);
        EXPECT_EQ(catcher.calls, 0);
        SteamAPI_RunCallbacks();
    }
    EXPECT_EQ(catcher.calls, 1);
    EXPECT_EQ(catcher.last.m_eResult, k_EResultLimitExceeded);
    EXPECT_EQ(ugc->GetItemUpdateProgress(u, nullptr, nullptr), k_EItemUpdateStatusInvalid);
}

}  // namespace
