// Checking a step's expectations against what the step did.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "run/Operations.h"
#include "run/Scenario.h"

namespace steamext::run {

struct CheckOutcome {
    bool passed = false;
    std::string text;  // what was expected, and on failure what was seen
};

// `result` is the call's result for a call step; `records` are everything the
// step produced (Records.h), in order.
std::vector<CheckOutcome> Evaluate(const Expectations& expect, const std::optional<CallResult>& result,
                                   const std::vector<nlohmann::json>& records);

// A call's result as the timeline shows it.
std::string ShowResult(const CallResult& result, ResultType type);

}  // namespace steamext::run
