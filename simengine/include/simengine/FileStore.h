// The engine's file API: files under the data root and in-memory files.
//
// A file's bytes are taken whole at FileOpen, so reads never touch the disk
// again and positions are exact. Faults are injected per engine path: the open
// fails, reads stop short after some bytes (the size still tells the full
// length), or every read fails.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <unordered_map>

#include "host/HostServices.h"

namespace simengine {

class Journal;
class PathMapper;

class FileStore {
public:
    FileStore(Journal& journal, PathMapper& paths);
    ~FileStore();
    FileStore(const FileStore&) = delete;
    FileStore& operator=(const FileStore&) = delete;

    // An in-memory file; it hides a file of the same engine path on disk.
    void AddMemoryFile(const std::string& enginePath, std::string bytes);
    void RemoveMemoryFile(const std::string& enginePath);

    void InjectOpenFailure(const std::string& enginePath);
    // Reads deliver no more than `bytes` of the file in all; later reads give 0.
    void InjectShortRead(const std::string& enginePath, int64_t bytes);
    // Every FileRead returns -1 and delivers nothing.
    void InjectReadFailure(const std::string& enginePath);
    void ClearFaults();

    HostFile* Open(const char* path, const char* mode);
    int64_t Read(void* destination, int64_t byteCount, HostFile* file);
    int64_t Tell(HostFile* file);
    // origin 0: from the start, 1: from the position, 2: from the end. 0 on success, -1 else.
    int32_t Seek(HostFile* file, int64_t position, int32_t origin);
    void Close(HostFile* file);

    int OpenFileCount() const;
    int ReadCalls(const std::string& enginePath) const;
    // Closes everything and forgets memory files and faults.
    void Reset();

private:
    struct Faults {
        bool failOpen = false;
        bool failRead = false;
        int64_t readLimit = -1;  // -1: no limit
    };
    struct OpenFile;

    OpenFile* FindOpenLocked(HostFile* file, const char* operation);

    Journal& journal_;
    PathMapper& paths_;
    mutable std::mutex mutex_;
    std::map<std::string, std::shared_ptr<const std::string>> memoryFiles_;
    std::map<std::string, Faults> faults_;
    std::map<std::string, int> readCalls_;
    // Records stay until Reset so that a second close is caught, never a crash.
    std::unordered_map<HostFile*, std::unique_ptr<OpenFile>> files_;
};

}  // namespace simengine
