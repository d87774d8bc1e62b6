#include <windows.h>

#include <filesystem>

#include "simengine/DynamicLibrary.h"

namespace simengine {

namespace {

std::string LastSystemError()
{
    const DWORD code = GetLastError();
    char* text = nullptr;
    const DWORD length = FormatMessageA(FORMAT_MESSAGE_ALLOCATE_BUFFER | FORMAT_MESSAGE_FROM_SYSTEM |
                                            FORMAT_MESSAGE_IGNORE_INSERTS,
                                        nullptr, code, 0, reinterpret_cast<char*>(&text), 0, nullptr);
    std::string message = length > 0 ? std::string(text, length) : "unknown error";
    LocalFree(text);
    while (!message.empty() && (message.back() == '\n' || message.back() == '\r' || message.back() == ' '))
        message.pop_back();
    return message + " (error " + std::to_string(code) + ")";
}

// The altered search order (the module's own folder first) needs a full path.
std::string FullPath(const std::string& path)
{
    std::error_code ignored;
    std::filesystem::path full = std::filesystem::absolute(path, ignored);
    return full.empty() ? path : full.make_preferred().string();
}

}  // namespace

bool DynamicLibrary::Open(const std::string& path)
{
    Close();
    // No dialog box for a file that isn't a library: the caller reports it.
    const UINT previous = SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX);
    handle_ = LoadLibraryExA(FullPath(path).c_str(), nullptr, LOAD_WITH_ALTERED_SEARCH_PATH);
    if (handle_ == nullptr)
        error_ = LastSystemError();
    SetErrorMode(previous);
    return handle_ != nullptr;
}

void* DynamicLibrary::Find(const char* name)
{
    if (handle_ == nullptr) {
        error_ = "no library is open";
        return nullptr;
    }
    FARPROC symbol = GetProcAddress(static_cast<HMODULE>(handle_), name);
    if (symbol == nullptr)
        error_ = LastSystemError();
    return reinterpret_cast<void*>(symbol);
}

bool DynamicLibrary::Close()
{
    if (handle_ == nullptr)
        return false;
    bool closed = FreeLibrary(static_cast<HMODULE>(handle_)) != 0;
    handle_ = nullptr;
    if (!closed)
        error_ = LastSystemError();
    return closed;
}

bool DynamicLibrary::IsLoadedAnywhere(const std::string& path)
{
    HMODULE handle = nullptr;
    return GetModuleHandleExA(GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT, FullPath(path).c_str(),
                              &handle) != 0;
}

}  // namespace simengine
