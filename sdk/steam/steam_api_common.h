// Export decoration, the callback pump and the warning hook type; pulls in the callback
// classes and accessor plumbing from steam_api_internal.h.
#ifndef STEAM_API_COMMON_H
#define STEAM_API_COMMON_H

#include <stddef.h>

#include "steamclientpublic.h"
#include "steamtypes.h"

#if defined(_WIN32)
#define S_CALLTYPE __cdecl
#if defined(STEAM_API_EXPORTS)
#define S_API extern "C" __declspec(dllexport)
#else
#define S_API extern "C" __declspec(dllimport)
#endif
#else
#define S_CALLTYPE
#define S_API extern "C" __attribute__((visibility("default")))
#endif

// Severity 0 is a message, 1 a warning.
extern "C" typedef void(S_CALLTYPE* SteamAPIWarningMessageHook_t)(int nSeverity, const char* pchDebugText);

// Delivers every queued callback and completed call result on the calling thread.
S_API void S_CALLTYPE SteamAPI_RunCallbacks();

#include "steam_api_internal.h"

#endif  // STEAM_API_COMMON_H
