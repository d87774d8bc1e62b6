// HostCommand: the engine's string commands, each call journaled.
//
// Answers come from a script when one is queued for the command, else from the
// engine's own behaviour: "ShowPopup" gives null (no choice made),
// "GetNativeOSPath" and "ConvertNativeOSPathToStaticPath" map paths through the
// data root, "OpenURL", "SetUGCBasePath" and unknown commands give null.
// Answered texts are kept until Reset, so the module may read them at leisure.
#pragma once

#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace simengine {

class Journal;
class PathMapper;

class CommandHost {
public:
    CommandHost(Journal& journal, PathMapper& paths) : journal_(journal), paths_(paths) {}

    const char* Handle(const char* command, const char* argument);

    // Queues the answer of the next call of `command`; std::nullopt answers null.
    void QueueAnswer(const std::string& command, std::optional<std::string> answer);
    void QueuePopupAnswer(std::optional<std::string> answer) { QueueAnswer("ShowPopup", std::move(answer)); }
    int QueuedAnswers(const std::string& command) const;

    // The last folder given by "SetUGCBasePath", empty if none.
    std::string UgcBasePath() const;

    void Reset();

private:
    std::optional<std::string> DefaultAnswer(const std::string& command, const char* argument);

    Journal& journal_;
    PathMapper& paths_;
    mutable std::mutex mutex_;
    std::map<std::string, std::deque<std::optional<std::string>>> scripted_;
    std::deque<std::unique_ptr<std::string>> answered_;  // stable addresses for returned texts
    std::string ugcBasePath_;
};

}  // namespace simengine
