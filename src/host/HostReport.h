// Calls into the engine's table that the module makes only when the engine has
// handed the table over and filled the entry: before Initialize, and in the
// tools and tests that run without an engine, they do nothing.
//
// The engine's report entries are C variadic functions. The helpers forward
// their arguments to the entry unchanged, with the same default promotions as a
// direct call, so the engine formats the message itself, byte for byte as before.
#pragma once

#include <cstdint>

#include "host/HostServices.h"

template <typename... Args> void HostReportError(int32_t level, const char* format, Args... args)
{
    if (hostServices != nullptr && hostServices->ReportError != nullptr)
        hostServices->ReportError(level, format, args...);
}

template <typename... Args> void HostLogInfo(const char* format, Args... args)
{
    if (hostServices != nullptr && hostServices->LogInfo != nullptr)
        hostServices->LogInfo(format, args...);
}

template <typename... Args> void HostLog(int32_t level, const char* format, Args... args)
{
    if (hostServices != nullptr && hostServices->Log != nullptr)
        hostServices->Log(level, format, args...);
}

// The engine's answer to `command`, or null when there is no engine to ask.
inline const char* HostCommandIfPresent(const char* command, const char* argument)
{
    if (hostServices == nullptr || hostServices->HostCommand == nullptr)
        return nullptr;
    return hostServices->HostCommand(command, argument);
}

// The engine's file and thread tables, or null when there is no engine.
inline HostFileApi* HostFiles()
{
    return hostServices != nullptr ? hostServices->files : nullptr;
}

inline HostThreadApi* HostThreads()
{
    return hostServices != nullptr ? hostServices->threads : nullptr;
}
