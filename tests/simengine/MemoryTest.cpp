// Buffers and event memory are tracked: live counts, double releases caught,
// injected allocation failures, and everything freed at Reset.
#include <cstring>

#include "EngineFixture.h"

using MemoryTest = EngineTest;

TEST_F(MemoryTest, TracksLiveBuffersAndCatchesDoubleRelease)
{
    // Catches a release that frees twice or a live count that never falls.
    expectFaults = true;
    HostBuffer* first = table->CreateBuffer(16);
    HostBuffer* empty = table->CreateBuffer(0);
    ASSERT_NE(first, nullptr);
    ASSERT_NE(empty, nullptr);
    EXPECT_EQ(first->size, 16u);
    std::memset(first->data, 0x7F, first->size);
    EXPECT_NE(empty->data, nullptr);
    EXPECT_EQ(engine.Memory().LiveBufferCount(), 2);

    table->ReleaseBuffer(first);
    EXPECT_EQ(engine.Memory().LiveBufferCount(), 1);
    EXPECT_TRUE(engine.Records().All().Faults().empty());

    table->ReleaseBuffer(first);
    HostBuffer stranger{nullptr, 0};
    table->ReleaseBuffer(&stranger);
    std::vector<simengine::EngineFault> faults = engine.Records().All().Faults();
    ASSERT_EQ(faults.size(), 2u);
    EXPECT_NE(faults[0].text.find("already released"), std::string::npos);
    EXPECT_NE(faults[1].text.find("unknown"), std::string::npos);
    EXPECT_EQ(engine.Memory().BuffersCreated(), 2);
}

TEST_F(MemoryTest, InjectedFailuresGiveNullThenRecover)
{
    // Catches a failure count that never runs out or that skips the first call.
    engine.Memory().FailNextAllocations(2);
    EXPECT_EQ(table->Allocate(8), nullptr);
    EXPECT_EQ(table->Allocate(8), nullptr);
    EXPECT_NE(table->Allocate(8), nullptr);
    EXPECT_EQ(table->Allocate(-1), nullptr);

    engine.Memory().FailNextBuffers(1);
    EXPECT_EQ(table->CreateBuffer(4), nullptr);
    EXPECT_NE(table->CreateBuffer(4), nullptr);
}

TEST_F(MemoryTest, ResetFreesEverything)
{
    // Catches memory handed to the engine surviving a reset (ASan reports the leak).
    size_t size = 0;
    void* block = table->Allocate(32);
    ASSERT_TRUE(engine.Memory().FindAllocation(block, &size));
    EXPECT_EQ(size, 32u);
    table->CreateBuffer(64);
    engine.Reset();
    EXPECT_EQ(engine.Memory().AllocationCount(), 0);
    EXPECT_EQ(engine.Memory().LiveBufferCount(), 0);
    EXPECT_FALSE(engine.Memory().FindAllocation(block, &size));
}
