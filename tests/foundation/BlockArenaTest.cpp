#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "RefusingTextHeap.h"
#include "foundation/BlockArena.h"

namespace {

std::string Pattern(size_t length, int seed)
{
    std::string text(length, '\0');
    for (size_t i = 0; i < length; ++i)
        text[i] = static_cast<char>('a' + (i * 7 + static_cast<size_t>(seed)) % 26);
    return text;
}

TEST(BlockArena, TextCopiesStayIntactAcrossChunks)
{
    // Catches a cursor that overlaps copies, a chunk switch that loses the start of a
    // text, or a long text cut at a chunk's end. Lengths straddle the chunk sizes.
    const size_t lengths[] = {0, 1, 15, 16, 200, 1019, 1020, 1021, 4000, 4080, 4081, 9000, 70000, 3, 0, 511};
    BlockArena arena;
    std::vector<std::string> sources;
    std::vector<const char*> copies;
    for (int round = 0; round < 40; ++round) {
        for (size_t length : lengths) {
            sources.push_back(Pattern(length, round));
            const std::string& source = sources.back();
            size_t measured = 12345;
            // Both ways in: measured while copying, and with the length given.
            const char* copy = round % 2 == 0 ? arena.CopyText(source.c_str(), &measured)
                                              : arena.CopyText(source.data(), source.size());
            ASSERT_NE(copy, nullptr);
            if (round % 2 == 0) {
                EXPECT_EQ(measured, length);
            }
            EXPECT_NE(copy, source.c_str());
            copies.push_back(copy);
        }
    }
    for (size_t i = 0; i < copies.size(); ++i) {
        ASSERT_EQ(std::strlen(copies[i]), sources[i].size()) << "copy " << i;
        EXPECT_EQ(copies[i], sources[i]) << "copy " << i;
    }
    // With the length given, zero bytes inside are copied too, and a terminator added.
    const char bytes[] = {'a', '\0', 'b'};
    const char* copy = arena.CopyText(bytes, 3);
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(std::memcmp(copy, bytes, 3), 0);
    EXPECT_EQ(copy[3], '\0');
}

TEST(BlockArena, ObjectsAreAlignedAndDisjoint)
{
    // Catches a rounding that lets blocks overlap or lose the 16-byte alignment.
    BlockArena arena;
    const size_t sizes[] = {1, 24, 56, 16, 17, 3000, 12312, 8, 40000, 5};
    std::vector<std::pair<unsigned char*, size_t>> blocks;
    for (int round = 0; round < 30; ++round) {
        for (size_t size : sizes) {
            auto* block = static_cast<unsigned char*>(arena.AllocateObject(size));
            EXPECT_EQ(reinterpret_cast<uintptr_t>(block) % BlockArena::kObjectAlignment, 0u);
            std::memset(block, static_cast<int>(blocks.size() & 0xFF), size);
            blocks.emplace_back(block, size);
        }
    }
    for (size_t i = 0; i < blocks.size(); ++i) {
        for (size_t b = 0; b < blocks[i].second; ++b)
            ASSERT_EQ(blocks[i].first[b], i & 0xFF) << "block " << i << " byte " << b;
    }
}

TEST(BlockArena, CreateBlockConstructsEveryElement)
{
    struct Record {
        const char* name = nullptr;
        unsigned hash;
        const char* value = nullptr;
    };
    BlockArena arena;
    // Dirty a chunk first, then give it back and take it again from a fresh arena use.
    for (int round = 0; round < 2; ++round) {
        Record* block = arena.CreateBlock<Record>(300);
        for (int i = 0; i < 300; ++i) {
            EXPECT_EQ(block[i].name, nullptr);
            EXPECT_EQ(block[i].value, nullptr);
            block[i].name = "x";
            block[i].value = "y";
        }
        arena.Release();
    }
}

TEST(BlockArena, ReleaseGivesEveryChunkBack)
{
    // Catches an arena that keeps chunks after Release (a leak under ASan), or is
    // not usable again.
    BlockArena arena;
    for (int i = 0; i < 5000; ++i) {
        size_t length = 0;
        ASSERT_NE(arena.CopyText("display_name", &length), nullptr);
    }
    EXPECT_GT(arena.ChunkCount(), 0);
    arena.Release();
    EXPECT_EQ(arena.ChunkCount(), 0);
    size_t length = 0;
    const char* again = arena.CopyText("again", &length);
    ASSERT_NE(again, nullptr);
    EXPECT_STREQ(again, "again");
}

TEST(BlockArena, TextHeapExhaustionGivesNullTextsButObjects)
{
    // Catches texts taken from the throwing lane (an exception instead of null), or
    // objects refused because the text heap is.
    BlockArena arena;
    RefusingTextHeap heap;
    size_t length = 99;
    EXPECT_EQ(arena.CopyText("abc", &length), nullptr);
    EXPECT_EQ(arena.CopyText(std::string(100000, 'x').c_str(), &length), nullptr);
    EXPECT_EQ(arena.CopyText("abc", 3), nullptr);
    int* object = arena.Create<int>();
    ASSERT_NE(object, nullptr);
    EXPECT_EQ(*object, 0);
}

}  // namespace
