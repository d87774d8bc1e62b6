// A minimal engine table for the fuzz targets: one in-memory file, messages
// formatted (so every argument is used as printf would) and dropped, popups
// answered "give up". Nothing is kept between runs.
#pragma once

#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstring>

#include "host/HostServices.h"

namespace fuzzhost {

struct MemoryFile {
    HostFile record;
    const uint8_t* bytes;
    int64_t position;
};

inline const uint8_t* fileBytes = nullptr;
inline int64_t fileSize = 0;

inline void Format(const char* format, va_list values)
{
    char text[512];
    std::vsnprintf(text, sizeof text, format, values);
}

inline void ReportError(int32_t, const char* format, ...)
{
    va_list values;
    va_start(values, format);
    Format(format, values);
    va_end(values);
}

inline void LogInfo(const char* format, ...)
{
    va_list values;
    va_start(values, format);
    Format(format, values);
    va_end(values);
}

inline HostFile* FileOpen(const char*, const char*)
{
    auto* file = new MemoryFile{{nullptr, fileSize}, fileBytes, 0};
    file->record.handle = file;
    return &file->record;
}

inline int64_t FileRead(void* destination, int64_t count, HostFile* record)
{
    auto* file = static_cast<MemoryFile*>(record->handle);
    const int64_t left = fileSize - file->position;
    const int64_t taken = count < left ? count : left;
    if (taken > 0)
        std::memcpy(destination, file->bytes + file->position, static_cast<size_t>(taken));
    file->position += taken > 0 ? taken : 0;
    return taken;
}

inline int64_t FileTell(HostFile* record)
{
    return static_cast<MemoryFile*>(record->handle)->position;
}

inline int32_t FileSeek(HostFile* record, int64_t position, int32_t)
{
    static_cast<MemoryFile*>(record->handle)->position = position;
    return 0;
}

inline void FileClose(HostFile* record)
{
    delete static_cast<MemoryFile*>(record->handle);
}

inline const char* HostCommand(const char*, const char*)
{
    return nullptr;
}

// Points the module at this table with `data` as the one file.
inline void Install(const uint8_t* data, size_t size)
{
    static HostFileApi files{FileClose, FileTell, FileOpen, FileRead, FileSeek};
    static HostServices table = [] {
        HostServices services{};
        services.HostCommand = HostCommand;
        services.ReportError = ReportError;
        services.LogInfo = LogInfo;
        services.files = &files;
        return services;
    }();
    fileBytes = data;
    fileSize = static_cast<int64_t>(size);
    hostServices = &table;
}

}  // namespace fuzzhost
