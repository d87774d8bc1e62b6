// The engine's table: plain functions that forward to the one Engine.
#include <cstdarg>

#include "simengine/Engine.h"

namespace simengine {

namespace {

Engine& E()
{
    return Engine::Instance();
}

HostBuffer* CreateBuffer(uint32_t size)
{
    return E().Memory().CreateBuffer(size);
}
void* Allocate(int32_t size)
{
    return E().Memory().Allocate(size);
}
const char* HostCommand(const char* command, const char* argument)
{
    return E().Commands().Handle(command, argument);
}
void ReleaseBuffer(HostBuffer* buffer)
{
    E().Memory().ReleaseBuffer(buffer);
}
const char* GetProductValue(const char* key)
{
    return E().GetProductValue(key);
}
uint32_t GetTimeMs()
{
    return E().Time().NowMs();
}
bool IsQuitting()
{
    return E().IsQuitting();
}

void ReportError(int32_t level, const char* format, ...)
{
    va_list values;
    va_start(values, format);
    E().WriteLog(LogKind::Report, level, format, values);
    va_end(values);
}

void Log(int32_t level, const char* format, ...)
{
    va_list values;
    va_start(values, format);
    E().WriteLog(LogKind::Log, level, format, values);
    va_end(values);
}

void LogInfo(const char* format, ...)
{
    va_list values;
    va_start(values, format);
    E().WriteLog(LogKind::Info, kHostLogInfo, format, values);
    va_end(values);
}

bool IsFeatureEnabled(const char* feature)
{
    return E().IsFeatureEnabled(feature);
}
void PostEvent(HostEvent* event)
{
    E().PostEvent(event);
}
void SetInputAxis(int32_t inputId, float value)
{
    E().SetInputAxis(inputId, value);
}
void SetInputButton(int32_t inputId, int32_t value)
{
    E().SetInputButton(inputId, value);
}
void InitEvent(HostEvent* event, int32_t type)
{
    E().InitEvent(event, type);
}

void FileClose(HostFile* file)
{
    E().Files().Close(file);
}
int64_t FileTell(HostFile* file)
{
    return E().Files().Tell(file);
}
HostFile* FileOpen(const char* path, const char* mode)
{
    return E().Files().Open(path, mode);
}
int64_t FileRead(void* destination, int64_t byteCount, HostFile* file)
{
    return E().Files().Read(destination, byteCount, file);
}
int32_t FileSeek(HostFile* file, int64_t position, int32_t origin)
{
    return E().Files().Seek(file, position, origin);
}

void StartThread(const char* name, HostThreadEntry entry, void* argument, int32_t flags)
{
    E().Threads().Start(name, entry, argument, flags);
}
HostMutex* CreateMutex(const char* name)
{
    return E().Mutexes().Create(name);
}
void LockMutex(HostMutex* mutex)
{
    E().Mutexes().Lock(mutex);
}
void ThreadSleep(uint32_t milliseconds)
{
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
