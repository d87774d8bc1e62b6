// How a run is shown: a readable timeline for people (colour on a terminal
// only), or JSON lines for machines. The runner tells both the same things.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

namespace steamext::run {

// Where the run stands: frames pumped so far and the engine's clock.
struct Moment {
    uint64_t frame = 0;
    uint32_t clockMs = 0;
};

struct RunSummary {
    std::map<int, int> eventsByType;
    int warnings = 0;  // log lines of level 1
    int errors = 0;    // log lines of level 2
    int passed = 0;
    int failed = 0;  // failed expectations and steps that could not run
    std::size_t platformCalls = 0;
    Moment end;
    std::vector<std::string> failures;
};

class Timeline {
public:
    virtual ~Timeline() = default;
    virtual void Begin(const std::string& scenario, const std::string& description,
                       const std::string& module) = 0;
    // Something the runner does around the steps: loading the module, quitting.
    virtual void Phase(const Moment& at, const std::string& title) = 0;
    // A step, as one headline; `detail` is the machine form.
    virtual void Step(const Moment& at, std::size_t index, const std::string& headline,
                      const std::string& note, const nlohmann::json& detail) = 0;
    // How a step that takes time ended ("arrived after 3 frames").
    virtual void Outcome(const Moment& at, const std::string& text) = 0;
    virtual void Record(const Moment& at, const nlohmann::json& record) = 0;
    virtual void Check(std::size_t step, bool passed, const std::string& text) = 0;
    virtual void End(const RunSummary& summary) = 0;
};

// `verbose` adds every platform call; inputs are shown as ranges of ids.
std::unique_ptr<Timeline> MakeReadableTimeline(std::ostream& out, bool colour, bool verbose);
// One JSON object per line, with every record, platform calls included.
std::unique_ptr<Timeline> MakeJsonTimeline(std::ostream& out);

}  // namespace steamext::run
