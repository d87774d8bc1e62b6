// A scenario: the simulated client's world, the simulated engine's set-up, and
// the steps to play against the module. Parsed and checked completely before
// anything runs, so that a mistake in the file never shows up half-way.
#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "run/Operations.h"

namespace simclient {
class World;
}

namespace steamext::run {

// A malformed scenario; the message names the file, line, column and path.
class ScenarioError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// One change of the simulated client's world, at the start or mid-run.
struct WorldEdit {
    std::string description;  // "overlay_active = true", for the timeline
    std::function<void(simclient::World&)> apply;
};

struct EngineSetup {
    std::map<std::string, std::string> productValues;
    std::set<std::string> features;
    std::optional<std::filesystem::path> dataRoot;         // absolute, resolved against the scenario's folder
    std::map<std::string, std::string> dataFiles;          // written under a fresh data root
    std::vector<std::optional<std::string>> popupAnswers;  // nullopt: the popup gives null
    std::map<std::string, std::optional<std::string>> commandAnswers;
    bool manualClock = true;  // false: a real clock scaled by timeScale
    double timeScale = 1.0;
    uint32_t frameMs = 16;  // how far one frame moves the clock
};

// What a step waits for: a record of one kind matching a pattern.
struct WaitCondition {
    std::string kind;  // "event", "log", "platform_call", "threads_ended" (pattern {"name": ...})
    nlohmann::json pattern;
    std::string description;
};

// Checks on a call's result and on what happened during the step.
struct Expectations {
    std::optional<nlohmann::json> result;
    std::optional<std::vector<nlohmann::json>> events;  // exactly these, in order
    std::vector<nlohmann::json> logs;                   // in order, others allowed between
    std::vector<nlohmann::json> noLogs;
    std::vector<nlohmann::json> platformCalls;  // in order, others allowed between
    std::vector<nlohmann::json> noPlatformCalls;
    std::vector<nlohmann::json> hostCommands;  // in order
    std::optional<std::string> inputButtons;   // id ranges, "0-254,801-863"; "" for none
    std::optional<std::string> inputAxes;
};

enum class StepKind {
    Note,
    Call,
    Frames,
    Advance,
    Wait,
    World,
    Read,
    FailAllocations,
};

struct Step {
    std::size_t index = 0;  // 1-based, as the timeline shows it
    std::string place;      // "file:line:column (steps[3])"
    StepKind kind = StepKind::Note;
    std::string note;

    const Operation* operation = nullptr;  // Call
    std::vector<ArgValue> args;
    nlohmann::json argsShown;  // the arguments as written, for the timeline
    std::string keepAs;        // Call of a record: the name a later "read" uses

    std::string readName;                      // Read: a record kept by an earlier call
    const RecordLayout* readLayout = nullptr;  // and its layout

    uint32_t frames = 0;      // Frames
    uint32_t advanceMs = 0;   // Advance
    int failAllocations = 0;  // FailAllocations
    WaitCondition wait;       // Wait
    uint32_t timeoutMs = 0;
    std::vector<WorldEdit> world;  // World

    Expectations expect;
};

struct Scenario {
    std::string name;  // the file name, or "built-in tour"
    std::string description;
    std::vector<WorldEdit> world;
    EngineSetup engine;
    std::vector<Step> steps;
};

}  // namespace steamext::run
