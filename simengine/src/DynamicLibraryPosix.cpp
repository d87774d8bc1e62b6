#include <dlfcn.h>

#include "simengine/DynamicLibrary.h"

namespace simengine {

namespace {

std::string LastDlError()
{
    const char* text = dlerror();
    return text != nullptr ? text : "unknown error";
}

}  // namespace

bool DynamicLibrary::Open(const std::string& path)
{
    Close();
    dlerror();  // clear any stale error text
    handle_ = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (handle_ == nullptr)
        error_ = LastDlError();
    return handle_ != nullptr;
}

void* DynamicLibrary::Find(const char* name)
{
    dlerror();
    void* symbol = handle_ != nullptr ? dlsym(handle_, name) : nullptr;
    if (symbol == nullptr)
        error_ = handle_ != nullptr ? LastDlError() : "no library is open";
    return symbol;
}

bool DynamicLibrary::Close()
{
    if (handle_ == nullptr)
        return false;
    bool closed = dlclose(handle_) == 0;
    handle_ = nullptr;
    if (!closed)
        error_ = LastDlError();
    return closed;
}

bool DynamicLibrary::IsLoadedAnywhere(const std::string& path)
{
    // RTLD_NOLOAD finds the library only if something keeps it in the process.
    void* handle = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL | RTLD_NOLOAD);
    if (handle != nullptr)
        dlclose(handle);
    return handle != nullptr;
}

}  // namespace simengine
