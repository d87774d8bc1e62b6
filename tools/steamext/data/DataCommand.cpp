// "steamext data": check, dump, scramble and unscramble the game's data files.
#include "data/DataTool.h"

void AddDataSubcommand(CLI::App& app, SubcommandAction& action)
{
    CLI::App* data = app.add_subcommand("data", "Check, dump and (un)scramble the game's data files");
    data->require_subcommand(1);
    datatool::AddCheckCommand(*data, action);
    datatool::AddDumpCommand(*data, action);
    datatool::AddScrambleCommands(*data, action);
}
