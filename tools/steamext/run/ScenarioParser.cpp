// Reads a scenario file into the model of Scenario.h, checking every value.
#include "run/ScenarioParser.h"

#include <algorithm>
#include <map>

#include "run/ScenarioFile.h"
#include "run/WorldSetup.h"

namespace steamext::run {

using nlohmann::json;

namespace {

using R = ScenarioFile;

EngineSetup ParseEngine(const R& r, const json& engine, const std::string& at)
{
    r.Object(engine, at);
    r.OnlyKeys(engine, at,
               {"product_values", "features", "data_root", "data_files", "popup_answers", "command_answers",
                "clock", "time_scale", "frame_ms"});
    EngineSetup setup;
    if (engine.contains("product_values")) {
        const std::string p = R::Child(at, "product_values");
        for (const auto& item : r.Object(engine["product_values"], p).items())
            setup.productValues[item.key()] = r.String(item.value(), R::Child(p, item.key()));
    }
    if (engine.contains("features")) {
        const std::string p = R::Child(at, "features");
        const json& list = r.Array(engine["features"], p);
        for (std::size_t i = 0; i < list.size(); ++i)
            setup.features.insert(r.String(list[i], R::Child(p, i)));
    }
    if (engine.contains("data_root") && engine.contains("data_files"))
        r.Fail(R::Child(at, "data_files"),
               "give either \"data_root\" (a folder) or \"data_files\" (inline), not both");
    if (engine.contains("data_root")) {
        const std::string p = R::Child(at, "data_root");
        std::string root = r.String(engine["data_root"], p);
        if (root.empty())
            r.Fail(p, "the data root is empty; leave the key out for no data files");
        setup.dataRoot = std::filesystem::path(root);  // made absolute by ParseScenario
    }
    if (engine.contains("data_files")) {
        const std::string p = R::Child(at, "data_files");
        for (const auto& item : r.Object(engine["data_files"], p).items()) {
            const std::string& path = item.key();
            if (path.empty() || path[0] == '/' || path.find("..") != std::string::npos)
                r.Fail(R::Child(p, path),
                       "a data file's path must be relative and stay inside the data root");
            setup.dataFiles[path] = r.Bytes(item.value(), R::Child(p, path));
        }
    }
    if (engine.contains("popup_answers")) {
        const std::string p = R::Child(at, "popup_answers");
        const json& list = r.Array(engine["popup_answers"], p);
        for (std::size_t i = 0; i < list.size(); ++i)
            setup.popupAnswers.push_back(r.StringOrNull(list[i], R::Child(p, i)));
    }
    if (engine.contains("command_answers")) {
        const std::string p = R::Child(at, "command_answers");
        for (const auto& item : r.Object(engine["command_answers"], p).items())
            setup.commandAnswers[item.key()] = r.StringOrNull(item.value(), R::Child(p, item.key()));
    }
    if (engine.contains("clock")) {
        const std::string p = R::Child(at, "clock");
        std::string clock = r.String(engine["clock"], p);
        if (clock != "manual" && clock != "scaled")
            r.Fail(p,
                   "the clock is \"manual\" (moved by frames and steps) or \"scaled\" (real time, sped up)");
        setup.manualClock = clock == "manual";
    }
    if (engine.contains("time_scale")) {
        const std::string p = R::Child(at, "time_scale");
        setup.timeScale = r.Number(engine["time_scale"], p);
        if (setup.timeScale <= 0 || setup.timeScale > 100000)
            r.Fail(p, "the time scale must be above 0 and at most 100000");
        if (setup.manualClock && engine.contains("clock"))
            r.Fail(p, "a time scale only applies to the \"scaled\" clock");
        if (!engine.contains("clock"))
            setup.manualClock = false;  // a scale alone asks for the scaled clock
    }
    if (engine.contains("frame_ms"))
        setup.frameMs = static_cast<uint32_t>(r.Int(engine["frame_ms"], R::Child(at, "frame_ms"), 0, 60000));
    return setup;
}

// Call arguments: a list by position, or an object by name. Omitted arguments
// take their default; an Int with sizeOfArg takes that argument's byte count.
std::vector<ArgValue> ParseArgs(const R& r, const Operation& op, const json* given, const std::string& at)
{
    std::vector<const json*> values(op.args.size(), nullptr);
    std::vector<std::string> places(op.args.size(), at);
    if (given != nullptr && given->is_array()) {
        if (given->size() > op.args.size())
            r.Fail(R::Child(at, op.args.size()), "\"" + op.name + "\" takes " +
                                                     std::to_string(op.args.size()) +
                                                     " argument(s), this is one too many");
        for (std::size_t i = 0; i < given->size(); ++i) {
            values[i] = &(*given)[i];
            places[i] = R::Child(at, i);
        }
    } else if (given != nullptr && given->is_object()) {
        for (const auto& item : given->items()) {
            std::size_t i = 0;
            while (i < op.args.size() && op.args[i].name != item.key())
                ++i;
            if (i == op.args.size()) {
                std::string list;
                for (const auto& spec : op.args)
                    list += (list.empty() ? "" : ", ") + spec.name;
                r.Fail(R::Child(at, item.key()), "\"" + op.name + "\" has no argument \"" + item.key() +
                                                     "\"; its arguments: " + (list.empty() ? "none" : list));
            }
            values[i] = &item.value();
            places[i] = R::Child(at, item.key());
        }
    } else if (given != nullptr) {
        r.Fail(at, "arguments are a list [...] by position or an object {...} by name, not " +
                       R::Describe(*given));
    }

    std::vector<ArgValue> args(op.args.size());
    for (std::size_t i = 0; i < op.args.size(); ++i) {
        const ArgSpec& spec = op.args[i];
        const json* value = values[i] != nullptr ? values[i]
                            : spec.defaultValue  ? &*spec.defaultValue
                                                 : nullptr;
        if (value == nullptr && spec.sizeOfArg < 0)
            r.Fail(at, "\"" + op.name + "\" needs the argument \"" + spec.name + "\" (number " +
                           std::to_string(i + 1) + ")");
        const std::string& p = places[i];
        switch (spec.type) {
        case ArgType::Int:
            if (value == nullptr)
                args[i].number =
                    static_cast<int32_t>(args[static_cast<std::size_t>(spec.sizeOfArg)].bytes.size());
            else
                args[i].number = r.Int(*value, p);
            break;
        case ArgType::Bool:
            args[i].flag = r.Bool(*value, p);
            break;
        case ArgType::Text:
            args[i].text = r.StringOrNull(*value, p);
            break;
        case ArgType::Bytes:
            args[i].bytes = r.Bytes(*value, p);
            break;
        case ArgType::Record:
            args[i].record = EncodeRecord(*spec.layout, *value, r, p);
            break;
        }
    }
    return args;
}

json ParseExpectedRecord(const R& r, const RecordLayout& layout, const json& value, const std::string& at)
{
    // Null, or some of the record's fields.
    return value.is_null() ? json(nullptr) : json{{"record", CheckRecordPattern(layout, value, r, at)}};
}

json ParseExpectedResult(const R& r, const Operation& op, const json& value, const std::string& at)
{
    switch (op.result) {
    case ResultType::Record:
        return ParseExpectedRecord(r, *op.layout, value, at);
    case ResultType::None:
        r.Fail(at, "\"" + op.name + "\" returns nothing, so there is no result to expect");
    case ResultType::Bool:
        return r.Bool(value, at);
    case ResultType::Int:
        return r.Int(value, at);
    case ResultType::Text:
        return value.is_null() ? json(nullptr) : json(r.String(value, at));
    case ResultType::Buffer:
        // Null, or the buffer's content as text or {"base64": "..."}.
        return value.is_null() ? json(nullptr) : json{{"bytes", r.Bytes(value, at)}};
    case ResultType::Service:
        if (!value.is_null() && value != "object")
            r.Fail(at, "a service is expected as null or \"object\", not " + R::Describe(value));
        return value;
    }
    return value;
}

// A pattern: a shorthand (a string or an integer for `shortKey`) or an object of fields.
json ParsePattern(const R& r, const json& value, const std::string& at, const char* shortKey,
                  std::vector<std::string> keys, bool allowCount)
{
    if (value.is_string())
        return json{{shortKey, value}};
    r.Object(value, at);
    if (allowCount)
        keys.push_back("count");
    r.OnlyKeys(value, at, keys);
    if (value.contains("count"))
        r.Int(value["count"], R::Child(at, "count"), 0);
    if (value.empty() || (value.size() == 1 && value.contains("count")))
        r.Fail(at, "an empty pattern matches anything; name at least one field");
    for (const auto& item : value.items()) {
        const std::string& key = item.key();
        if (key.size() > 9 && key.compare(key.size() - 9, 9, "_contains") == 0)
            r.String(item.value(), R::Child(at, key));
        if (key == "level")
            r.Int(item.value(), R::Child(at, key), 0, 2);
    }
    return value;
}

std::vector<json> ParsePatterns(const R& r, const json& list, const std::string& at, const char* shortKey,
                                const std::vector<std::string>& keys, bool allowCount)
{
    r.Array(list, at);
    std::vector<json> patterns;
    for (std::size_t i = 0; i < list.size(); ++i)
        patterns.push_back(ParsePattern(r, list[i], R::Child(at, i), shortKey, keys, allowCount));
    return patterns;
}

// The fields a pattern may name, per kind of record (see Records.h).
const std::vector<std::string> kLogKeys = {"level", "text", "text_contains", "source"};
const std::vector<std::string> kCallKeys = {"name", "args", "args_contains", "thread"};
const std::vector<std::string> kHostKeys = {"command", "argument", "argument_contains", "answer"};

void ParseExpectations(const R& r, const json& step, const std::string& at, const Step& s, Expectations& e)
{
    if (step.contains("expect")) {
        if (s.kind == StepKind::Read)
            e.result = ParseExpectedRecord(r, *s.readLayout, step["expect"], R::Child(at, "expect"));
        else if (s.operation == nullptr)
            r.Fail(R::Child(at, "expect"),
                   "\"expect\" checks a call's result and needs \"call\" or \"read\" in the same step");
        else
            e.result = ParseExpectedResult(r, *s.operation, step["expect"], R::Child(at, "expect"));
    }
    if (step.contains("events")) {
        const std::string p = R::Child(at, "events");
        e.events = std::vector<json>();
        const json& list = r.Array(step["events"], p);
        for (std::size_t i = 0; i < list.size(); ++i) {
            const std::string q = R::Child(p, i);
            if (list[i].is_number_integer()) {
                e.events->push_back(json{{"type", r.Int(list[i], q)}});
            } else {
                const json& pattern = r.Object(list[i], q);
                if (!pattern.contains("type"))
                    r.Fail(q, "an expected event needs its \"type\"");
                r.Int(pattern["type"], R::Child(q, "type"));
                e.events->push_back(pattern);
            }
        }
    }
    if (step.contains("logs"))
        e.logs = ParsePatterns(r, step["logs"], R::Child(at, "logs"), "text", kLogKeys, true);
    if (step.contains("no_logs"))
        e.noLogs = ParsePatterns(r, step["no_logs"], R::Child(at, "no_logs"), "text", kLogKeys, false);
    if (step.contains("platform_calls"))
        e.platformCalls =
            ParsePatterns(r, step["platform_calls"], R::Child(at, "platform_calls"), "name", kCallKeys, true);
    if (step.contains("no_platform_calls"))
        e.noPlatformCalls = ParsePatterns(r, step["no_platform_calls"], R::Child(at, "no_platform_calls"),
                                          "name", kCallKeys, false);
    if (step.contains("host_commands"))
        e.hostCommands = ParsePatterns(r, step["host_commands"], R::Child(at, "host_commands"), "command",
                                       kHostKeys, true);
    if (step.contains("inputs")) {
        const std::string p = R::Child(at, "inputs");
        const json& inputs = step["inputs"];
        if (inputs == "none") {
            e.inputButtons = "";
            e.inputAxes = "";
        } else {
            r.Object(inputs, p);
            r.OnlyKeys(inputs, p, {"buttons", "axes"});
            if (inputs.contains("buttons"))
                e.inputButtons = r.String(inputs["buttons"], R::Child(p, "buttons"));
            if (inputs.contains("axes"))
                e.inputAxes = r.String(inputs["axes"], R::Child(p, "axes"));
        }
    }
}

WaitCondition ParseWait(const R& r, const json& value, const std::string& at)
{
    r.Object(value, at);
    r.OnlyKeys(value, at, {"event", "log", "platform_call", "threads_ended"});
    if (value.size() != 1)
        r.Fail(at, "wait for exactly one thing: \"event\", \"log\", \"platform_call\" or \"threads_ended\"");
    WaitCondition wait;
    wait.kind = value.begin().key();
    const std::string p = R::Child(at, wait.kind);
    const json& what = value.begin().value();
    if (wait.kind == "event") {
        wait.pattern = what.is_number_integer() ? json{{"type", r.Int(what, p)}} : r.Object(what, p);
        wait.description = "event " + wait.pattern.dump();
    } else if (wait.kind == "threads_ended") {
        // Every thread of this name that the module started has ended (and it started one).
        wait.pattern = json{{"name", r.String(what, p)}};
        wait.description = "the end of the threads \"" + wait.pattern["name"].get<std::string>() + "\"";
    } else if (wait.kind == "log") {
        wait.pattern = ParsePattern(r, what, p, "text", kLogKeys, false);
        wait.description = "log line " + wait.pattern.dump();
    } else {
        wait.kind = "platform_call";
        wait.pattern = ParsePattern(r, what, p, "name", kCallKeys, false);
        wait.description = "platform call " + wait.pattern.dump();
    }
    return wait;
}

// Records kept by earlier steps' calls ("keep_as"), by name.
using RecordNames = std::map<std::string, const RecordLayout*>;

Step ParseStep(const R& r, const json& value, const std::string& at, std::size_t index, RecordNames& kept)
{
    const json& step = r.Object(value, at);
    r.OnlyKeys(step, at,
               {"note", "call", "args", "frames", "advance_ms", "wait_for", "timeout_ms", "world", "keep_as",
                "read", "fail_allocations", "expect", "events", "logs", "no_logs", "platform_calls",
                "no_platform_calls", "host_commands", "inputs"});
    Step s;
    s.index = index;
    s.place = r.Place(at);
    if (step.contains("note"))
        s.note = r.String(step["note"], R::Child(at, "note"));

    int actions = 0;
    for (const char* key : {"call", "frames", "advance_ms", "wait_for", "world", "read", "fail_allocations"})
        actions += step.contains(key) ? 1 : 0;
    if (actions > 1)
        r.Fail(at, "a step does one thing: one of \"call\", \"frames\", \"advance_ms\", \"wait_for\", "
                   "\"world\", \"read\", \"fail_allocations\"");
    if (step.contains("keep_as") && !step.contains("call"))
        r.Fail(R::Child(at, "keep_as"), "\"keep_as\" belongs to a \"call\"");
    if (step.contains("args") && !step.contains("call"))
        r.Fail(R::Child(at, "args"), "\"args\" belongs to a \"call\"");
    if (step.contains("timeout_ms") && !step.contains("wait_for"))
        r.Fail(R::Child(at, "timeout_ms"), "\"timeout_ms\" belongs to a \"wait_for\"");

    if (step.contains("call")) {
        s.kind = StepKind::Call;
        const std::string p = R::Child(at, "call");
        std::string name = r.String(step["call"], p);
        s.operation = Operations().Find(name);
        if (s.operation == nullptr) {
            std::vector<std::string> similar = Operations().Similar(name);
            std::string hint;
            for (const auto& candidate : similar)
                hint += (hint.empty() ? "; did you mean " : " or ") + ("\"" + candidate + "\"");
            if (hint.empty())
                hint =
                    "; see docs/scenarios.md for the operations (service ones are \"<service>.<Operation>\")";
            r.Fail(p, "unknown operation \"" + name + "\"" + hint);
        }
        const json* args = step.contains("args") ? &step["args"] : nullptr;
        s.args = ParseArgs(r, *s.operation, args, R::Child(at, "args"));
        s.argsShown = args != nullptr ? *args : json::array();
        if (step.contains("keep_as")) {
            const std::string p = R::Child(at, "keep_as");
            s.keepAs = r.String(step["keep_as"], p);
            if (s.operation->result != ResultType::Record)
                r.Fail(p, "\"" + name + "\" gives no record to keep");
            if (s.keepAs.empty())
                r.Fail(p, "the name to keep the record as is empty");
            kept[s.keepAs] = s.operation->layout;
        }
    } else if (step.contains("frames")) {
        s.kind = StepKind::Frames;
        s.frames = static_cast<uint32_t>(r.Int(step["frames"], R::Child(at, "frames"), 1, 1000000));
    } else if (step.contains("advance_ms")) {
        s.kind = StepKind::Advance;
        s.advanceMs = static_cast<uint32_t>(r.Int(step["advance_ms"], R::Child(at, "advance_ms"), 0));
    } else if (step.contains("wait_for")) {
        s.kind = StepKind::Wait;
        s.wait = ParseWait(r, step["wait_for"], R::Child(at, "wait_for"));
        s.timeoutMs = step.contains("timeout_ms")
                          ? static_cast<uint32_t>(r.Int(step["timeout_ms"], R::Child(at, "timeout_ms"), 1))
                          : 10000;
    } else if (step.contains("world")) {
        s.kind = StepKind::World;
        s.world = ParseWorld(r, step["world"], R::Child(at, "world"));
    } else if (step.contains("fail_allocations")) {
        s.kind = StepKind::FailAllocations;
        s.failAllocations = r.Int(step["fail_allocations"], R::Child(at, "fail_allocations"), 1, 1000000);
    } else if (step.contains("read")) {
        s.kind = StepKind::Read;
        const std::string p = R::Child(at, "read");
        s.readName = r.String(step["read"], p);
        auto found = kept.find(s.readName);
        if (found == kept.end())
            r.Fail(p, "no earlier step keeps a record as \"" + s.readName + "\" (\"keep_as\" on its call)");
        s.readLayout = found->second;
    }
    ParseExpectations(r, step, at, s, s.expect);
    if (s.kind == StepKind::Note && s.note.empty() && step.size() == 0)
        r.Fail(at, "an empty step; give it \"call\", \"frames\", \"advance_ms\", \"wait_for\", \"world\" or "
                   "\"note\"");
    return s;
}

}  // namespace

Scenario ParseScenario(const std::string& text, const std::string& displayName,
                       const std::filesystem::path& baseDir)
{
    json document;
    try {
        document = json::parse(text);
    } catch (const json::parse_error& error) {
        // The library's message carries its own position; ours names line and column.
        TextPosition at = PositionOf(text, error.byte > 0 ? error.byte - 1 : 0);
        std::string what = error.what();
        std::size_t detail = what.find(": syntax error");
        if (detail != std::string::npos)
            what = what.substr(detail + 2);
        throw ScenarioError(displayName + ":" + std::to_string(at.line) + ":" + std::to_string(at.column) +
                            ": not valid JSON: " + what);
    }
    R r(text, displayName);
    r.Object(document, "");
    r.OnlyKeys(document, "", {"description", "world", "engine", "steps"});
    Scenario scenario;
    scenario.name = displayName;
    if (document.contains("description"))
        scenario.description = r.String(document["description"], "/description");
    if (document.contains("world"))
        scenario.world = ParseWorld(r, document["world"], "/world");
    if (document.contains("engine"))
        scenario.engine = ParseEngine(r, document["engine"], "/engine");
    if (scenario.engine.dataRoot && scenario.engine.dataRoot->is_relative())
        scenario.engine.dataRoot = baseDir / *scenario.engine.dataRoot;
    if (scenario.engine.dataRoot && !std::filesystem::is_directory(*scenario.engine.dataRoot))
        r.Fail("/engine/data_root",
               "the data root " + scenario.engine.dataRoot->string() + " is not a folder");
    if (!document.contains("steps"))
        r.Fail("", "a scenario needs \"steps\", the list of what to do");
    const json& steps = r.Array(document["steps"], "/steps");
    RecordNames kept;
    for (std::size_t i = 0; i < steps.size(); ++i)
        scenario.steps.push_back(ParseStep(r, steps[i], R::Child("/steps", i), i + 1, kept));
    return scenario;
}

}  // namespace steamext::run
