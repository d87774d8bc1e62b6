#include "data/DataWarnings.h"

#include <algorithm>
#include <cstring>
#include <ostream>

namespace datatool {

namespace {

// One line per data file that has a check.
const WarningCheck kWarningChecks[] = {
    {"leaderboards/leaderboards.xml", WarnLeaderboards},
    {"in-app-purchases/in-app-purchases.xml", WarnInAppPurchases},
};

bool EndsAsFile(std::string path, const std::string& ending)
{
    std::replace(path.begin(), path.end(), '\\', '/');
    if (path.size() < ending.size() || path.compare(path.size() - ending.size(), ending.size(), ending) != 0)
        return false;
    return path.size() == ending.size() || path[path.size() - ending.size() - 1] == '/';
}

}  // namespace

int PrintDataWarnings(const std::string& path, const std::string& bytes, const LoadOutcome& outcome,
                      std::ostream& out)
{
    int printed = 0;
    for (const WarningCheck& check : kWarningChecks) {
        if (!EndsAsFile(path, check.pathEnding))
            continue;
        for (const DataWarning& warning : check.warn(path, bytes, outcome)) {
            out << "warning: " << path;
            if (warning.line > 0)
                out << ":" << warning.line;
            out << ": " << warning.text << "\n";
            ++printed;
        }
    }
    return printed;
}

bool WalkXmlBlocks(const std::string& path, const std::string& bytes,
                   const std::function<void(const XmlBlock& block, int line)>& visit)
{
    XmlReader reader;
    if (!reader.OpenFromMemory(path.c_str(), bytes.data(), static_cast<int64_t>(bytes.size())))
        return false;
    // The plain text, envelope undone, copied before reading: reading writes into it.
    const std::string text(reader.data, static_cast<std::size_t>(std::max<int64_t>(reader.size, 0)));
    std::size_t counted = 0;  // newlines are counted up to here
    int line = 1;
    std::size_t previous = static_cast<std::size_t>(reader.cursor);
    while (const XmlBlock* block = reader.ReadBlock()) {
        const std::size_t end = std::min(static_cast<std::size_t>(std::max(reader.cursor, 0)), text.size());
        std::size_t start = end;
        if (block->name != nullptr && end > previous) {
            const std::size_t open = text.rfind('<', end - 1);
            start = open != std::string::npos && open >= previous ? open : previous;
        }
        if (start > counted) {
            line += static_cast<int>(std::count(text.begin() + static_cast<std::ptrdiff_t>(counted),
                                                text.begin() + static_cast<std::ptrdiff_t>(start), '\n'));
            counted = start;
        }
        visit(*block, line);
        previous = end;
    }
    return true;
}

const char* AttributeValue(const XmlBlock& block, const char* name, bool last)
{
    const char* found = nullptr;
    for (int32_t i = 0; i < block.count && i < XmlBlock::kMaxAttributes; ++i) {
        if (block.attributeNames[i] == nullptr || std::strcmp(block.attributeNames[i], name) != 0)
            continue;
        found = block.attributeValues[i];
        if (!last)
            break;
    }
    return block.name != nullptr ? found : nullptr;
}

}  // namespace datatool
