#include <cerrno>
#include <cstring>
#include <exception>
#include <fstream>
#include <iterator>

#include "data/DataTool.h"
#include "host/HostServices.h"
#include "simengine/Engine.h"

namespace datatool {

LoadOutcome LoadThroughEngine(const std::string& path,
                              const std::vector<std::optional<std::string>>& popupAnswers)
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    engine.Paths().SetDataRoot("");
    for (const std::optional<std::string>& answer : popupAnswers)
        engine.Commands().QueuePopupAnswer(answer);
    hostServices = engine.Table();

    LoadOutcome outcome;
    const uint64_t mark = engine.Records().Mark();
    outcome.database = std::make_unique<Database>();
    outcome.loaded = outcome.database->Load(path.c_str());
    outcome.journal = engine.Records().Since(mark);
    return outcome;
}

std::string BytesAsText(const std::string& bytes)
{
    std::string text;
    text.reserve(bytes.size());
    for (const char c : bytes) {
        const unsigned char byte = static_cast<unsigned char>(c);
        if (byte < 0x80) {
            text.push_back(c);
        } else {
            text.push_back(static_cast<char>(0xC0 | (byte >> 6)));
            text.push_back(static_cast<char>(0x80 | (byte & 0x3F)));
        }
    }
    return text;
}

std::string CutAtZero(const std::string& text)
{
    return text.substr(0, text.find('\0'));
}

bool ReadFile(const std::string& path, std::string& bytes, std::string& error)
{
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        error = "cannot open '" + path + "': " + std::strerror(errno);
        return false;
    }
    // A folder opens but fails on the first read, which the stream reports by
    // throwing: that is one more unreadable file, not a crash.
    errno = 0;
    try {
        bytes.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
    } catch (const std::exception&) {
        in.setstate(std::ios::badbit);
    }
    if (in.bad()) {
        error = "cannot read '" + path + "'" +
                (errno != 0 ? std::string(": ") + std::strerror(errno) : std::string());
        bytes.clear();
        return false;
    }
    return true;
}

bool WriteFile(const std::string& path, const std::string& bytes, std::string& error)
{
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    if (out)
        out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    if (!out) {
        error = "cannot write '" + path + "': " + std::strerror(errno);
        return false;
    }
    return true;
}

}  // namespace datatool
