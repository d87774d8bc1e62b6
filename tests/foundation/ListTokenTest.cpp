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

TEST(GetListToken, BufferSizeAndNullArguments)
{
    // Catches a size check off by one, a write past `size` bytes (a terminator
    // written into a buffer of size 0 too), and a null list or separator read.
    struct Row {
        const char* name;
        const char* list;
        const char* separator;
        int32_t size;
        const char* expected;  // null: no token
    };
    const Row rows[] = {
        {"negative size", "x,abc,y", ",", -1, nullptr},
        {"no room", "x,abc,y", ",", 0, nullptr},
        {"no room for the terminator", "x,abc,y", ",", 3, nullptr},
        {"exact room", "x,abc,y", ",", 4, "abc"},
        {"room to spare", "x,abc,y", ",", 5, "abc"},
        {"trailing separator, no room", "a,", ",", 0, nullptr},
        {"trailing separator, room for the terminator", "a,", ",", 1, ""},
        {"null list", nullptr, ",", 8, nullptr},
        {"null separator", "a,b", nullptr, 8, nullptr},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        char buffer[8];
        std::memset(buffer, kMarker, sizeof buffer);
        const char* result = GetListToken(buffer, row.size, row.list, row.separator, 1);
        int32_t firstUntouched = 0;
        if (row.expected == nullptr) {
            EXPECT_EQ(result, nullptr);
        } else {
            ASSERT_EQ(result, buffer);
            EXPECT_STREQ(buffer, row.expected);
            firstUntouched = static_cast<int32_t>(std::strlen(row.expected)) + 1;
        }
        for (int32_t i = firstUntouched; i < 8; ++i)
            EXPECT_EQ(buffer[i], kMarker) << "byte " << i;
    }
}

TEST(CountListTokens, OneMoreThanTheSeparatorsATrailingOneIncluded)
{
    EXPECT_EQ(CountListTokens("", ','), 1);
    EXPECT_EQ(CountListTokens("a", ','), 1);
    EXPECT_EQ(CountListTokens("a,b", ','), 2);
    EXPECT_EQ(CountListTokens("a,b,", ','), 3);
    EXPECT_EQ(CountListTokens(",,", ','), 3);
    EXPECT_EQ(CountListTokens("a;b,c", ';'), 2);
}

}  // namespace
