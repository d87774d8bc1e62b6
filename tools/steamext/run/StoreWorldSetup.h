// The world keys of the store's products and of the user in the store overlay:
// "dlcs", "dlc_installed" and "store_visit" (docs/scenarios.md).
#pragma once

#include <string>

#include <nlohmann/json.hpp>

#include "run/Scenario.h"
#include "run/ScenarioFile.h"

namespace steamext::run {

// True for the keys below; they apply after "cloud_files", in this order.
bool IsStoreWorldKey(const std::string& key);
WorldEdit ParseStoreWorldKey(const ScenarioFile& reader, const std::string& key, const nlohmann::json& value,
                             const std::string& pointer);

}  // namespace steamext::run
