// steamext: run scenarios against the built module, check and convert data files.
#include <CLI/CLI.hpp>

#include "Subcommands.h"

int main(int argc, char** argv)
{
    CLI::App app{"steamext: run the Steam extension module without the engine or a Steam client"};
    app.require_subcommand(1);
    RegisterSubcommands(app);
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error);
    }
    return RunSelectedSubcommand(app);
}
