// What differs between the compilers that build the module: how the one export is
// declared, and whether printf-style formats can be checked.
#pragma once

// The module's export: in the DLL's export table on Windows, the one visible symbol of
// an ELF object elsewhere (the rest is hidden at compile time and by the version script).
#if defined(_WIN32)
#define STEAMEXT_EXPORT extern "C" __declspec(dllexport)
#else
#define STEAMEXT_EXPORT extern "C" __attribute__((visibility("default")))
#endif

// Checks printf-style arguments against the format at `formatIndex` (counted from 1).
// mingw's C library is told to follow the C standard's printf (64-bit %lld, %zu), so its
// formats are checked as GNU's; MSVC has no such attribute.
#if defined(__MINGW32__)
#define STEAMEXT_PRINTF_FORMAT(formatIndex, firstArgument)                                                   \
    __attribute__((format(gnu_printf, formatIndex, firstArgument)))
#elif defined(__GNUC__) || defined(__clang__)
#define STEAMEXT_PRINTF_FORMAT(formatIndex, firstArgument)                                                   \
    __attribute__((format(printf, formatIndex, firstArgument)))
#else
#define STEAMEXT_PRINTF_FORMAT(formatIndex, firstArgument)
#endif
