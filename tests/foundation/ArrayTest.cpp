#include <cstddef>
#include <cstring>
#include <new>
#include <string>

#include <gtest/gtest.h>

#include "foundation/BlockArena.h"
#include "foundation/PtrArray.h"
#include "foundation/ValueArray.h"

namespace {

// The header is read and zeroed by holders: data, count, capacity, autoShrink.
static_assert(offsetof(PtrArray<int>, data) == 0, "header layout");
static_assert(offsetof(PtrArray<int>, count) == 8, "header layout");
static_assert(offsetof(PtrArray<int>, capacity) == 12, "header layout");
static_assert(offsetof(PtrArray<int>, autoShrink) == 16, "header layout");
static_assert(sizeof(PtrArray<int>) == 24, "header layout");

// A record like the data model's pairs: pointers nulled by construction, a field left unset.
struct Pair {
    const char* name = nullptr;
    unsigned hash;
    const char* value = nullptr;
};

int slots[100];

int* Slot(int i)
{
    return &slots[i];
}

int* const slotZero = &slots[0];

void Fill(PtrArray<int>& array, int n)
{
    for (int i = 0; i < n; ++i)
        array.Add(Slot(i));
}

void ExpectInOrder(const PtrArray<int>& array, int n)
{
    ASSERT_EQ(array.count, n);
    for (int i = 0; i < n; ++i)
        EXPECT_EQ(array.data[i], Slot(i)) << "index " << i;
}

TEST(PtrArray, GrowthSteps)
{
    // Catches a first block not of the fixed 32, a wrong step, arena blocks that
    // grow by another rule, and an item read from the array's own old block after
    // that block was freed or overwritten: the last add of each row, at the step,
    // is the array's own first element.
    struct Row {
        const char* name;
        int32_t reserve;  // -1: none
        int adds;
        int32_t capacity;
    };
    const Row rows[] = {
        {"a zeroed header takes a first block of 32", -1, 1, 32},
        {"32 fit the first block", -1, 32, 32},
        {"the 33rd doubles", -1, 33, 64},
        {"the 65th doubles again", -1, 65, 128},
        {"one-element block steps to 8", 1, 2, 8},
        {"then doubles", 1, 9, 16},
        {"a block of 3 doubles", 3, 4, 6},
    };
    BlockArena arena;
    for (const Row& row : rows) {
        for (bool inArena : {false, true}) {
            SCOPED_TRACE(std::string(row.name) + (inArena ? " (arena)" : " (heap)"));
            PtrArray<int> array;
            if (row.reserve >= 0)
                inArena ? array.Reserve(row.reserve, arena) : array.Reserve(row.reserve);
            for (int i = 0; i < row.adds - 1; ++i)
                inArena ? array.Add(Slot(i), arena) : array.Add(Slot(i));
            // By reference into the block that the add may replace.
            int* const& last = row.adds > 1 ? array.data[0] : slotZero;
            inArena ? array.Add(last, arena) : array.Add(last);
            EXPECT_EQ(array.capacity, row.capacity);
            ASSERT_EQ(array.count, row.adds);
            for (int i = 0; i < row.adds - 1; ++i)
                EXPECT_EQ(array.data[i], Slot(i)) << "index " << i;
            EXPECT_EQ(array.data[row.adds - 1], Slot(0));
            if (inArena)
                array.ForgetBlock();
        }
    }
}

TEST(PtrArray, Reserve)
{
    // Catches a Reserve that drops elements when asked for less than count.
    PtrArray<int> array;
    EXPECT_EQ(array.count, 0);
    EXPECT_EQ(array.capacity, 0);
    EXPECT_FALSE(array.autoShrink);
    array.Reserve(0);
    EXPECT_EQ(array.data, nullptr);  // equal to capacity: nothing at all

    Fill(array, 10);
    int** block = array.data;
    array.Reserve(32);
    EXPECT_EQ(array.data, block);  // equal to capacity: no new block

    array.Reserve(4);
    EXPECT_EQ(array.capacity, 10);
    ExpectInOrder(array, 10);

    array.Reserve(100);
    EXPECT_EQ(array.capacity, 100);
    ExpectInOrder(array, 10);
}

TEST(PtrArray, Shrink)
{
    // Catches a shrink that runs with autoShrink off, past a quarter, or on an empty array.
    struct Row {
        const char* name;
        bool autoShrink;
        int count;
        int32_t capacity;
    };
    const Row rows[] = {
        {"off changes nothing", false, 8, 32},    {"a quarter halves", true, 8, 16},
        {"over a quarter stays", true, 9, 32},    {"one element halves", true, 1, 16},
        {"emptied keeps its block", true, 0, 32},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        PtrArray<int> array;
        Fill(array, 32);
        array.count = row.count;
        array.autoShrink = row.autoShrink;
        int** block = array.data;
        array.Shrink();
        EXPECT_EQ(array.capacity, row.capacity);
        EXPECT_EQ(array.data == block, row.capacity == 32);
        ExpectInOrder(array, row.count);
    }
}

TEST(PtrArray, Removal)
{
    // Catches a removal that swaps the last element in rather than keeping the order.
    PtrArray<int> array;
    Fill(array, 5);
    EXPECT_EQ(array.IndexOf(Slot(3)), 3);
    EXPECT_EQ(array.IndexOf(Slot(50)), -1);
    EXPECT_TRUE(array.Remove(Slot(1)));
    EXPECT_FALSE(array.Remove(Slot(1)));
    array.RemoveAt(3);  // Slot(4)
    array.RemoveAt(7);  // out of range: nothing
    ASSERT_EQ(array.count, 3);
    EXPECT_EQ(array.data[0], Slot(0));
    EXPECT_EQ(array.data[1], Slot(2));
    EXPECT_EQ(array.data[2], Slot(3));
    EXPECT_EQ(array.capacity, 32);
}

TEST(ValueArray, NewBlocksAreConstructedAndMovesKeepFields)
{
    // Catches elements of a new block left with stale pointers, or a move that loses a
    // field, from the heap or from an arena.
    BlockArena arena;
    for (bool inArena : {false, true}) {
        SCOPED_TRACE(inArena ? "arena" : "heap");
        ValueArray<Pair> array;
        Pair first;
        first.name = "n";
        first.hash = 110;
        first.value = "v";
        if (inArena) {
            array.Reserve(1, arena);
            array.Add(first, arena);
            array.Add(array.data[0], arena);  // steps to 8, from its own element
        } else {
            array.Reserve(1);
            array.Add(first);
            array.Add(array.data[0]);
        }
        ASSERT_EQ(array.capacity, 8);
        for (int i = 0; i < 2; ++i) {
            EXPECT_STREQ(array.data[i].name, "n");
            EXPECT_EQ(array.data[i].hash, 110u);
            EXPECT_STREQ(array.data[i].value, "v");
        }
        for (int i = 2; i < array.capacity; ++i) {
            EXPECT_EQ(array.data[i].name, nullptr);
            EXPECT_EQ(array.data[i].value, nullptr);
        }
        if (inArena)
            array.ForgetBlock();
    }
}

}  // namespace
