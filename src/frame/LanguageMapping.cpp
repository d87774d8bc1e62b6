#include "frame/LanguageMapping.h"

#include <cstring>

#include <steam/steam_api.h>

#include "host/HostServices.h"

namespace {

constexpr int32_t kEnglish = 8;

struct Language {
    const char* platformWord;  // null: the platform has no word for it
    const char* localeCode;
};

const Language kLanguages[] = {
    {"arabic", "ar"},      {nullptr, "bn"},      {"bulgarian", "bg"},  {"schinese", "zh-CN"},
    {"tchinese", "zh-TW"}, {"czech", "cs"},      {"danish", "da"},     {"dutch", "nl"},
    {"english", "en"},     {"finnish", "fi"},    {"french", "fr"},     {"greek", "el"},
    {"german", "de"},      {nullptr, "hi"},      {"hungarian", "hu"},  {nullptr, "id"},
    {"italian", "it"},     {"japanese", "ja"},   {"koreana", "ko"},  // the platform's word for Korean ends in "a"
    {"norwegian", "no"},   {"polish", "pl"},     {"portuguese", "pt"}, {"brazilian", "pt-BR"},
    {nullptr, "pa"},       {"romanian", "ro"},   {"russian", "ru"},    {"spanish", "es"},
    {"swedish", "sv"},     {"thai", "th"},       {"turkish", "tr"},    {"ukrainian", "uk"},
    {nullptr, "ur"},       {"vietnamese", "vi"},
};
constexpr int32_t kLanguageCount = sizeof kLanguages / sizeof kLanguages[0];
static_assert(kLanguageCount == 33, "the module numbers 33 languages");

constexpr int32_t kSpanish = 26;

}  // namespace

int32_t LanguageNumberFromPlatformWord(const char* word)
{
    if (word == nullptr)
        return kEnglish;
    for (int32_t number = 0; number < kLanguageCount; ++number) {
        const char* known = kLanguages[number].platformWord;
        if (known != nullptr && std::strcmp(known, word) == 0)
            return number;
    }
    if (std::strcmp(word, "latam") == 0)  // Latin-American Spanish shares the code
        return kSpanish;
    return kEnglish;
}

const char* LocaleCodeFromLanguageNumber(int32_t number)
{
    if (number < 0 || number >= kLanguageCount)
        return "en";
    return kLanguages[number].localeCode;
}

const char* CurrentLanguageLocaleCode()
{
    if (SteamApps() == nullptr)
        return nullptr;
    const char* word = SteamApps()->GetCurrentGameLanguage();
    const char* code = "null";
    if (word == nullptr)
        word = "null";
    else
        code = LocaleCodeFromLanguageNumber(LanguageNumberFromPlatformWord(word));
    hostServices->Log(kHostLogInfo, "ExtensionModuleSteam - language: %s (%s)", word, code);
    return code;
}
