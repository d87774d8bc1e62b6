// What the tool asks the operating system about its own process.
#pragma once

#include <filesystem>

namespace steamext {

// The file this program was started from; empty if the system won't say.
std::filesystem::path ThisProgramPath();

// Output and messages are the same bytes on every system: "\n" ends a line on Windows too,
// so that a dump compares equal wherever it was made.
void WriteStandardStreamsAsBytes();

// Whether standard output goes to a terminal (colours are for people, not files).
bool StandardOutputIsTerminal();

}  // namespace steamext
