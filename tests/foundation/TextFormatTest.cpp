#include <algorithm>
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
    // Catches a write past `size`, a missing terminator, a result that is the cut
    // length, and a negative size taken as a huge unsigned one.
    struct Row {
        int32_t size;
        const char* expected;  // null: nothing written
    };
    const Row rows[] = {{-100, nullptr}, {-1, nullptr}, {0, nullptr}, {1, ""},
                        {2, "h"},        {5, "hell"},   {6, "hello"}, {7, "hello"}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.size);
        char buffer[16];
        std::memset(buffer, kMarker, sizeof buffer);
        EXPECT_EQ(FormatToBuffer(buffer, row.size, "%s", "hello"), 5);
        if (row.expected != nullptr) {
            EXPECT_STREQ(buffer, row.expected);
        }
        for (int32_t i = std::max(row.size, 0); i < 16; ++i)
            EXPECT_EQ(buffer[i], kMarker) << "byte " << i;
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

TEST(FormatString, PlacesResultsByLength)
{
    // Catches a short result kept off the inline room, a result cut at 4095
    // characters when the second pass is skipped or mis-sized, and a conversion
    // passed on wrongly.
    EXPECT_STREQ(FormatString("%s-%d-%c-%x-%llu", "a", -3, 'z', 255u, 12345678901ull).text,
                 "a--3-z-ff-12345678901");
    for (size_t length : {0u, 1u, 14u, 15u, 4095u, 4096u, 4097u, 10000u}) {
        SCOPED_TRACE(length);
        const std::string expected(length, 'x');
        InlineString s = FormatString("%s", expected.c_str());
        ASSERT_NE(s.text, nullptr);
        EXPECT_EQ(s.text == s.inlineBuffer, length < 15);
        EXPECT_EQ(s.length, static_cast<int32_t>(length));
        if (length >= 15) {
            EXPECT_EQ(s.capacity, static_cast<int32_t>(length));
        }
        EXPECT_EQ(std::string(s.text), expected);
    }
}

}  // namespace
