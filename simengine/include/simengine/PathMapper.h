// Maps engine paths ("leaderboards/leaderboards.xml") to native paths under
// the data root and back. Used by the file API and by the path commands.
#pragma once

#include <mutex>
#include <string>

namespace simengine {

class PathMapper {
public:
    // The native folder engine paths are relative to; a trailing "/" is dropped.
    void SetDataRoot(std::string nativeFolder);
    std::string DataRoot() const;

    // An engine path as a native path, without a trailing "/". Absolute paths
    // are already native and pass unchanged.
    std::string ToNative(const std::string& enginePath) const;
    // A native path under the data root as an engine path; anything else
    // passes unchanged, as the engine then has no shorter name for it.
    std::string ToEngine(const std::string& nativePath) const;

private:
    mutable std::mutex mutex_;
    std::string root_;
};

}  // namespace simengine
