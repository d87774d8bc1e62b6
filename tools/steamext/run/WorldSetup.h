// The "world" of a scenario: the simulated Steam client's state, given at the
// start or changed mid-run. Each key becomes one WorldEdit, checked up front.
#pragma once

#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "run/Scenario.h"
#include "run/ScenarioFile.h"

namespace steamext::run {

std::vector<WorldEdit> ParseWorld(const ScenarioFile& reader, const nlohmann::json& world,
                                  const std::string& pointer);

}  // namespace steamext::run
