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

// The engine finds each entry by its position: check every one, so that two
// entries of the same signature swapped in the declarations fail to compile.
#define HOST_TABLE_SLOT(Table, Entry, slot)                                                                  \
    static_assert(offsetof(Table, Entry) == (slot) * sizeof(void*), #Table "::" #Entry " is entry " #slot)

HOST_TABLE_SLOT(HostFileApi, FileClose, 0);
HOST_TABLE_SLOT(HostFileApi, FileTell, 1);
HOST_TABLE_SLOT(HostFileApi, FileOpen, 2);
HOST_TABLE_SLOT(HostFileApi, FileRead, 3);
HOST_TABLE_SLOT(HostFileApi, FileSeek, 4);
static_assert(sizeof(HostFileApi) == 5 * sizeof(void*), "HostFileApi has five entries");

HOST_TABLE_SLOT(HostThreadApi, StartThread, 0);
HOST_TABLE_SLOT(HostThreadApi, CreateMutex, 1);
HOST_TABLE_SLOT(HostThreadApi, LockMutex, 2);
HOST_TABLE_SLOT(HostThreadApi, ThreadSleep, 3);
HOST_TABLE_SLOT(HostThreadApi, UnlockMutex, 4);
static_assert(sizeof(HostThreadApi) == 5 * sizeof(void*), "HostThreadApi has five entries");

HOST_TABLE_SLOT(HostServices, CreateBuffer, 0);
HOST_TABLE_SLOT(HostServices, Allocate, 1);
HOST_TABLE_SLOT(HostServices, HostCommand, 2);
HOST_TABLE_SLOT(HostServices, ReleaseBuffer, 3);
HOST_TABLE_SLOT(HostServices, GetProductValue, 4);
HOST_TABLE_SLOT(HostServices, GetTimeMs, 5);
HOST_TABLE_SLOT(HostServices, IsQuitting, 6);
HOST_TABLE_SLOT(HostServices, ReportError, 7);
HOST_TABLE_SLOT(HostServices, Log, 8);
HOST_TABLE_SLOT(HostServices, LogInfo, 9);
HOST_TABLE_SLOT(HostServices, IsFeatureEnabled, 10);
HOST_TABLE_SLOT(HostServices, PostEvent, 11);
HOST_TABLE_SLOT(HostServices, SetInputAxis, 12);
HOST_TABLE_SLOT(HostServices, SetInputButton, 13);
HOST_TABLE_SLOT(HostServices, InitEvent, 14);
HOST_TABLE_SLOT(HostServices, files, 15);
HOST_TABLE_SLOT(HostServices, threads, 16);
static_assert(sizeof(HostServices) == 17 * sizeof(void*), "HostServices has seventeen entries");

#undef HOST_TABLE_SLOT
