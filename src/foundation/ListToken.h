// Splitting a list held in one text; touches neither the heap nor the engine.
#pragma once

#include <cstdint>

// Copies token `index` of `list` split by the substring `separator` into `buffer`.
// Returns `buffer`, or null for a missing token, a null argument or a token too long.
char* GetListToken(char* buffer, int32_t size, const char* list, const char* separator, int32_t index);

// Tokens of `list` split by the character `separator`: one more than the separators,
// so a separator at the very end adds an empty token. `list` must not be null.
int32_t CountListTokens(const char* list, char separator);
