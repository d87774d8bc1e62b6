#include "simengine/CommandHost.h"

#include "simengine/Journal.h"
#include "simengine/PathMapper.h"
#include "simengine/ThreadRegistry.h"

namespace simengine {

const char* CommandHost::Handle(const char* command, const char* argument)
{
    std::string name = command != nullptr ? command : "";
    std::optional<std::string> answer;
    const char* result = nullptr;
    {
        std::lock_guard<std::mutex> lock(mutex_);
        if (name == "SetUGCBasePath")
            ugcBasePath_ = argument != nullptr ? argument : "";
        auto script = scripted_.find(name);
        if (script != scripted_.end() && !script->second.empty()) {
            answer = std::move(script->second.front());
            script->second.pop_front();
        } else {
            answer = DefaultAnswer(name, argument);
        }
        if (answer) {
            answered_.push_back(std::make_unique<std::string>(*answer));
            result = answered_.back()->c_str();
        }
    }

    std::optional<std::string> argumentCopy;
    if (argument != nullptr)
        argumentCopy = argument;
    journal_.Record(
        CommandCall{name, std::move(argumentCopy), std::move(answer), ThreadRegistry::CurrentName()});
    return result;
}

std::optional<std::string> CommandHost::DefaultAnswer(const std::string& command, const char* argument)
{
    if (argument == nullptr)
        return std::nullopt;
    if (command == "GetNativeOSPath")
        return paths_.ToNative(argument);
    if (command == "ConvertNativeOSPathToStaticPath")
        return paths_.ToEngine(argument);
    return std::nullopt;
}

void CommandHost::QueueAnswer(const std::string& command, std::optional<std::string> answer)
{
    std::lock_guard<std::mutex> lock(mutex_);
    scripted_[command].push_back(std::move(answer));
}

int CommandHost::QueuedAnswers(const std::string& command) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto script = scripted_.find(command);
    return script != scripted_.end() ? static_cast<int>(script->second.size()) : 0;
}

std::string CommandHost::UgcBasePath() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return ugcBasePath_;
}

void CommandHost::Reset()
{
    std::lock_guard<std::mutex> lock(mutex_);
    scripted_.clear();
    answered_.clear();
    ugcBasePath_.clear();
}

}  // namespace simengine
