// The text-to-number rule of a product number: what the platform calls get.
#include <gtest/gtest.h>

#include <cstdint>

#include "services/store/ProductNumber.h"

namespace {

TEST(ProductNumber, ParsesAsTheFileWritesIt)
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
        {"0x1F", 0},
        {"2147483647", INT32_MAX},
        {"2147483648", INT32_MAX},  // held at the end of the 32-bit range
        {"-2147483649", INT32_MIN},
        {"99999999999999999999999", INT32_MAX},
    };
    for (const Row& row : rows)
        EXPECT_EQ(ParseProductNumber(row.text), row.number) << '"' << row.text << '"';
}

}  // namespace
