// Settling: the engine's thread may move the clock only once every thread it
// started is asleep, ended, or polls for something only the engine's thread
// (or another thread's progress) can change. A thread that polls without
// sleeping must not hold the engine up, and what it does once unblocked must
// land in the same step on every run.
#include <atomic>
#include <string>
#include <vector>

#include "EngineFixture.h"

namespace {

// Like a results thread waiting for a player's name: asks until the engine's
// thread sets it, with no pause between the questions.
void PollForName(void*)
{
    const char* name = nullptr;
    while ((name = Host()->GetProductValue("player_name")) == nullptr && !Host()->IsQuitting()) {
    }
    Host()->LogInfo("name %s", name != nullptr ? name : "(none)");
}

// The same through the platform: asks RequestUserInformation, as the client
// reports it, until the engine's pump has brought the name.
std::atomic<bool> nameKnown{false};
void PollThePlatform(void*)
{
    while (!nameKnown.load()) {
        simengine::Engine::Instance().Threads().NoteCall("RequestUserInformation", "76561197960287930, true");
        if (Host()->IsQuitting())
            return;
    }
    Host()->LogInfo("name %s", "Ann");
}

// Two threads: the waker sleeps, then raises a flag under an engine mutex;
// the watcher polls the flag under the same mutex.
struct Flag {
    HostMutex* mutex = nullptr;
    int raised = 0;
};

void Waker(void* argument)
{
    auto* flag = static_cast<Flag*>(argument);
    Host()->threads->ThreadSleep(100);
    Host()->LogInfo("raising");
    Host()->threads->LockMutex(flag->mutex);
    flag->raised = 1;
    Host()->threads->UnlockMutex(flag->mutex);
    while (!Host()->IsQuitting())
        Host()->threads->ThreadSleep(1000);
}

void Watcher(void* argument)
{
    auto* flag = static_cast<Flag*>(argument);
    for (int seen = 0; seen == 0 && !Host()->IsQuitting();) {
        Host()->threads->LockMutex(flag->mutex);
        seen = flag->raised;
        Host()->threads->UnlockMutex(flag->mutex);
        Host()->threads->ThreadSleep(0);
    }
    Host()->LogInfo("seen");
}

}  // namespace

class SettleTest : public EngineTest {
protected:
    // Settles and gives the log lines since the last step; a settle that
    // needed its guard fails the test.
    std::vector<std::string> Step(const char* what)
    {
        SCOPED_TRACE(what);
        simengine::Engine::SettleReport report = engine.Settle();
        EXPECT_TRUE(report.settled) << "only the guard ended the wait";
        std::vector<std::string> texts = engine.Records().Since(mark).LogTexts();
        mark = engine.Records().Mark();
        return texts;
    }

    uint64_t mark = 0;
};

TEST_F(SettleTest, APollingThreadSettlesAndActsInTheStepThatUnblocksIt)
{
    struct Row {
        const char* name;
        HostThreadEntry entry;
    } rows[] = {{"polls the engine's table", &PollForName}, {"polls the platform", &PollThePlatform}};
    for (const Row& row : rows) {
        for (int run = 0; run < 2; ++run) {
            SCOPED_TRACE(std::string(row.name) + ", run " + std::to_string(run + 1));
            engine.Reset();
            nameKnown = false;
            mark = engine.Records().Mark();
            table->threads->StartThread("Test_Poller", row.entry, nullptr, 0);
            EXPECT_EQ(Step("started"), std::vector<std::string>{});
            EXPECT_EQ(engine.Settle().polling, std::vector<std::string>{"Test_Poller"});
            engine.Time().Advance(16);
            EXPECT_EQ(Step("a frame without the name"), std::vector<std::string>{});

            engine.SetProductValue("player_name", "Ann");  // what the pump brings
            nameKnown = true;
            EXPECT_EQ(Step("the name is known"), std::vector<std::string>{"name Ann"});
            EXPECT_EQ(engine.Threads().RunningCount("Test_Poller"), 0);
        }
    }
}

TEST_F(SettleTest, AThreadUnblockedByAnotherActsBeforeTheStepEnds)
{
    // The watcher polls before and after the waker raises the flag; the
    // waker's progress must make it show its polling anew, so that "seen"
    // never slips into a later step.
    static Flag flag;
    flag.mutex = table->threads->CreateMutex("Test_Flag");
    for (int run = 0; run < 2; ++run) {
        SCOPED_TRACE("run " + std::to_string(run + 1));
        engine.Reset();
        mark = engine.Records().Mark();
        flag.raised = 0;
        table->threads->StartThread("Test_Waker", &Waker, &flag, 0);
        table->threads->StartThread("Test_Watcher", &Watcher, &flag, 0);
        EXPECT_EQ(Step("started"), std::vector<std::string>{});
        engine.Time().Advance(100);
        EXPECT_EQ(Step("the waker wakes"), (std::vector<std::string>{"raising", "seen"}));
        EXPECT_EQ(engine.Threads().RunningCount("Test_Watcher"), 0);
    }
}
