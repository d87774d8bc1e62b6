#include <cstring>

#include <gtest/gtest.h>

#include "foundation/ListToken.h"

namespace {

constexpr char kMarker = '\x5a';

struct TokenRow {
    const char* list;
    const char* separator;
    int32_t index;
    const char* expected;  // null: no token
};

TEST(GetListToken, Tokens)
{
    // Catches an off-by-one in the walk, a set-of-characters separator, and the trailing rule.
    const TokenRow rows[] = {
        {"a,b", ",", 0, "a"},     {"a,b", ",", 1, "b"},
        {"a,b", ",", 2, nullptr}, {"a,b,", ",", 2, ""},
        {"a,b,", ",", 3, ""},     {"a,b,", ",", 50, ""},
        {"a,b,", ",", -1, ""},    {"a,b", ",", -1, nullptr},
        {"", ",", 0, ""},         {"", ",", 1, nullptr},
        {",b", ",", 0, ""},       {"a,,c", ",", 1, ""},
        {"a,,c", ",", 2, "c"},    {"a::b", "::", 1, "b"},
        {"a::b", "::", 0, "a"},   {"a:b::c", "::", 0, "a:b"},
        {"a:b::c", ":", 1, "b"},  {"one;two;three", ";", 2, "three"},
        {"abc", "", 0, ""},       {"abc", "", 5, ""},
        {"abc", "", -1, ""},      {"buy,item1", ",", 1, "item1"},
    };
    for (const TokenRow& row : rows) {
        SCOPED_TRACE(std::string(row.list) + " [" + row.separator + "] #" + std::to_string(row.index));
        char buffer[32];
        std::memset(buffer, kMarker, sizeof buffer);
        const char* result = GetListToken(buffer, sizeof buffer, row.list, row.separator, row.index);
        if (row.expected == nullptr) {
            EXPECT_EQ(result, nullptr);
            EXPECT_EQ(buffer[0], kMarker);
        } else {
            ASSERT_EQ(result, buffer);
            EXPECT_STREQ(buffer, row.expected);
        }
    }
}

TEST(GetListToken, NullArguments)
{
    char buffer[8] = "keep";
    EXPECT_EQ(GetListToken(buffer, sizeof buffer, nullptr, ",", 0), nullptr);
    EXPECT_EQ(GetListToken(buffer, sizeof buffer, "a,b", nullptr, 0), nullptr);
    EXPECT_STREQ(buffer, "keep");
}

TEST(GetListToken, BufferSize)
{
    // Catches a size check off by one, or a write past `size` bytes.
    struct Row {
        int32_t size;
        bool found;
    };
    const Row rows[] = {{-1, false}, {0, false}, {3, false}, {4, true}, {5, true}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.size);
        char buffer[8];
        std::memset(buffer, kMarker, sizeof buffer);
        const char* result = GetListToken(buffer, row.size, "x,abc,y", ",", 1);
        EXPECT_EQ(result != nullptr, row.found);
        if (row.found) {
            EXPECT_STREQ(buffer, "abc");
        }
        const int32_t firstUntouched = row.found ? 4 : 0;
        for (int32_t i = firstUntouched; i < 8; ++i)
            EXPECT_EQ(buffer[i], kMarker) << "byte " << i;
    }
}

TEST(GetListToken, TrailingSeparatorWithNoRoom)
{
    // Catches a terminator written into a buffer of size 0.
    char buffer[2] = {kMarker, kMarker};
    EXPECT_EQ(GetListToken(buffer, 0, "a,", ",", 1), nullptr);
    EXPECT_EQ(buffer[0], kMarker);
    EXPECT_EQ(GetListToken(buffer, 1, "a,", ",", 1), buffer);
    EXPECT_EQ(buffer[0], '\0');
    EXPECT_EQ(buffer[1], kMarker);
}

}  // namespace
