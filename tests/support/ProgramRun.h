// Runs a built program as a person at a terminal would: in a folder of its own, with
// nothing on its input, and tells what it printed and how it ended.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace testsupport {

struct ProgramOutcome {
    int status = -1;  // the exit code; -1 when the program could not be started or crashed
    std::string out;
    std::string err;
};

// `scratch` holds the two captured streams while the program runs.
ProgramOutcome RunProgram(const std::string& program, const std::vector<std::string>& arguments,
                          const std::filesystem::path& folder, const std::filesystem::path& scratch);

// This process's id, for scratch folders of its own.
unsigned long ThisProcessId();

}  // namespace testsupport
