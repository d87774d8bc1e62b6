// Score submission: the copy of the record, uploads that keep the best score,
// and retries with their waits on the manual clock.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "LeaderboardFixture.h"

namespace leaderboard_test {
namespace {

class ScoreSubmitTest : public LeaderboardTest {
protected:
    void SetUp() override
    {
        LeaderboardTest::SetUp();
        AddBoard("Best", 3);
        StartService(ConfigWith({"id=\"Best\""}));
    }

    // Moves the clock on and waits until the submit thread sleeps again.
    void Step(uint32_t milliseconds)
    {
        engine.Time().Advance(milliseconds);
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kSubmitThread));
    }

    void Submit(int32_t score, const char* category = "Best")
    {
        ScoreEntry record{};
        record.score = score;
        for (int i = 0; i < kScoreDetailsCount; ++i)
            record.details[i] = score + i;
        service->SubmitScore(0, &record, category);
        record.score = -1;  // the caller's record is its own again at once
    }

    size_t Uploads() const { return PlatformCalls("UploadLeaderboardScore"); }

    // Scores of the uploads so far, in order.
    std::vector<int> UploadedScores() const
    {
        std::vector<int> scores;
        for (const std::string& args : CallArgs("UploadLeaderboardScore")) {
            const size_t first = args.find(", ");
            const size_t second = args.find(", ", first + 2);
            scores.push_back(std::stoi(args.substr(second + 2)));
        }
        return scores;
    }

    // Runs one submission to its end: the first upload at once, then after each
    // failure a wait of one second per upload made, exactly. Gives the uploads.
    size_t RunSubmission(int32_t score)
    {
        const size_t before = Uploads();
        Submit(score);
        Step(1);
        EXPECT_EQ(Uploads(), before + 1);
        for (uint32_t made = 1; made <= 12; ++made) {
            const size_t uploads = Uploads();
            module->Update();  // the result
            Step(1);           // a failure is taken again and its wait begins
            Step(made * 1000 - 1);
            if (Uploads() != uploads)
                ADD_FAILURE() << "upload " << made + 1 << " came too early";
            Step(1);
            if (Uploads() == uploads)
                break;  // done: nothing was queued again
        }
        Step(60000);
        return Uploads() - before;
    }
};

TEST_F(ScoreSubmitTest, RetriesWaitOneSecondPerUploadAndStopAtTen)
{
    using simclient::Fault;
    struct Row {
        const char* name;
        std::vector<Fault> faults;
        size_t uploads;
        size_t messages;
    };
    const Row rows[] = {
        {"success at once", {}, 1, 0},
        {"three failures, then success", {Fault::Fail().Times(3)}, 4, 0},
        {"success with an I/O failure is a failure", {Fault::IoFailure()}, 2, 0},
        {"ten failures", {Fault::Fail().Times(10)}, 10, 0},
        {"the tenth an I/O failure", {Fault::Fail().Times(9), Fault::IoFailure().Skip(9)}, 10, 1},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        world.ClearFaults();
        for (const Fault& fault : row.faults)
            world.InjectFault("UploadLeaderboardScore", fault);
        const uint64_t mark = engine.Records().Mark();
        EXPECT_EQ(RunSubmission(500), row.uploads);
        const auto records = engine.Records().Since(mark);
        size_t messages = 0;
        for (const auto& line : records.LogsAtLevel(2))
            messages += line.text == "OnUploadScore: Score not send, IO failure detected.";
        EXPECT_EQ(messages, row.messages);
        EXPECT_EQ(records.LogsAtLevel(2).size(), row.messages);
        EXPECT_TRUE(records.Events().empty());
    }
    EXPECT_EQ(world.LeaderboardRows("Best")[0].score, 500);
}

TEST_F(ScoreSubmitTest, UploadsThePrivateCopyWithAllDetailsKeepingTheBest)
{
    Submit(900);
    Step(1);
    module->Update();
    const auto rows = world.LeaderboardRows("Best");
    ASSERT_EQ(rows[0].steamId, world.LocalUserId());
    EXPECT_EQ(rows[0].score, 900);
    ASSERT_EQ(rows[0].details.size(), 47u);
    EXPECT_EQ(rows[0].details[46], 946);
    const std::vector<std::string> args = CallArgs("UploadLeaderboardScore");
    ASSERT_EQ(args.size(), 1u);
    EXPECT_EQ(args[0].substr(0, 11), "1, 1, 900, ");  // handle, keep best, score
    EXPECT_EQ(args[0].substr(args[0].size() - 4), ", 47");

    Submit(100);  // worse: kept out by the platform, and no retry either
    Step(1);
    module->Update();
    Step(5000);
    EXPECT_EQ(Uploads(), 2u);
    EXPECT_EQ(world.LeaderboardRows("Best")[0].score, 900);
}

TEST_F(ScoreSubmitTest, WhatIsSkippedInSilence)
{
    const uint64_t mark = engine.Records().Mark();
    Submit(10, "Unknown");
    Submit(10, nullptr);
    world.InjectFault("UploadLeaderboardScore", simclient::Fault::ZeroHandle());
    Submit(10);
    Step(1);
    module->Update();
    Step(5000);
    EXPECT_EQ(Uploads(), 1u);  // only the configured category, and no retry without a handle
    module->Shutdown();        // the connection is down: nothing more is queued
    Submit(10);
    engine.Time().Advance(1);
    EXPECT_TRUE(engine.Time().WaitUntilSleeping(kSubmitThread));
    EXPECT_EQ(Uploads(), 1u);
    EXPECT_TRUE(engine.Records().Since(mark).Logs().empty());
}

TEST_F(ScoreSubmitTest, ARetryQueuesBehindNewcomersAndHoldsUpWhatFollows)
{
    world.InjectFault("UploadLeaderboardScore", simclient::Fault::Fail());
    Submit(100);
    Step(1);  // A's first upload
    Submit(200);
    module->Update();  // A failed: queued behind B
    Step(1);           // B at once, then A taken and asleep for a second
    Submit(300);
    Step(999);
    EXPECT_EQ(UploadedScores(), (std::vector<int>{100, 200}));
    Step(1);  // A's second upload, and C right behind it
    EXPECT_EQ(UploadedScores(), (std::vector<int>{100, 200, 100, 300}));
}

TEST_F(ScoreSubmitTest, QuitWhileAsleepQueuedOrInFlightReleasesEverything)
{
    world.InjectFault("UploadLeaderboardScore", simclient::Fault::Fail());
    Submit(100);
    Step(1);
    Submit(200);
    module->Update();
    Step(1);      // B in flight, A asleep for its retry
    Submit(300);  // C queued
    EXPECT_EQ(world.BoundCallResultCount(), 1u);
    module->Shutdown();
    engine.QuitAndJoin();
    EXPECT_EQ(Uploads(), 2u);  // neither A nor C goes up after the quit
    ASSERT_TRUE(loader.Unload());
    EXPECT_EQ(world.BoundCallResultCount(), 0u);
    SetUp();
}

}  // namespace
}  // namespace leaderboard_test
