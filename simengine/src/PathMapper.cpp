#include "simengine/PathMapper.h"

namespace simengine {

namespace {

std::string WithoutTrailingSlashes(std::string path)
{
    while (path.size() > 1 && path.back() == '/')
        path.pop_back();
    return path;
}

}  // namespace

void PathMapper::SetDataRoot(std::string nativeFolder)
{
    std::lock_guard<std::mutex> lock(mutex_);
    root_ = WithoutTrailingSlashes(std::move(nativeFolder));
}

std::string PathMapper::DataRoot() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return root_;
}

std::string PathMapper::ToNative(const std::string& enginePath) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (!enginePath.empty() && enginePath.front() == '/')
        return WithoutTrailingSlashes(enginePath);
    std::string relative = enginePath;
    while (relative.compare(0, 2, "./") == 0)
        relative.erase(0, 2);
    if (relative.empty() || relative == ".")
        return root_;
    return WithoutTrailingSlashes(root_.empty() ? relative : root_ + "/" + relative);
}

std::string PathMapper::ToEngine(const std::string& nativePath) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (root_.empty())
        return nativePath;
    if (nativePath == root_)
        return "";
    std::string prefix = root_ + "/";
    if (nativePath.compare(0, prefix.size(), prefix) == 0)
        return nativePath.substr(prefix.size());
    return nativePath;
}

}  // namespace simengine
