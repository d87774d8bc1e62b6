// Turns a scenario file's JSON into a Scenario (Scenario.h), checking every
// value before anything runs; ScenarioFile names the place of a mistake.
#pragma once

#include <filesystem>
#include <string>

#include "run/Scenario.h"

namespace steamext::run {

// Reads and checks a whole scenario. `baseDir` resolves a relative data root.
Scenario ParseScenario(const std::string& text, const std::string& displayName,
                       const std::filesystem::path& baseDir);

// The built-in tour, the text of scenarios/tour.json at build time.
extern const char* const kBuiltinTour;

}  // namespace steamext::run
