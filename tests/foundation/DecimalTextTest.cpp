// Decimal text to numbers, as configuration values, command arguments and the
// platform's ids are read: the same result whatever the width of `long`.
#include <gtest/gtest.h>

#include <cstdint>

#include "foundation/DecimalText.h"

namespace {

TEST(DecimalText, Int32ReadsAsTheTextIsWritten)
{
    struct Row {
        const char* text;
        int32_t number;
    };
    const Row rows[] = {
        {"1001", 1001},
        {"  \t1001", 1001},  // leading white space
        {"+1001", 1001},
        {"-5", -5},
        {"1004abc", 1004},  // stops at the first other character
        {"12 34", 12},
        {"abc", 0},  // no digits
        {"", 0},
        {nullptr, 0},
        {"0x1F", 0},
        {"2147483647", INT32_MAX},
        {"2147483648", INT32_MAX},  // held at the end of the 32-bit range, not wrapped
        {"4294967297", INT32_MAX},
        {"-2147483649", INT32_MIN},
        {"99999999999999999999999", INT32_MAX},
    };
    for (const Row& row : rows)
        EXPECT_EQ(DecimalToInt32(row.text), row.number) << '"' << (row.text ? row.text : "null") << '"';
}

TEST(DecimalText, UInt64ReadsWholeIds)
{
    EXPECT_EQ(DecimalToUInt64("76561197960287930"), 76561197960287930u);
    EXPECT_EQ(DecimalToUInt64("18446744073709551615"), UINT64_MAX);
    EXPECT_EQ(DecimalToUInt64("18446744073709551616"), UINT64_MAX);
    EXPECT_EQ(DecimalToUInt64(" 2001x"), 2001u);
    EXPECT_EQ(DecimalToUInt64(nullptr), 0u);
    EXPECT_EQ(DecimalToUInt64("id"), 0u);
}

}  // namespace
