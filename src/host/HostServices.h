// The engine's table of functions, as the engine hands it to the module.
//
// The engine calls nothing of ours here; we call it. Entries are listed in the
// engine's table order, which is a binary interface: never reorder them.
#pragma once

#include <cstddef>
#include <cstdint>

struct HostEvent;

// What CreateBuffer gives: the first field points to `size` writable bytes.
struct HostBuffer {
    void* data;
    uint32_t size;
};

// What FileOpen gives: an engine handle, then the file's size in bytes.
struct HostFile {
    void* handle;
    int64_t size;
};

// A mutex of the engine; the same name gives the same mutex.
struct HostMutex;

using HostThreadEntry = void (*)(void* argument);

struct HostFileApi {
    void (*FileClose)(HostFile* file);
    int64_t (*FileTell)(HostFile* file);
    HostFile* (*FileOpen)(const char* path, const char* mode);
    int64_t (*FileRead)(void* destination, int64_t byteCount, HostFile* file);
    int32_t (*FileSeek)(HostFile* file, int64_t position, int32_t origin);
};

struct HostThreadApi {
    void (*StartThread)(const char* name, HostThreadEntry entry, void* argument, int32_t flags);
    HostMutex* (*CreateMutex)(const char* name);
    void (*LockMutex)(HostMutex* mutex);
    void (*ThreadSleep)(uint32_t milliseconds);
    void (*UnlockMutex)(HostMutex* mutex);
};

struct HostServices {
    HostBuffer* (*CreateBuffer)(uint32_t size);
    void* (*Allocate)(int32_t size);
    const char* (*HostCommand)(const char* command, const char* argument);
    void (*ReleaseBuffer)(HostBuffer* buffer);
    const char* (*GetProductValue)(const char* key);
    uint32_t (*GetTimeMs)();
    bool (*IsQuitting)();
    void (*ReportError)(int32_t level, const char* format, ...);
    void (*Log)(int32_t level, const char* format, ...);
    void (*LogInfo)(const char* format, ...);
    bool (*IsFeatureEnabled)(const char* feature);
    void (*PostEvent)(HostEvent* event);
    void (*SetInputAxis)(int32_t inputId, float value);
    void (*SetInputButton)(int32_t inputId, int32_t value);
    void (*InitEvent)(HostEvent* event, int32_t type);
    HostFileApi* files;
    HostThreadApi* threads;
};

// Log levels of Log and ReportError.
enum HostLogLevel : int32_t {
    kHostLogInfo = 0,
    kHostLogWarning = 1,
    kHostLogError = 2,
};

// The module-wide pointer to the engine's table: null until the first step of
// ExtensionModule::Initialize, never cleared afterwards.
extern HostServices* hostServices;
