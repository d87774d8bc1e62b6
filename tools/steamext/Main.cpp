// steamext: run scenarios against the built module, check and convert data files.
#include <cstdio>
#include <exception>

#include <CLI/CLI.hpp>

#include "ProcessFacts.h"
#include "Subcommands.h"

int main(int argc, char** argv)
{
    CLI::App app{"steamext: run the Steam extension module without the engine or a Steam client"};
    app.require_subcommand(1);
    // Paths are arguments, never options, even when they start with "/".
    app.allow_windows_style_options(false);
    RegisterSubcommands(app);
    steamext::WriteStandardStreamsAsBytes();
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error);
    }
    try {
        return RunSelectedSubcommand(app);
    } catch (const std::exception& error) {
        // Subcommands report their own faults; this is the last guard against a crash.
        std::fprintf(stderr, "steamext: %s\n", error.what());
        return 2;
    }
}
