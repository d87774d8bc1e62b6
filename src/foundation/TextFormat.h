// Free functions on plain zero-terminated text. None touches the engine.
#pragma once

#include <cstdarg>
#include <cstdint>

#include "foundation/Compiler.h"
#include "foundation/InlineString.h"

// A heap copy of `text` (the empty text for null); null only when the heap is exhausted.
char* DuplicateText(const char* text);

// printf into a new string; never in the empty state.
InlineString FormatString(const char* format, ...) STEAMEXT_PRINTF_FORMAT(1, 2);

// Bounded printf: always terminates, returns the full length needed, -1 on error.
int32_t FormatToBuffer(char* buffer, int32_t size, const char* format, ...) STEAMEXT_PRINTF_FORMAT(3, 4);
int32_t FormatToBufferV(char* buffer, int32_t size, const char* format, va_list args);

// As FormatToBuffer, but -1 when the text does not fit (termination not sure then).
int32_t FormatToBufferRaw(char* buffer, int64_t size, const char* format, ...) STEAMEXT_PRINTF_FORMAT(3, 4);
