// The leaderboard keys of a scenario's "world": boards (listed or generated), the
// friends list, other players' names and how they arrive.
#pragma once

#include <string>

#include <nlohmann/json.hpp>

#include "run/Scenario.h"
#include "run/ScenarioFile.h"

namespace steamext::run {

WorldEdit ParseLeaderboards(const ScenarioFile& reader, const nlohmann::json& value,
                            const std::string& pointer);
WorldEdit ParseFriends(const ScenarioFile& reader, const nlohmann::json& value, const std::string& pointer);
WorldEdit ParsePersonas(const ScenarioFile& reader, const nlohmann::json& value, const std::string& pointer);
WorldEdit ParseAllNames(const ScenarioFile& reader, const nlohmann::json& value, const std::string& pointer);

}  // namespace steamext::run
