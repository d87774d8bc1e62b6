// The engine's table: plain functions that forward to the one Engine.
#include <cstdarg>
#include <string>

#include "simengine/Engine.h"

namespace simengine {

namespace {

Engine& E()
{
    return Engine::Instance();
}

// The calls of a thread the engine started are noted, so that a thread that
// polls can be told from one that works (ThreadRegistry).
void Note(const char* name, const std::string& args = std::string())
{
    E().Threads().NoteCall(name, args);
}

std::string Text(const char* text)
{
    return text != nullptr ? text : "null";
}

std::string Pointer(const void* pointer)
{
    return std::to_string(reinterpret_cast<uintptr_t>(pointer));
}

HostBuffer* CreateBuffer(uint32_t size)
{
    Note("CreateBuffer", std::to_string(size));
    return E().Memory().CreateBuffer(size);
}
void* Allocate(int32_t size)
{
    Note("Allocate", std::to_string(size));
    return E().Memory().Allocate(size);
}
const char* HostCommand(const char* command, const char* argument)
{
    Note("HostCommand", Text(command) + "," + Text(argument));
    return E().Commands().Handle(command, argument);
}
void ReleaseBuffer(HostBuffer* buffer)
{
    Note("ReleaseBuffer", Pointer(buffer));
    E().Memory().ReleaseBuffer(buffer);
}
const char* GetProductValue(const char* key)
{
    Note("GetProductValue", Text(key));
    return E().GetProductValue(key);
}
uint32_t GetTimeMs()
{
    Note("GetTimeMs");
    return E().Time().NowMs();
}
// IsQuitting, LockMutex and UnlockMutex are not noted: a worker that drains a queue
// of entries needing no other call repeats just these, and would pass for a thread
// that polls while it is in fact moving on.
bool IsQuitting()
{
    return E().IsQuitting();
}

void ReportError(int32_t level, const char* format, ...)
{
    Note("ReportError", Text(format));
    va_list values;
    va_start(values, format);
    E().WriteLog(LogKind::Report, level, format, values);
    va_end(values);
}

void Log(int32_t level, const char* format, ...)
{
    Note("Log", Text(format));
    va_list values;
    va_start(values, format);
    E().WriteLog(LogKind::Log, level, format, values);
    va_end(values);
}

void LogInfo(const char* format, ...)
{
    Note("LogInfo", Text(format));
    va_list values;
    va_start(values, format);
    E().WriteLog(LogKind::Info, kHostLogInfo, format, values);
    va_end(values);
}

bool IsFeatureEnabled(const char* feature)
{
    Note("IsFeatureEnabled", Text(feature));
    return E().IsFeatureEnabled(feature);
}
void PostEvent(HostEvent* event)
{
    Note("PostEvent", Pointer(event));
    E().PostEvent(event);
}
void SetInputAxis(int32_t inputId, float value)
{
    Note("SetInputAxis", std::to_string(inputId));
    E().SetInputAxis(inputId, value);
}
void SetInputButton(int32_t inputId, int32_t value)
{
    Note("SetInputButton", std::to_string(inputId));
    E().SetInputButton(inputId, value);
}
void InitEvent(HostEvent* event, int32_t type)
{
    Note("InitEvent", std::to_string(type));
    E().InitEvent(event, type);
}

void FileClose(HostFile* file)
{
    Note("FileClose", Pointer(file));
    E().Files().Close(file);
}
int64_t FileTell(HostFile* file)
{
    Note("FileTell", Pointer(file));
    return E().Files().Tell(file);
}
HostFile* FileOpen(const char* path, const char* mode)
{
    Note("FileOpen", Text(path));
    return E().Files().Open(path, mode);
}
int64_t FileRead(void* destination, int64_t byteCount, HostFile* file)
{
    Note("FileRead", Pointer(file));
    return E().Files().Read(destination, byteCount, file);
}
int32_t FileSeek(HostFile* file, int64_t position, int32_t origin)
{
    Note("FileSeek", Pointer(file));
    return E().Files().Seek(file, position, origin);
}

void StartThread(const char* name, HostThreadEntry entry, void* argument, int32_t flags)
{
    Note("StartThread", Text(name));
    E().Threads().Start(name, entry, argument, flags);
}
HostMutex* CreateMutex(const char* name)
{
    Note("CreateMutex", Text(name));
    return E().Mutexes().Create(name);
}
void LockMutex(HostMutex* mutex)
{
    E().Mutexes().Lock(mutex);
}
void ThreadSleep(uint32_t milliseconds)
{
    // A real sleep is counted by the clock; ThreadSleep(0) returns at once and may poll.
    if (milliseconds > 0)
        E().Threads().NoteSleep();
    else
        Note("ThreadSleep", "0");
    E().Time().Sleep(milliseconds, ThreadRegistry::CurrentName());
}
void UnlockMutex(HostMutex* mutex)
{
    E().Mutexes().Unlock(mutex);
}

HostFileApi fileApi = {FileClose, FileTell, FileOpen, FileRead, FileSeek};
HostThreadApi threadApi = {StartThread, CreateMutex, LockMutex, ThreadSleep, UnlockMutex};
HostServices table = {
    CreateBuffer, Allocate,       HostCommand, ReleaseBuffer, GetProductValue,  GetTimeMs,
    IsQuitting,   ReportError,    Log,         LogInfo,       IsFeatureEnabled, PostEvent,
    SetInputAxis, SetInputButton, InitEvent,   &fileApi,      &threadApi,
};

}  // namespace

HostServices* Engine::Table()
{
    return &table;
}

}  // namespace simengine
