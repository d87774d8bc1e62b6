// Each subcommand registers itself here and says how it runs.
#pragma once

#include <functional>

#include <CLI/CLI.hpp>

// The exit status of the program when this subcommand was chosen.
using SubcommandAction = std::function<int()>;

// One per subcommand folder.
void AddRunSubcommand(CLI::App& app, SubcommandAction& action);   // run/
void AddDataSubcommand(CLI::App& app, SubcommandAction& action);  // data/

void RegisterSubcommands(CLI::App& app);
int RunSelectedSubcommand(CLI::App& app);
