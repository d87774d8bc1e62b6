// The data tools: load files as the module would, through the simulated engine,
// and read or write the scrambled envelope.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include "Subcommands.h"
#include "data/Database.h"
#include "simengine/Journal.h"

namespace datatool {

// One load of one path through the simulated engine.
struct LoadOutcome {
    std::unique_ptr<Database> database;
    bool loaded = false;
    simengine::JournalView journal;  // everything the load said to the engine
};

// Resets the simulated engine, answers the popups from `popupAnswers` in order
// (null once they run out), and calls Database::Load with `path` unchanged. The
// file is read relative to the current directory.
LoadOutcome LoadThroughEngine(const std::string& path,
                              const std::vector<std::optional<std::string>>& popupAnswers);

// Bytes as code points of the same number (0x80-0xFF as U+0080-U+00FF), in UTF-8.
std::string BytesAsText(const std::string& bytes);
// The message as printf made it, cut at its first zero byte.
std::string CutAtZero(const std::string& text);

// The dump of one load: path, loaded, arrays, reports, popups, logs, in that order.
nlohmann::ordered_json DumpJson(const std::string& path, const LoadOutcome& outcome);

// Reads a whole file; false with `error` naming the fault.
bool ReadFile(const std::string& path, std::string& bytes, std::string& error);
bool WriteFile(const std::string& path, const std::string& bytes, std::string& error);

// Builds an envelope around `plain`; false if it is too large for the length field.
bool ScrambleText(const std::string& plain, std::string& envelopeBytes, std::string& error);
// Undoes an envelope; false with `error` naming the fault (magic, length, checksum).
bool UnscrambleText(const std::string& envelopeBytes, std::string& plain, std::string& error);

void AddCheckCommand(CLI::App& data, SubcommandAction& action);
void AddDumpCommand(CLI::App& data, SubcommandAction& action);
void AddScrambleCommands(CLI::App& data, SubcommandAction& action);

}  // namespace datatool
