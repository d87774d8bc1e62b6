#include "simengine/Engine.h"

#include <cstdio>
#include <cstring>
#include <thread>
#include <vector>

#include "EventDecoding.h"

namespace simengine {

Engine& Engine::Instance()
{
    // Never destroyed: module threads or exit handlers may still call the
    // table while the process ends.
    static Engine* engine = new Engine();
    return *engine;
}

Engine::Engine() = default;

void Engine::Reset()
{
    QuitAndJoin();
    journal_.Clear();
    memory_.FreeAll();
    files_.Reset();
    commands_.Reset();
    mutexes_.ResetCounts();
    threads_.ForgetCounts();
    paths_.SetDataRoot("");
    {
        std::lock_guard<std::mutex> lock(configMutex_);
        productValues_.clear();
        features_.clear();
    }
    SetQuitting(false);
    clock_.UseManual(0);
}

void Engine::QuitAndJoin()
{
    SetQuitting(true);
    threads_.JoinAll();
}

Engine::SettleReport Engine::Settle(std::chrono::milliseconds guard)
{
    threads_.NewEngineTurn();
    SettleReport report;
    const auto deadline = std::chrono::steady_clock::now() + guard;
    for (;;) {
        ++report.probes;
        const uint64_t progress = threads_.ProgressCount();
        bool settled = true;
        std::vector<std::string> polling;
        for (const auto& name : threads_.RunningNames()) {
            int polls = threads_.PollingCount(name);
            if (polls > 0)
                polling.push_back(name);
            settled = settled && clock_.SleepingCount(name) + polls >= threads_.RunningCount(name);
        }
        if (settled && threads_.ProgressCount() == progress) {
            report.settled = true;
            report.polling = std::move(polling);
            return report;
        }
        if (std::chrono::steady_clock::now() >= deadline)
            return report;
        // Not for correctness: only to leave the module's threads the cores.
        std::this_thread::sleep_for(std::chrono::microseconds(100));
    }
}

void Engine::SetQuitting(bool quitting)
{
    {
        std::lock_guard<std::mutex> lock(configMutex_);
        quitting_ = quitting;
    }
    clock_.SetQuitting(quitting);
}

bool Engine::IsQuitting() const
{
    std::lock_guard<std::mutex> lock(configMutex_);
    return quitting_;
}

void Engine::SetProductValue(const std::string& key, std::optional<std::string> value)
{
    std::lock_guard<std::mutex> lock(configMutex_);
    if (value)
        productValues_[key] = std::move(*value);
    else
        productValues_.erase(key);
}

void Engine::SetFeatureEnabled(const std::string& feature, bool enabled)
{
    std::lock_guard<std::mutex> lock(configMutex_);
    if (enabled)
        features_.insert(feature);
    else
        features_.erase(feature);
}

const char* Engine::GetProductValue(const char* key)
{
    if (key == nullptr)
        return nullptr;
    std::lock_guard<std::mutex> lock(configMutex_);
    // The text lives in the map until the value is changed or the engine is reset.
    auto found = productValues_.find(key);
    return found != productValues_.end() ? found->second.c_str() : nullptr;
}

bool Engine::IsFeatureEnabled(const char* feature)
{
    if (feature == nullptr)
        return false;
    std::lock_guard<std::mutex> lock(configMutex_);
    return features_.count(feature) != 0;
}

void Engine::InitEvent(HostEvent* event, int32_t type)
{
    if (event == nullptr) {
        journal_.Fault("InitEvent with a null event");
        return;
    }
    std::memset(event, 0, sizeof(HostEvent));
    event->type = type;
}

void Engine::PostEvent(HostEvent* event)
{
    if (event == nullptr) {
        journal_.Fault("PostEvent with a null event");
        return;
    }
    journal_.Record(DecodeEvent(*event, memory_, journal_));
}

void Engine::SetInputButton(int32_t inputId, int32_t value)
{
    journal_.Record(InputCall{InputCall::Kind::Button, inputId, value, 0.0f});
}

void Engine::SetInputAxis(int32_t inputId, float value)
{
    journal_.Record(InputCall{InputCall::Kind::Axis, inputId, 0, value});
}

void Engine::WriteLog(LogKind kind, int32_t level, const char* format, va_list values)
{
    std::string text = format != nullptr ? FormatText(format, values) : std::string();
    journal_.Record(LogLine{kind, level, std::move(text), ThreadRegistry::CurrentName()});
}

std::string FormatText(const char* format, va_list values)
{
    char small[256];
    va_list copy;
    va_copy(copy, values);
    int length = std::vsnprintf(small, sizeof(small), format, copy);
    va_end(copy);
    if (length < 0)
        return std::string();
    if (static_cast<size_t>(length) < sizeof(small))
        return std::string(small, static_cast<size_t>(length));

    std::vector<char> large(static_cast<size_t>(length) + 1);
    std::vsnprintf(large.data(), large.size(), format, values);
    return std::string(large.data(), static_cast<size_t>(length));
}

}  // namespace simengine
