// The simulated engine for one run. One engine exists per process; a run
// resets it, configures it, and hands the module a copy of its table whose
// StartThread also remembers each thread's id under its name, so that the
// platform calls of the module's threads can be shown with that name.
#include "run/EngineSession.h"

#include <chrono>
#include <cstring>
#include <map>
#include <mutex>
#include <set>

#include <simengine/Engine.h>
#include <simengine/ModuleLoader.h>

#include "host/HostServices.h"

namespace steamext::run {

using nlohmann::json;

namespace {

// ---- Thread names, kept by the StartThread wrapper.

std::mutex threadNamesMutex;
std::map<simclient::ThreadSerial, std::string> threadNames;
std::set<std::string> startedNames;  // every name the module has started a thread with
HostThreadApi* engineThreads = nullptr;

std::set<std::string> StartedNames()
{
    std::lock_guard<std::mutex> lock(threadNamesMutex);
    return startedNames;
}

struct Launch {
    HostThreadEntry entry;
    void* argument;
    std::string name;
};

void NamedEntry(void* launchArgument)
{
    std::unique_ptr<Launch> launch(static_cast<Launch*>(launchArgument));
    {
        std::lock_guard<std::mutex> lock(threadNamesMutex);
        threadNames[simclient::ThisThreadSerial()] = launch->name;
    }
    launch->entry(launch->argument);
}

void StartNamedThread(const char* name, HostThreadEntry entry, void* argument, int32_t flags)
{
    {
        std::lock_guard<std::mutex> lock(threadNamesMutex);
        startedNames.insert(name != nullptr ? name : "");
    }
    if (entry == nullptr) {  // the engine journals this misuse itself
        engineThreads->StartThread(name, entry, argument, flags);
        return;
    }
    engineThreads->StartThread(name, &NamedEntry, new Launch{entry, argument, name != nullptr ? name : ""},
                               flags);
}

// ---- The engine's journal as records.

json Text(const std::optional<std::string>& text)
{
    return text ? json(*text) : json(nullptr);
}

// A row's 47 detail values, without the zeros at the end: what was given shows as given.
json Details(const simengine::ScoreRow& row)
{
    std::vector<int32_t> values(row.details.size() / 4);
    std::memcpy(values.data(), row.details.data(), values.size() * 4);
    while (!values.empty() && values.back() == 0)
        values.pop_back();
    return values;
}

json ToRecord(const simengine::PostedEvent& event)
{
    json record = {{"kind", "event"}, {"type", event.type}, {"status", event.status}};
    if (event.startup) {
        record["PlayerId"] = Text(event.startup->playerId);
        record["ErrorText"] = Text(event.startup->errorText);
    }
    if (event.scores) {
        const auto& s = *event.scores;
        record["category"] = Text(s.category);
        record["total"] = s.total;
        record["filter"] = s.filter;
        record["start"] = s.start;
        record["count"] = s.count;
        json rows = json::array();
        for (const auto& row : s.rows) {
            json shown = {
                {"userId", row.userId}, {"userName", row.userName},       {"score", row.score},
                {"rank", row.rank},     {"detailsSize", row.detailsSize}, {"details", Details(row)}};
            if (row.reserved != 0)
                shown["reserved"] = row.reserved;
            rows.push_back(std::move(shown));
        }
        record["entries"] = event.scores->entriesNull ? json(nullptr) : rows;
    }
    if (event.store) {
        // Only the fields each type sets: 32 the id, 33 also the state, 34 all three.
        record["itemId"] = Text(event.store->itemId);
        if (event.type != kEventStoreStarted)
            record["itemState"] = event.store->itemState;
        if (event.type == kEventStorePurchaseOutcome)
            record["purchaseId"] = Text(event.store->purchaseId);
    }
    if (event.thread != "main")
        record["thread"] = event.thread;
    return record;
}

json ToRecord(const simengine::LogLine& line)
{
    const char* source = line.kind == simengine::LogKind::Report ? "ReportError"
                         : line.kind == simengine::LogKind::Info ? "LogInfo"
                                                                 : "Log";
    json record = {{"kind", "log"}, {"level", line.level}, {"source", source}, {"text", line.text}};
    if (line.thread != "main")
        record["thread"] = line.thread;
    return record;
}

json ToRecord(const simengine::CommandCall& call)
{
    return {{"kind", "host_command"},
            {"command", call.command},
            {"argument", Text(call.argument)},
            {"answer", Text(call.answer)}};
}

json ToRecord(const simengine::InputCall& call)
{
    bool button = call.kind == simengine::InputCall::Kind::Button;
    return {{"kind", "input"},
            {"call", button ? "SetInputButton" : "SetInputAxis"},
            {"id", call.inputId},
            {"value", button ? static_cast<double>(call.buttonValue) : static_cast<double>(call.axisValue)}};
}

json ToRecord(const simengine::FileOpenCall& call)
{
    return {{"kind", "file_open"}, {"path", call.path}, {"mode", call.mode}, {"opened", call.opened}};
}

json ToRecord(const simengine::ThreadStartCall& call)
{
    return {{"kind", "thread_start"}, {"name", call.name}, {"flags", call.flags}};
}

json ToRecord(const simengine::EngineFault& fault)
{
    return {{"kind", "engine_fault"}, {"text", fault.text}, {"thread", fault.thread}};
}

}  // namespace

struct EngineSession::State {
    simengine::Engine& engine = simengine::Engine::Instance();
    simengine::ModuleLoader loader;
    HostServices table{};
    HostThreadApi threads{};
    bool manualClock = true;
    double timeScale = 1.0;
    uint64_t mark = 0;
};

EngineSession::EngineSession(const EngineSetup& setup) : state_(std::make_unique<State>())
{
    simengine::Engine& engine = state_->engine;
    engine.Reset();
    for (const auto& value : setup.productValues)
        engine.SetProductValue(value.first, value.second);
    for (const auto& feature : setup.features)
        engine.SetFeatureEnabled(feature, true);
    if (setup.dataRoot)
        engine.Paths().SetDataRoot(setup.dataRoot->string());
    for (const auto& file : setup.dataFiles)
        engine.Files().AddMemoryFile(file.first, file.second);
    for (const auto& answer : setup.popupAnswers)
        engine.Commands().QueuePopupAnswer(answer);
    for (const auto& answer : setup.commandAnswers)
        engine.Commands().QueueAnswer(answer.first, answer.second);
    state_->manualClock = setup.manualClock;
    state_->timeScale = setup.timeScale;
    if (setup.manualClock)
        engine.Time().UseManual(0);
    else
        engine.Time().UseScaled(setup.timeScale);

    state_->table = *engine.Table();
    engineThreads = engine.Table()->threads;
    state_->threads = *engineThreads;
    state_->threads.StartThread = &StartNamedThread;
    state_->table.threads = &state_->threads;
    state_->mark = engine.Records().Mark();
}

EngineSession::~EngineSession()
{
    if (state_->loader.IsLoaded())
        UnloadModule();
}

HostServices* EngineSession::Table()
{
    return &state_->table;
}

ExtensionModule* EngineSession::LoadModule(const std::string& path)
{
    if (!state_->loader.Load(path))
        throw ModuleLoadError("cannot load the module " + path + ": " + state_->loader.Error());
    return state_->loader.Module();
}

void EngineSession::UnloadModule()
{
    state_->loader.Unload();
}

uint32_t EngineSession::NowMs() const
{
    return state_->engine.Time().NowMs();
}

void EngineSession::Advance(uint32_t ms)
{
    if (state_->manualClock) {
        // What a woken thread does belongs to the step that moved the clock.
        Settle();
        state_->engine.Time().Advance(ms);
        Settle();
    } else
        std::this_thread::sleep_for(std::chrono::duration<double, std::milli>(ms / state_->timeScale));
}

void EngineSession::SettleThreads()
{
    if (state_->manualClock)
        Settle();
}

void EngineSession::FailAllocations(int count)
{
    state_->engine.Memory().FailNextAllocations(count);
}

void EngineSession::Settle()
{
    // With the manual clock, time must not move while a thread of the module
    // is between two reads of it: it would see the clock before or after the
    // move depending on the scheduler. The engine waits until every thread is
    // asleep, ended, or polls for something only this thread can change.
    lastSettle_ = state_->engine.Settle();
}

void EngineSession::NotePlatformCall(const char* name, const std::string& args)
{
    simengine::Engine::Instance().Threads().NoteCall(name, args);
}

std::vector<json> EngineSession::TakeRecords()
{
    simengine::Journal& journal = state_->engine.Records();
    uint64_t next = journal.Mark();
    simengine::JournalView view = journal.Since(state_->mark);
    std::vector<json> records;
    for (const auto& entry : view.Entries()) {
        if (entry.sequence >= next)
            break;  // taken next time, so that nothing is seen twice
        records.push_back(std::visit([](const auto& record) { return ToRecord(record); }, entry.record));
    }
    state_->mark = next;
    return records;
}

int EngineSession::RunningThreads(const std::string& name) const
{
    if (StartedNames().count(name) == 0)
        return -1;
    return state_->engine.Threads().RunningCount(name);
}

std::string EngineSession::ThreadName(simclient::ThreadSerial id) const
{
    std::lock_guard<std::mutex> lock(threadNamesMutex);
    auto found = threadNames.find(id);
    return found == threadNames.end() ? std::string() : found->second;
}

std::vector<std::string> EngineSession::Quit()
{
    simengine::Engine& engine = state_->engine;
    engine.SetQuitting(true);
    // The module's threads poll IsQuitting between sleeps; give them a bound.
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (engine.Threads().RunningCount() > 0 && std::chrono::steady_clock::now() < deadline)
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    std::vector<std::string> stuck;
    for (const auto& name : StartedNames()) {
        if (engine.Threads().RunningCount(name) > 0)
            stuck.push_back(name);
    }
    if (stuck.empty() && engine.Threads().RunningCount() > 0)
        stuck.push_back("(a thread whose start was not seen)");
    if (stuck.empty())
        engine.QuitAndJoin();
    return stuck;
}

}  // namespace steamext::run
