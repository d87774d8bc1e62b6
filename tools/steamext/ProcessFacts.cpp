#include "ProcessFacts.h"

#if defined(_WIN32)
#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include <cstdio>
#include <vector>
#else
#include <unistd.h>
#endif

namespace steamext {

#if defined(_WIN32)

std::filesystem::path ThisProgramPath()
{
    std::vector<wchar_t> buffer(MAX_PATH);
    for (;;) {
        const DWORD length = GetModuleFileNameW(nullptr, buffer.data(), static_cast<DWORD>(buffer.size()));
        if (length == 0)
            return {};
        if (length < buffer.size())
            return std::filesystem::path(std::wstring(buffer.data(), length));
        buffer.resize(buffer.size() * 2);
    }
}

void WriteStandardStreamsAsBytes()
{
    _setmode(_fileno(stdout), _O_BINARY);
    _setmode(_fileno(stderr), _O_BINARY);
}

bool StandardOutputIsTerminal()
{
    return _isatty(_fileno(stdout)) != 0;
}

#else

std::filesystem::path ThisProgramPath()
{
    std::error_code error;
    std::filesystem::path self = std::filesystem::read_symlink("/proc/self/exe", error);
    return error ? std::filesystem::path() : self;
}

void WriteStandardStreamsAsBytes() {}

bool StandardOutputIsTerminal()
{
    return isatty(STDOUT_FILENO) != 0;
}

#endif

}  // namespace steamext
