// Plays a scenario against the module, frame by frame, and reports to a timeline.
#pragma once

#include <string>

#include "run/Scenario.h"
#include "run/Timeline.h"

namespace steamext::run {

struct RunOptions {
    std::string modulePath;
    // How long, in real seconds, a wait may take at most whatever the engine's
    // clock says, so that a module that never answers cannot hang a run.
    double realTimeGuardSeconds = 30.0;
};

// Exit status: 0 when every expectation held and every step ran, 1 otherwise.
// Throws ModuleLoadError when the module cannot be loaded.
int PlayScenario(const Scenario& scenario, const RunOptions& options, Timeline& timeline);

}  // namespace steamext::run
