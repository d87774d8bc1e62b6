// "steamext data": check, dump, scramble and unscramble the game's data files.
#include "data/DataTool.h"

void AddDataSubcommand(CLI::App& app, SubcommandAction& action)
{
    CLI::App* data = app.add_subcommand("data", "Check, dump and (un)scramble the game's data files");
    data->require_subcommand(1);
    datatool::AddCheckCommand(*data, action);
    datatool::AddDumpCommand(*data, action);
    datatool::AddScrambleCommands(*data, action);

    // Bad arguments to the data tools are one line on the error stream, naming the
    // tool; the other subcommands keep the usual message with its hint.
    app.failure_message([data](const CLI::App* top, const CLI::Error& error) {
        if (data->parsed()) {
            std::string tool = "steamext data";
            for (const CLI::App* sub : data->get_subcommands())
                if (sub->parsed())
                    tool += " " + sub->get_name();
            return tool + ": " + error.what() + " (see --help)\n";
        }
        return CLI::FailureMessage::simple(top, error);
    });
}
