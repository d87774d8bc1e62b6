// Threads, named mutexes and the manual clock: workers are stepped by the test
// through the sleep rendezvous, never by real sleeps.
#include <atomic>
#include <string>

#include "EngineFixture.h"

namespace {

// Like a statistics updater: note the time, sleep 400, until quitting.
std::atomic<int> passes{0};
void Updater(void*)
{
    while (!Host()->IsQuitting()) {
        passes.fetch_add(1);
        Host()->threads->ThreadSleep(400);
    }
}

struct Counter {
    HostMutex* mutex;
    int value;
};
void CountUnderMutex(void* argument)
{
    auto* counter = static_cast<Counter*>(argument);
    for (int i = 0; i < 1000; ++i) {
        Host()->threads->LockMutex(counter->mutex);
        ++counter->value;
        Host()->threads->UnlockMutex(counter->mutex);
    }
}

void LockAndRelease(void* argument)
{
    auto* mutex = static_cast<HostMutex*>(argument);
    Host()->threads->LockMutex(mutex);
    Host()->threads->UnlockMutex(mutex);
}

}  // namespace

using ThreadsAndClockTest = EngineTest;

TEST_F(ThreadsAndClockTest, SleepingThreadWakesOnlyWhenTheClockHasPassed)
{
    // Catches a sleep that returns early, or a rendezvous that reports a thread
    // still asleep from before the clock moved.
    passes = 0;
    table->threads->StartThread("Test_Updater", &Updater, nullptr, 0);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping("Test_Updater"));
    EXPECT_EQ(passes.load(), 1);

    engine.Time().Advance(399);
    EXPECT_EQ(engine.Time().SleepingCount("Test_Updater"), 1);
    EXPECT_EQ(passes.load(), 1);

    // A woken sleeper stops counting at once, so the rendezvous waits for the next sleep.
    engine.Time().Advance(1);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping("Test_Updater"));
    EXPECT_EQ(passes.load(), 2);
    EXPECT_EQ(table->GetTimeMs(), 400u);

    engine.QuitAndJoin();
    EXPECT_EQ(engine.Threads().RunningCount(), 0);
    EXPECT_EQ(engine.Time().SleepCalls("Test_Updater"), 2u);
}

TEST_F(ThreadsAndClockTest, ManualClockWrapsAt32Bits)
{
    // Catches a clock that saturates instead of wrapping like the engine's.
    engine.Time().UseManual(0xFFFFFF00u);
    engine.Time().Advance(0x200);
    EXPECT_EQ(table->GetTimeMs(), 0x100u);
}

TEST_F(ThreadsAndClockTest, QuitEndsScaledSleepsAtOnce)
{
    // Catches QuitAndJoin hanging on a worker in a long real-time sleep.
    engine.Time().UseScaled(1.0);
    table->threads->StartThread("Test_Updater", &Updater, nullptr, 0);
    ASSERT_TRUE(engine.Time().WaitUntilSleeping("Test_Updater"));
    engine.QuitAndJoin();
    EXPECT_EQ(engine.Threads().RunningCount(), 0);
    EXPECT_TRUE(table->IsQuitting());
}

TEST_F(ThreadsAndClockTest, SameNameGivesSameMutexAndCountsEachUse)
{
    // Catches a mutex per call (no mutual exclusion) or miscounted lock pairs.
    HostMutex* first = table->threads->CreateMutex("DATAMAN");
    HostMutex* second = table->threads->CreateMutex("DATAMAN");
    HostMutex* other = table->threads->CreateMutex("STEAM_UGC");
    EXPECT_EQ(first, second);
    EXPECT_NE(first, other);

    Counter counter{first, 0};
    table->threads->StartThread("Counter_A", &CountUnderMutex, &counter, 0);
    table->threads->StartThread("Counter_B", &CountUnderMutex, &counter, 0);
    engine.Threads().JoinAll();
    EXPECT_EQ(counter.value, 2000);

    simengine::MutexCounts counts = engine.Mutexes().Counts("DATAMAN");
    EXPECT_EQ(counts.creates, 2);
    EXPECT_EQ(counts.locks, 2000);
    EXPECT_EQ(counts.unlocks, 2000);
    EXPECT_EQ(engine.Mutexes().Counts("STEAM_UGC").locks, 0);
    EXPECT_EQ(engine.Threads().StartedCount("Counter_A"), 1);
}

TEST_F(ThreadsAndClockTest, HeldMutexBlocksOthersAndAllowsItsOwnerAgain)
{
    // Catches a mutex that lets a second thread in, deadlocks its owner on re-entry, or
    // takes an unlock by nobody (undefined behaviour on a real mutex) instead of a fault.
    HostMutex* mutex = table->threads->CreateMutex("STEAM_LEADERBOARDS_REQUEST");
    table->threads->LockMutex(mutex);
    table->threads->LockMutex(mutex);
    table->threads->StartThread("Waiter", &LockAndRelease, mutex, 0);
    table->threads->UnlockMutex(mutex);
    EXPECT_EQ(engine.Mutexes().Counts("STEAM_LEADERBOARDS_REQUEST").locks, 2)
        << "the waiter must still be blocked";
    table->threads->UnlockMutex(mutex);
    engine.Threads().Join("Waiter");
    EXPECT_EQ(engine.Mutexes().Counts("STEAM_LEADERBOARDS_REQUEST").locks, 3);

    expectFaults = true;
    table->threads->UnlockMutex(mutex);
    table->threads->LockMutex(nullptr);
    EXPECT_EQ(engine.Records().All().Faults().size(), 2u);
    EXPECT_EQ(engine.Mutexes().Counts("STEAM_LEADERBOARDS_REQUEST").unlocks, 3);
}
