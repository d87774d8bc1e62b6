// Leaderboard ranking/upload rules and the workshop item round trip.
#include "SimFixture.h"

namespace {

class LeaderboardsWorkshop : public SimWorld {
protected:
    template <class P> P Await(SteamAPICall_t h)
    {
        using Catch = Catcher<P>;
        Catch c;
        CCallResult<Catch, P> result;
        result.Set(h, &c, &Catch::OnResult);
        SteamAPI_RunCallbacks();
        EXPECT_EQ(c.calls, 1);
        return c.last;
    }
    uint64 Id(uint32 account) { return 76561197960265728ull + account; }
};

TEST_F(LeaderboardsWorkshop, DownloadRanges)
{
    world.SetLocalUser(Id(3), true, "Me");
    world.SetFriends({Id(1)});
    world.AddLeaderboard("hi", k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                         {{Id(1), 10, {}}, {Id(2), 50, {7}}, {Id(3), 30, {}}, {Id(4), 20, {}}});
    ISteamUserStats* us = SteamUserStats();
    auto found = Await<LeaderboardFindResult_t>(
        us->FindOrCreateLeaderboard("hi", k_ELeaderboardSortMethodNone, k_ELeaderboardDisplayTypeNone));
    ASSERT_TRUE(found.m_bLeaderboardFound);
    struct Row {
        const char* name;
        ELeaderboardDataRequest req;
        int start, end;
        std::vector<int> scores;
    };
    const Row rows[] = {
        {"global top two", k_ELeaderboardDataRequestGlobal, 1, 2, {50, 30}},
        {"global clamps", k_ELeaderboardDataRequestGlobal, 0, 99, {50, 30, 20, 10}},
        {"around user", k_ELeaderboardDataRequestGlobalAroundUser, -1, 1, {50, 30, 20}},
        {"friends and me", k_ELeaderboardDataRequestFriends, 0, 0, {30, 10}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        auto d = Await<LeaderboardScoresDownloaded_t>(
            us->DownloadLeaderboardEntries(found.m_hSteamLeaderboard, row.req, row.start, row.end));
        ASSERT_EQ(d.m_cEntryCount, int(row.scores.size()));
        for (int i = 0; i < d.m_cEntryCount; ++i) {
            LeaderboardEntry_t e{};
            int32 details[2] = {};
            ASSERT_TRUE(us->GetDownloadedLeaderboardEntry(d.m_hSteamLeaderboardEntries, i, &e, details, 2));
            EXPECT_EQ(e.m_nScore, row.scores[size_t(i)]);
            if (e.m_nScore == 50) {
                EXPECT_EQ(e.m_nGlobalRank, 1);
                EXPECT_EQ(details[0], 7);
            }
        }
    }
    CSteamID users[] = {CSteamID(Id(4))};
    auto d = Await<LeaderboardScoresDownloaded_t>(
        us->DownloadLeaderboardEntriesForUsers(found.m_hSteamLeaderboard, users, 1));
    EXPECT_EQ(d.m_cEntryCount, 1);
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
    EXPECT_STREQ(folder, "/ugc");
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

}  // namespace
