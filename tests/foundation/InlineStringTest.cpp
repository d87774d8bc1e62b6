#include <cstring>
#include <string>

#include <gtest/gtest.h>

#include "RefusingTextHeap.h"
#include "foundation/InlineString.h"

namespace {

bool IsInline(const InlineString& s)
{
    return s.text == s.inlineBuffer;
}

TEST(InlineString, FirstAssignPlacesByLength)
{
    // Catches an off-by-one at the inline limit: length + terminator must be below 16.
    struct Row {
        size_t length;
        bool inlineExpected;
        int32_t capacity;
    };
    const Row rows[] = {{0, true, 15},   {1, true, 15},   {14, true, 15},
                        {15, false, 15}, {16, false, 16}, {300, false, 300}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.length);
        const std::string source(row.length, 'x');
        InlineString s;
        s.Assign(source.c_str());
        ASSERT_NE(s.text, nullptr);
        EXPECT_EQ(IsInline(s), row.inlineExpected);
        EXPECT_EQ(s.capacity, row.capacity);
        EXPECT_EQ(s.length, static_cast<int32_t>(row.length));
        EXPECT_STREQ(s.text, source.c_str());
    }
}

TEST(InlineString, ShrinkingOnTheHeap)
{
    // Catches the in-place rule taken against capacity or with the 256 bound off by
    // one, and a reassignment of the same length that does not stay in place.
    struct Row {
        const char* name;
        size_t newLength;
        bool sameBlock;
        bool inlineExpected;
        int32_t capacity;
    };
    const Row rows[] = {
        {"same length stays in place", 300, true, false, 300},
        {"by 200 stays in place", 100, true, false, 300},
        {"by 255 stays in place", 45, true, false, 300},
        {"by 256 moves to an exact block", 44, false, false, 44},
        {"to 10 moves inline", 10, false, true, 15},
        {"to nothing moves inline", 0, false, true, 15},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        InlineString s;
        s.Assign(std::string(300, 'a').c_str());
        char* block = s.text;
        const std::string shorter(row.newLength, 'b');
        s.Assign(shorter.c_str());
        EXPECT_EQ(s.text == block, row.sameBlock);
        EXPECT_EQ(IsInline(s), row.inlineExpected);
        EXPECT_EQ(s.capacity, row.capacity);
        EXPECT_EQ(s.length, static_cast<int32_t>(row.newLength));
        EXPECT_STREQ(s.text, shorter.c_str());
    }
}

TEST(InlineString, GrowingNeverReusesTheBlockEvenWithRoom)
{
    // Catches a decision taken from capacity: the block had room for 12 bytes.
    InlineString s;
    s.Assign(std::string(100, 'a').c_str());
    s.Assign("0123456789");  // in place: 90 shorter
    ASSERT_FALSE(IsInline(s));
    EXPECT_EQ(s.capacity, 100);
    s.Assign("0123456789ab");
    EXPECT_TRUE(IsInline(s));
    EXPECT_STREQ(s.text, "0123456789ab");

    s.Assign(std::string(20, 'c').c_str());  // longer than 12: a new exact block
    EXPECT_FALSE(IsInline(s));
    EXPECT_EQ(s.capacity, 20);
}

TEST(InlineString, AssignOfOwnTail)
{
    // Catches a copy made from a block that was already freed or overwritten (run under ASan).
    struct Row {
        size_t total;
        size_t offset;
    };
    const Row rows[] = {{10, 3}, {40, 30}, {40, 5}, {400, 100}, {300, 299}};
    for (const Row& row : rows) {
        SCOPED_TRACE(std::to_string(row.total) + "@" + std::to_string(row.offset));
        std::string source;
        for (size_t i = 0; i < row.total; ++i)
            source += static_cast<char>('a' + i % 26);
        InlineString s;
        s.Assign(source.c_str());
        s.Assign(s.text + row.offset);
        EXPECT_STREQ(s.text, source.c_str() + row.offset);
        EXPECT_EQ(s.length, static_cast<int32_t>(row.total - row.offset));
        EXPECT_EQ(IsInline(s), row.total - row.offset + 1 < 16);
    }
}

TEST(InlineString, NullText)
{
    // Catches a null assignment that keeps the text or resets capacity, and an
    // append that concatenates onto a null text instead of assigning.
    InlineString s;
    EXPECT_EQ(s.text, nullptr);
    EXPECT_EQ(s.length, 0);
    EXPECT_EQ(s.capacity, 0);
    s.Assign(std::string(50, 'q').c_str());
    s.Assign(nullptr);
    EXPECT_EQ(s.text, nullptr);
    EXPECT_EQ(s.length, 0);
    EXPECT_EQ(s.capacity, 50);

    s.Append("xy");
    EXPECT_TRUE(IsInline(s));
    EXPECT_STREQ(s.text, "xy");
    EXPECT_EQ(s.length, 2);
    EXPECT_EQ(s.capacity, 15);
}

TEST(InlineString, AppendLandsInAnExactHeapBlock)
{
    // Catches an append that keeps short results inline or reserves extra room.
    InlineString s;
    s.Assign("ab");
    s.Append("cd");
    EXPECT_FALSE(IsInline(s));
    EXPECT_STREQ(s.text, "abcd");
    EXPECT_EQ(s.length, 4);
    EXPECT_EQ(s.capacity, 4);
    for (const char* nothing : {"", static_cast<const char*>(nullptr)}) {
        s.Append(nothing);
        EXPECT_STREQ(s.text, "abcd");
        EXPECT_EQ(s.capacity, 4);
    }
}

TEST(InlineString, CopiesAreIndependent)
{
    // Catches a bytewise copy, whose text would point into the source's inline room.
    InlineString a;
    a.Assign("short");
    InlineString b(a);
    EXPECT_TRUE(IsInline(b));
    EXPECT_STREQ(b.text, "short");
    InlineString c;
    c.Assign(std::string(30, 'z').c_str());
    char* block = c.text;
    c = a;  // shorter by 25: overwritten in place
    EXPECT_EQ(c.text, block);
    a.Assign("other");
    EXPECT_STREQ(b.text, "short");
    EXPECT_STREQ(c.text, "short");
    InlineString& same = c;
    c = same;
    EXPECT_STREQ(c.text, "short");
}

TEST(InlineString, HeapExhaustionLeavesNoText)
{
    // Catches a string left pointing at a freed block, or a null deref, when the copy fails.
    InlineString s;
    s.Assign(std::string(40, 'a').c_str());
    RefusingTextHeap heap;
    s.Assign(std::string(41, 'b').c_str());
    EXPECT_EQ(s.text, nullptr);
    EXPECT_EQ(s.length, 0);

    s.Assign("fits inline");  // needs no heap
    EXPECT_STREQ(s.text, "fits inline");
    s.Append("!");
    EXPECT_EQ(s.text, nullptr);
    EXPECT_EQ(s.length, 0);
}

}  // namespace
