#include "simengine/FileStore.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>

#include "simengine/Journal.h"
#include "simengine/PathMapper.h"

namespace simengine {

// The engine's record comes first so a HostFile* is the OpenFile's address.
struct FileStore::OpenFile {
    HostFile record;
    std::string path;
    std::shared_ptr<const std::string> bytes;
    int64_t position = 0;
    int64_t delivered = 0;
    bool open = true;
};

namespace {

std::shared_ptr<const std::string> ReadWholeFile(const std::string& nativePath)
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(nativePath, error))
        return nullptr;
    std::ifstream stream(nativePath, std::ios::binary);
    if (!stream)
        return nullptr;
    std::ostringstream contents;
    contents << stream.rdbuf();
    if (stream.bad())
        return nullptr;
    return std::make_shared<const std::string>(contents.str());
}

}  // namespace

FileStore::FileStore(Journal& journal, PathMapper& paths) : journal_(journal), paths_(paths) {}

FileStore::~FileStore()
{
    Reset();
}

void FileStore::AddMemoryFile(const std::string& enginePath, std::string bytes)
{
    std::lock_guard<std::mutex> lock(mutex_);
    memoryFiles_[enginePath] = std::make_shared<const std::string>(std::move(bytes));
}

void FileStore::RemoveMemoryFile(const std::string& enginePath)
{
    std::lock_guard<std::mutex> lock(mutex_);
    memoryFiles_.erase(enginePath);
}

void FileStore::InjectOpenFailure(const std::string& enginePath)
{
    std::lock_guard<std::mutex> lock(mutex_);
    faults_[enginePath].failOpen = true;
}

void FileStore::InjectShortRead(const std::string& enginePath, int64_t bytes)
{
    std::lock_guard<std::mutex> lock(mutex_);
    faults_[enginePath].readLimit = std::max<int64_t>(bytes, 0);
}

void FileStore::InjectReadFailure(const std::string& enginePath)
{
    std::lock_guard<std::mutex> lock(mutex_);
    faults_[enginePath].failRead = true;
}

void FileStore::ClearFaults()
{
    std::lock_guard<std::mutex> lock(mutex_);
    faults_.clear();
}

HostFile* FileStore::Open(const char* path, const char* mode)
{
    std::string enginePath = path != nullptr ? path : "";
    std::string modeText = mode != nullptr ? mode : "";
    std::unique_lock<std::mutex> lock(mutex_);

    bool inMemory = false;
    std::shared_ptr<const std::string> bytes;
    bool readMode = !modeText.empty() && modeText[0] == 'r' && modeText.find('+') == std::string::npos;
    auto fault = faults_.find(enginePath);
    bool failOpen = fault != faults_.end() && fault->second.failOpen;
    if (path != nullptr && readMode && !failOpen) {
        auto memory = memoryFiles_.find(enginePath);
        if (memory != memoryFiles_.end()) {
            bytes = memory->second;
            inMemory = true;
        } else {
            bytes = ReadWholeFile(paths_.ToNative(enginePath));
        }
    }

    HostFile* result = nullptr;
    if (bytes != nullptr) {
        auto file = std::make_unique<OpenFile>();
        file->record.handle = file.get();
        file->record.size = static_cast<int64_t>(bytes->size());
        file->path = enginePath;
        file->bytes = std::move(bytes);
        result = &file->record;
        files_[result] = std::move(file);
    }
    lock.unlock();

    journal_.Record(FileOpenCall{enginePath, modeText, result != nullptr, inMemory});
    if (!readMode)
        journal_.Fault("FileOpen of '" + enginePath + "' with mode '" + modeText +
                       "': the engine only reads");
    return result;
}

FileStore::OpenFile* FileStore::FindOpenLocked(HostFile* file, const char* operation)
{
    auto found = files_.find(file);
    if (found == files_.end() || !found->second->open) {
        journal_.Fault(std::string(operation) +
                       (found == files_.end() ? " of an unknown file" : " of a closed file"));
        return nullptr;
    }
    return found->second.get();
}

int64_t FileStore::Read(void* destination, int64_t byteCount, HostFile* file)
{
    std::lock_guard<std::mutex> lock(mutex_);
    OpenFile* open = FindOpenLocked(file, "FileRead");
    if (open == nullptr)
        return -1;
    ++readCalls_[open->path];
    if (byteCount < 0 || (destination == nullptr && byteCount > 0)) {
        journal_.Fault("FileRead of '" + open->path + "' with a bad destination or count");
        return -1;
    }

    int64_t available = std::max<int64_t>(static_cast<int64_t>(open->bytes->size()) - open->position, 0);
    auto fault = faults_.find(open->path);
    if (fault != faults_.end()) {
        if (fault->second.failRead)
            return -1;
        if (fault->second.readLimit >= 0)
            available = std::min(available, std::max<int64_t>(fault->second.readLimit - open->delivered, 0));
    }
    int64_t count = std::min(byteCount, available);
    if (count > 0)
        std::memcpy(destination, open->bytes->data() + open->position, static_cast<size_t>(count));
    open->position += count;
    open->delivered += count;
    return count;
}

int64_t FileStore::Tell(HostFile* file)
{
    std::lock_guard<std::mutex> lock(mutex_);
    OpenFile* open = FindOpenLocked(file, "FileTell");
    return open != nullptr ? open->position : -1;
}

int32_t FileStore::Seek(HostFile* file, int64_t position, int32_t origin)
{
    std::lock_guard<std::mutex> lock(mutex_);
    OpenFile* open = FindOpenLocked(file, "FileSeek");
    if (open == nullptr)
        return -1;
    int64_t base = 0;
    if (origin == 1)
        base = open->position;
    else if (origin == 2)
        base = static_cast<int64_t>(open->bytes->size());
    else if (origin != 0)
        return -1;
    // As with C streams, a position behind the end is allowed; before the start is not.
    if (base + position < 0)
        return -1;
    open->position = base + position;
    return 0;
}

void FileStore::Close(HostFile* file)
{
    std::lock_guard<std::mutex> lock(mutex_);
    OpenFile* open = FindOpenLocked(file, "FileClose");
    if (open == nullptr)
        return;
    open->open = false;
    open->bytes.reset();
}

int FileStore::OpenFileCount() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return static_cast<int>(
        std::count_if(files_.begin(), files_.end(), [](const auto& entry) { return entry.second->open; }));
}

int FileStore::ReadCalls(const std::string& enginePath) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto found = readCalls_.find(enginePath);
    return found != readCalls_.end() ? found->second : 0;
}

void FileStore::Reset()
{
    std::lock_guard<std::mutex> lock(mutex_);
    files_.clear();
    memoryFiles_.clear();
    faults_.clear();
    readCalls_.clear();
}

}  // namespace simengine
