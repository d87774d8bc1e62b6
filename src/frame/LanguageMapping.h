// The platform's language words to the engine's locale codes, through the
// module's own numbering of 33 languages.
#pragma once

#include <cstdint>

// Word to number: null and unknown words give 8 (English).
int32_t LanguageNumberFromPlatformWord(const char* word);
// Number to locale code: numbers outside the table give "en".
const char* LocaleCodeFromLanguageNumber(int32_t number);
// The "GetLanguage" command: the locale code, "null", or null without ISteamApps.
const char* CurrentLanguageLocaleCode();
