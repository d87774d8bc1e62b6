// The workshop's keys of a scenario's "world": items as the platform has them,
// downloads and uploads that move by themselves, what an update reports.
#pragma once

#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "run/Scenario.h"
#include "run/ScenarioFile.h"

namespace steamext::run {

// The keys, in the order they apply.
const std::vector<std::string>& WorkshopWorldKeys();
bool IsWorkshopWorldKey(const std::string& key);
WorldEdit ParseWorkshopWorld(const ScenarioFile& reader, const std::string& key, const nlohmann::json& value,
                             const std::string& pointer);

}  // namespace steamext::run
