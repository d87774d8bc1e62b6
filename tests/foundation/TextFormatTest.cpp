#include <cstring>
#include <string>

#include <gtest/gtest.h>

#include "RefusingTextHeap.h"
#include "foundation/TextFormat.h"

namespace {

constexpr char kMarker = '\x5a';

TEST(DuplicateText, CopiesAndTreatsNullAsEmpty)
{
    // Catches a null result for a null argument, or a copy sharing the source.
    char source[] = "abc\xfe";
    char* copy = DuplicateText(source);
    ASSERT_NE(copy, nullptr);
    EXPECT_NE(copy, source);
    EXPECT_STREQ(copy, source);
    FreeText(copy);

    char* empty = DuplicateText(nullptr);
    ASSERT_NE(empty, nullptr);
    EXPECT_STREQ(empty, "");
    FreeText(empty);

    RefusingTextHeap heap;
    EXPECT_EQ(DuplicateText("abc"), nullptr);
}

TEST(FormatToBuffer, BoundsAndResult)
{
    // Catches a write past `size`, a missing terminator, or a result that is the cut length.
    struct Row {
        int32_t size;
        const char* expected;
    };
    const Row rows[] = {{1, ""}, {2, "h"}, {5, "hell"}, {6, "hello"}, {7, "hello"}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.size);
        char buffer[16];
        std::memset(buffer, kMarker, sizeof buffer);
        EXPECT_EQ(FormatToBuffer(buffer, row.size, "%s", "hello"), 5);
        EXPECT_STREQ(buffer, row.expected);
        for (int32_t i = row.size; i < 16; ++i)
            EXPECT_EQ(buffer[i], kMarker) << "byte " << i;
    }
}

TEST(FormatToBuffer, NoRoomWritesNothing)
{
    // Catches a negative size taken as a huge unsigned one.
    for (int32_t size : {0, -1, -100}) {
        SCOPED_TRACE(size);
        char buffer[4];
        std::memset(buffer, kMarker, sizeof buffer);
        EXPECT_EQ(FormatToBuffer(buffer, size, "%d", 1234), 4);
        for (char c : buffer)
            EXPECT_EQ(c, kMarker);
    }
}

TEST(FormatToBufferRaw, TooLongGivesMinusOne)
{
    // Catches a result that claims a text fitted when its terminator had no room.
    struct Row {
        int64_t size;
        int32_t result;
    };
    const Row rows[] = {{0, -1}, {4, -1}, {5, -1}, {6, 5}, {128, 5}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.size);
        char buffer[130];
        std::memset(buffer, kMarker, sizeof buffer);
        EXPECT_EQ(FormatToBufferRaw(buffer, row.size, "%s%d", "abc", 42), row.result);
        if (row.result >= 0) {
            EXPECT_STREQ(buffer, "abc42");
        }
        for (int64_t i = row.size; i < 130; ++i)
            EXPECT_EQ(buffer[i], kMarker) << "byte " << i;
    }
}

TEST(FormatString, SmallResultsLandInline)
{
    InlineString s = FormatString("%s-%d-%c-%x-%llu", "a", -3, 'z', 255u, 12345678901ull);
    EXPECT_STREQ(s.text, "a--3-z-ff-12345678901");
    EXPECT_FALSE(s.text == s.inlineBuffer);

    InlineString empty = FormatString("%s", "");
    ASSERT_NE(empty.text, nullptr);
    EXPECT_EQ(empty.text, empty.inlineBuffer);
    EXPECT_EQ(empty.length, 0);

    InlineString shortOne = FormatString("%d", 7);
    EXPECT_EQ(shortOne.text, shortOne.inlineBuffer);
    EXPECT_STREQ(shortOne.text, "7");
}

TEST(FormatString, AroundTheStackBuffer)
{
    // Catches a result cut at 4095 characters when the second pass is skipped or mis-sized.
    for (size_t length : {4095u, 4096u, 4097u, 10000u}) {
        SCOPED_TRACE(length);
        std::string expected(length - 1, 'x');
        expected += 'E';
        InlineString s = FormatString("%s%c", std::string(length - 1, 'x').c_str(), 'E');
        ASSERT_NE(s.text, nullptr);
        EXPECT_EQ(s.length, static_cast<int32_t>(length));
        EXPECT_EQ(s.capacity, static_cast<int32_t>(length));
        EXPECT_EQ(std::string(s.text), expected);
    }
}

}  // namespace
