// Fault injection reaches every kind of failure path; the journal records calls in order.
#include <cstring>
#include <functional>
#include <stdexcept>
#include <thread>

#include "SimFixture.h"

namespace {

using simclient::Fault;

class FaultsAndJournal : public SimWorld {};

SteamAPICall_t Find()
{
    return SteamUserStats()->FindOrCreateLeaderboard("b", k_ELeaderboardSortMethodDescending,
                                                     k_ELeaderboardDisplayTypeNumeric);
}

// Each row: a fault, then the answers of the faulted kind of call in a row.
TEST_F(FaultsAndJournal, FaultsApplyToTheirCallsInTurn)
{
    world.PutFile("f", {1, 2, 3, 4, 5});
    uint8 out[5] = {};
    auto found = [] { return Find() != k_uAPICallInvalid ? 1 : 0; };
    auto write = [] { return SteamRemoteStorage()->FileWrite("a", "x", 1) ? 1 : 0; };
    auto init = [] {
        SteamAPI_Shutdown();
        return SteamAPI_Init() ? 1 : 0;
    };
    struct Row {
        const char* name;
        const char* call;
        Fault fault;
        std::function<int()> answer;
        std::vector<int> answers;
    };
    const Row rows[] = {
        {"zero handle once, after a skip",
         "FindOrCreateLeaderboard",
         Fault::ZeroHandle().Skip(1),
         found,
         {1, 0, 1}},
        {"always fails", "FileWrite", Fault::Fail().Always(), write, {0, 0, 0}},
        {"short read once",
         "FileRead",
         Fault::ShortRead(3),
         [&] { return SteamRemoteStorage()->FileRead("f", out, 5); },
         {3, 5}},
        {"init fails once", "SteamAPI_Init", Fault::Fail(), init, {0, 1}},
        {"fails twice, then passes", "FileWrite", Fault::Fail().Times(2), write, {0, 0, 1}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        world.InjectFault(row.call, row.fault);
        std::vector<int> answers;
        for (std::size_t i = 0; i < row.answers.size(); ++i)
            answers.push_back(row.answer());
        EXPECT_EQ(answers, row.answers);
        world.ClearFaults();
    }
    EXPECT_TRUE(SteamRemoteStorage()->FileWrite("a", "x", 1)) << "ClearFaults left a fault";
}

TEST_F(FaultsAndJournal, ResultCodeAndDrop)
{
    Listener<UserStatsReceived_t> c;
    world.InjectFault("RequestCurrentStats", Fault::Result(k_EResultTimeout));
    ASSERT_TRUE(SteamUserStats()->RequestCurrentStats());
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.last.m_eResult, k_EResultTimeout);

    world.InjectFault("FindOrCreateLeaderboard", Fault::Drop());
    ResultCatcher<LeaderboardFindResult_t> dropped(Find());
    for (int i = 0; i < 5; ++i)
        SteamAPI_RunCallbacks();
    EXPECT_EQ(dropped.calls, 0);
    EXPECT_TRUE(dropped.result.IsActive()) << "a zero handle, or a result delivered";
}

TEST_F(FaultsAndJournal, JournalKeepsOrderAndCounts)
{
    SteamRemoteStorage()->FileWrite("name", "ab", 2);
    SteamUserStats()->GetStat("s", static_cast<int32*>(nullptr));
    SteamAPI_RunCallbacks();
    simclient::Journal j = world.GetJournal();
    // The arguments' form is played by scenario cloud/reads, the thread by the fold test below.
    EXPECT_EQ(j.Names(), (std::vector<std::string>{"FileWrite", "GetStat", "SteamAPI_RunCallbacks"}));
    EXPECT_TRUE(j.CalledBefore("FileWrite", "SteamAPI_RunCallbacks"));
    EXPECT_FALSE(j.CalledBefore("SteamAPI_RunCallbacks", "FileWrite"));
    EXPECT_EQ(j.IndexOf("StoreStats"), -1);
    EXPECT_EQ(j.Count("GetStat"), 1u);
}

TEST_F(FaultsAndJournal, ResetKeepsRegistrationsOnly)
{
    Listener<GameOverlayActivated_t> c;
    world.InjectFault("FileWrite", Fault::Fail());
    world.PutFile("x", {1});
    world.Reset();
    EXPECT_FALSE(world.IsInitialised());
    EXPECT_FALSE(world.File("x").has_value());
    EXPECT_EQ(world.GetJournal().Size(), 0u);
    ASSERT_TRUE(SteamAPI_Init());
    EXPECT_TRUE(SteamRemoteStorage()->FileWrite("a", "x", 1)) << "fault survived Reset";
    world.SetOverlayActive(true);
    SteamAPI_RunCallbacks();
    EXPECT_EQ(c.calls, 1);
}

TEST_F(FaultsAndJournal, UnknownCallNamesAreRefusedWithTheKnownOnes)
{
    try {
        world.InjectFault("FileReed", Fault::Fail());
        ADD_FAILURE() << "accepted a call the client does not have";
    } catch (const std::invalid_argument& e) {
        const std::string message = e.what();
        EXPECT_NE(message.find("\"FileReed\""), std::string::npos) << message;
        EXPECT_NE(message.find("FileDelete, FileExists, FileRead, FileWrite"), std::string::npos) << message;
    }
    for (std::string_view name : simclient::kCallNames)
        EXPECT_NO_THROW(world.InjectFault(std::string(name), Fault::Fail())) << name;
}

// Repeats fold into one entry; the cursor gives each call once, growth of a folded
// entry as a new entry carrying only the new repeats.
TEST_F(FaultsAndJournal, RepeatsFoldAndTheCursorReadsOnlyWhatIsNew)
{
    ISteamRemoteStorage* rs = SteamRemoteStorage();
    auto shape = [](const simclient::Journal& j) {
        std::vector<std::string> out;
        for (const auto& e : j.Entries())
            out.push_back(e.args + "x" + std::to_string(e.count) +
                          (e.thread == simclient::ThisThreadSerial() ? "" : " elsewhere"));
        return out;
    };
    simclient::JournalMark mark = world.JournalMark();
    rs->FileExists("a");
    rs->FileExists("a");
    rs->FileExists("b");
    EXPECT_EQ(shape(world.JournalSince(mark)), (std::vector<std::string>{"\"a\"x2", "\"b\"x1"}));
    rs->FileExists("b");
    rs->FileExists("b");
    std::thread([rs] { rs->FileExists("b"); }).join();
    EXPECT_EQ(shape(world.JournalSince(mark)), (std::vector<std::string>{"\"b\"x2", "\"b\"x1 elsewhere"}));
    EXPECT_TRUE(world.JournalSince(mark).Entries().empty());
    EXPECT_EQ(world.GetJournal().Count("FileExists"), 6u);
    world.ClearJournal();
    rs->FileExists("c");
    EXPECT_EQ(shape(world.JournalSince(mark)), (std::vector<std::string>{"\"c\"x1"}));
}

}  // namespace
