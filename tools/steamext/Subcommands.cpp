#include "Subcommands.h"

namespace {
SubcommandAction selectedAction;
}

void RegisterSubcommands(CLI::App& app)
{
    AddRunSubcommand(app, selectedAction);
    AddDataSubcommand(app, selectedAction);
}

int RunSelectedSubcommand(CLI::App& /*app*/)
{
    return selectedAction ? selectedAction() : 2;
}
