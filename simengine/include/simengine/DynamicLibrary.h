// Opening a module file and finding a function in it, as the operating system offers:
// dlopen with RTLD_NOW | RTLD_LOCAL on ELF systems, LoadLibraryEx on Windows (the
// libraries a module needs are looked for beside it first, like $ORIGIN).
#pragma once

#include <string>

namespace simengine {

class DynamicLibrary {
public:
    DynamicLibrary() = default;
    ~DynamicLibrary() { Close(); }
    DynamicLibrary(const DynamicLibrary&) = delete;
    DynamicLibrary& operator=(const DynamicLibrary&) = delete;

    // False with Error() set when the file can't be loaded.
    bool Open(const std::string& path);
    // The named function, or null with Error() set.
    void* Find(const char* name);
    // True when the library was open and the system let it go.
    bool Close();
    bool IsOpen() const { return handle_ != nullptr; }
    const std::string& Error() const { return error_; }

    // Whether the file at `path` is mapped in this process by anyone.
    static bool IsLoadedAnywhere(const std::string& path);

private:
    void* handle_ = nullptr;
    std::string error_;
};

}  // namespace simengine
