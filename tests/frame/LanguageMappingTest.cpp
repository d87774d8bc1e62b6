// Catches a wrong row, a case-insensitive comparison, or an unsafe lookup
// outside the table in the platform-word to locale-code mapping.
#include <gtest/gtest.h>

#include <string>

#include "frame/LanguageMapping.h"

namespace {

std::string CodeFor(const char* word)
{
    return LocaleCodeFromLanguageNumber(LanguageNumberFromPlatformWord(word));
}

TEST(LanguageMapping, EveryPlatformWordReachesItsCode)
{
    struct Row {
        const char* word;
        const char* code;
    };
    const Row rows[] = {
        {"arabic", "ar"},     {"bulgarian", "bg"}, {"schinese", "zh-CN"}, {"tchinese", "zh-TW"},
        {"czech", "cs"},      {"danish", "da"},    {"dutch", "nl"},       {"english", "en"},
        {"finnish", "fi"},    {"french", "fr"},    {"greek", "el"},       {"german", "de"},
        {"hungarian", "hu"},  {"italian", "it"},   {"japanese", "ja"},    {"koreana", "ko"},
        {"norwegian", "no"},  {"polish", "pl"},    {"portuguese", "pt"},  {"brazilian", "pt-BR"},
        {"romanian", "ro"},   {"russian", "ru"},   {"spanish", "es"},     {"latam", "es"},
        {"swedish", "sv"},    {"thai", "th"},      {"turkish", "tr"},     {"ukrainian", "uk"},
        {"vietnamese", "vi"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.word);
        EXPECT_EQ(CodeFor(row.word), row.code);
    }
}

TEST(LanguageMapping, UnknownWordsFallBackToEnglish)
{
    const char* words[] = {nullptr, "", "English", "korean", "spanish ", "latin", "bengali"};
    for (const char* word : words) {
        SCOPED_TRACE(word != nullptr ? word : "(null)");
        EXPECT_EQ(LanguageNumberFromPlatformWord(word), 8);
        EXPECT_EQ(CodeFor(word), "en");
    }
}

TEST(LanguageMapping, NumbersWithoutPlatformWordKeepTheirCodes)
{
    struct Row {
        int number;
        const char* code;
    };
    const Row rows[] = {{1, "bn"}, {13, "hi"}, {15, "id"}, {23, "pa"}, {31, "ur"}, {0, "ar"}, {32, "vi"}};
    for (const Row& row : rows) {
        SCOPED_TRACE(row.number);
        EXPECT_STREQ(LocaleCodeFromLanguageNumber(row.number), row.code);
    }
}

TEST(LanguageMapping, NumbersOutsideTheTableGiveEnglish)
{
    for (int number : {-1, 33, 1000, -2147483647 - 1}) {
        SCOPED_TRACE(number);
        EXPECT_STREQ(LocaleCodeFromLanguageNumber(number), "en");
    }
}

}  // namespace
