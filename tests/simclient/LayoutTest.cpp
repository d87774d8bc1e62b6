// Record layouts must match the platform's callback packing, and the callback numbers
// the platform's; all checked when compiled. The packing is 4 bytes on Linux and 8 on
// Windows, so some sizes and offsets differ between the two.
#include <cstddef>

#include <gtest/gtest.h>
#include <steam/steam_api.h>

#define CHECK_SIZE(T, n) static_assert(sizeof(T) == (n), #T " size")
#define CHECK_OFFSET(T, f, n) static_assert(offsetof(T, f) == (n), #T "::" #f " offset")
#if defined(VALVE_CALLBACK_PACK_SMALL)
#define BY_PACKING(small, large) (small)
#else
#define BY_PACKING(small, large) (large)
#endif

CHECK_SIZE(CSteamID, 8);
static_assert(alignof(CSteamID) == 1, "CSteamID is byte-aligned");
CHECK_SIZE(GameOverlayActivated_t, 1);
CHECK_SIZE(UserStatsReceived_t, BY_PACKING(20, 24));
CHECK_OFFSET(UserStatsReceived_t, m_eResult, 8);
CHECK_OFFSET(UserStatsReceived_t, m_steamIDUser, 12);
CHECK_SIZE(UserStatsStored_t, BY_PACKING(12, 16));
CHECK_SIZE(UserAchievementStored_t, BY_PACKING(148, 152));
CHECK_OFFSET(UserAchievementStored_t, m_rgchAchievementName, 9);
CHECK_OFFSET(UserAchievementStored_t, m_nCurProgress, 140);
CHECK_OFFSET(UserAchievementStored_t, m_nMaxProgress, 144);
CHECK_SIZE(LeaderboardFindResult_t, BY_PACKING(12, 16));
CHECK_SIZE(LeaderboardScoresDownloaded_t, BY_PACKING(20, 24));
CHECK_OFFSET(LeaderboardScoresDownloaded_t, m_cEntryCount, 16);
CHECK_SIZE(LeaderboardScoreUploaded_t, BY_PACKING(28, 32));
CHECK_OFFSET(LeaderboardScoreUploaded_t, m_hSteamLeaderboard, BY_PACKING(4, 8));
CHECK_OFFSET(LeaderboardScoreUploaded_t, m_nScore, BY_PACKING(12, 16));
CHECK_OFFSET(LeaderboardScoreUploaded_t, m_bScoreChanged, BY_PACKING(16, 20));
CHECK_OFFSET(LeaderboardScoreUploaded_t, m_nGlobalRankNew, BY_PACKING(20, 24));
CHECK_OFFSET(LeaderboardScoreUploaded_t, m_nGlobalRankPrevious, BY_PACKING(24, 28));
CHECK_SIZE(SteamUGCQueryCompleted_t, 280);
CHECK_OFFSET(SteamUGCQueryCompleted_t, m_bCachedData, 20);
CHECK_OFFSET(SteamUGCQueryCompleted_t, m_rgchNextCursor, 21);
CHECK_SIZE(CreateItemResult_t, BY_PACKING(16, 24));
CHECK_OFFSET(CreateItemResult_t, m_nPublishedFileId, BY_PACKING(4, 8));
CHECK_OFFSET(CreateItemResult_t, m_bUserNeedsToAcceptWorkshopLegalAgreement, BY_PACKING(12, 16));
CHECK_SIZE(SubmitItemUpdateResult_t, 16);
CHECK_OFFSET(SubmitItemUpdateResult_t, m_bUserNeedsToAcceptWorkshopLegalAgreement, 4);
CHECK_OFFSET(SubmitItemUpdateResult_t, m_nPublishedFileId, 8);
CHECK_SIZE(LeaderboardEntry_t, BY_PACKING(28, 32));
CHECK_OFFSET(LeaderboardEntry_t, m_hUGC, BY_PACKING(20, 24));
CHECK_SIZE(SteamParamStringArray_t, BY_PACKING(12, 16));
CHECK_SIZE(SteamUGCDetails_t, BY_PACKING(9764, 9776));
CHECK_OFFSET(SteamUGCDetails_t, m_ulSteamIDOwner, BY_PACKING(8156, 8160));
CHECK_OFFSET(SteamUGCDetails_t, m_eVisibility, BY_PACKING(8176, 8180));
CHECK_OFFSET(SteamUGCDetails_t, m_rgchTags, BY_PACKING(8183, 8187));
CHECK_OFFSET(SteamUGCDetails_t, m_hFile, BY_PACKING(9208, 9216));
CHECK_OFFSET(SteamUGCDetails_t, m_pchFileName, BY_PACKING(9224, 9232));
CHECK_OFFSET(SteamUGCDetails_t, m_nFileSize, BY_PACKING(9484, 9492));
CHECK_OFFSET(SteamUGCDetails_t, m_rgchURL, BY_PACKING(9492, 9500));
CHECK_OFFSET(SteamUGCDetails_t, m_unNumChildren, BY_PACKING(9760, 9768));
CHECK_SIZE(RemoteStorageSubscribePublishedFileResult_t, BY_PACKING(12, 16));
CHECK_SIZE(PersonaStateChange_t, BY_PACKING(12, 16));

#define CHECK_NUMBER(T, n) static_assert(T::k_iCallback == (n), #T " callback number")
CHECK_NUMBER(GameOverlayActivated_t, 331);
CHECK_NUMBER(PersonaStateChange_t, 304);
CHECK_NUMBER(UserStatsReceived_t, 1101);
CHECK_NUMBER(UserStatsStored_t, 1102);
CHECK_NUMBER(UserAchievementStored_t, 1103);
CHECK_NUMBER(LeaderboardFindResult_t, 1104);
CHECK_NUMBER(LeaderboardScoresDownloaded_t, 1105);
CHECK_NUMBER(LeaderboardScoreUploaded_t, 1106);
CHECK_NUMBER(RemoteStorageSubscribePublishedFileResult_t, 1313);
CHECK_NUMBER(RemoteStorageUnsubscribePublishedFileResult_t, 1315);
CHECK_NUMBER(SteamUGCQueryCompleted_t, 3401);
CHECK_NUMBER(CreateItemResult_t, 3403);
CHECK_NUMBER(SubmitItemUpdateResult_t, 3404);

TEST(Layout, SteamIdBitFields)
{
    CSteamID id(42u, k_EUniversePublic, k_EAccountTypeIndividual);
    EXPECT_EQ(id.ConvertToUint64(), 76561197960265728ull + 42);
    EXPECT_EQ(id.GetAccountID(), 42u);
    EXPECT_EQ(id.GetUnAccountInstance(), 1u);
    EXPECT_TRUE(id.IsValid());
    EXPECT_TRUE(id.BIndividualAccount());
    EXPECT_FALSE(k_steamIDNil.IsValid());
}
