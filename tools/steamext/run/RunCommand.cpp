// `steamext run [FILE] [--module PATH] [--json] [-v]`: play a scenario, or the
// built-in tour, against the built module.
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <sstream>

#include "ProcessFacts.h"
#include "Subcommands.h"
#include "run/EngineSession.h"
#include "run/Runner.h"
#include "run/ScenarioParser.h"
#include "run/Timeline.h"

namespace steamext::run {
namespace {

struct RunArguments {
    std::string file;
    std::string module;
    bool json = false;
    bool verbose = false;
};

// The module built beside this program.
std::string DefaultModulePath()
{
    std::filesystem::path self = ThisProgramPath();
    if (self.empty())
        return STEAMEXT_MODULE_FILE_NAME;
    return (self.parent_path() / STEAMEXT_MODULE_FILE_NAME).string();
}

int Fail(const std::string& message)
{
    std::cerr << "steamext run: " << message << "\n";
    return 2;
}

int Run(const RunArguments& arguments)
{
    std::string text;
    std::string displayName;
    std::filesystem::path baseDir = std::filesystem::current_path();
    if (arguments.file.empty()) {
        text = kBuiltinTour;
        displayName = "built-in tour";
    } else {
        std::ifstream in(arguments.file, std::ios::binary);
        if (!in)
            return Fail(arguments.file + ": cannot read the scenario file");
        std::ostringstream content;
        content << in.rdbuf();
        text = content.str();
        displayName = arguments.file;
        baseDir = std::filesystem::absolute(arguments.file).parent_path();
    }

    Scenario scenario;
    try {
        scenario = ParseScenario(text, displayName, baseDir);
    } catch (const ScenarioError& error) {
        return Fail(error.what());
    }

    RunOptions options;
    options.modulePath = arguments.module.empty() ? DefaultModulePath() : arguments.module;
    if (!std::filesystem::is_regular_file(options.modulePath))
        return Fail("the module file " + options.modulePath +
                    " does not exist; build the target steam_extension, or give --module PATH");

    bool colour = !arguments.json && StandardOutputIsTerminal() && std::getenv("NO_COLOR") == nullptr;
    std::unique_ptr<Timeline> timeline = arguments.json
                                             ? MakeJsonTimeline(std::cout)
                                             : MakeReadableTimeline(std::cout, colour, arguments.verbose);
    try {
        return PlayScenario(scenario, options, *timeline);
    } catch (const ModuleLoadError& error) {
        std::cout.flush();
        return Fail(error.what());
    } catch (const ScenarioError& error) {
        // Set-up that can only fail at run time, e.g. writing inline data files.
        std::cout.flush();
        return Fail(error.what());
    }
}

}  // namespace
}  // namespace steamext::run

void AddRunSubcommand(CLI::App& app, SubcommandAction& action)
{
    auto arguments = std::make_shared<steamext::run::RunArguments>();
    CLI::App* run = app.add_subcommand(
        "run", "Play a scenario against the built module (with no FILE: the built-in tour)");
    run->add_option("FILE", arguments->file, "Scenario file (JSON); see docs/scenarios.md");
    run->add_option("--module", arguments->module,
                    "Module file to load (default: " STEAMEXT_MODULE_FILE_NAME " beside this program)");
    run->add_flag("--json", arguments->json, "Write the whole journal as JSON lines instead of a timeline");
    run->add_flag("-v,--verbose", arguments->verbose, "Also show every platform call the module makes");
    run->callback([&action, arguments] { action = [arguments] { return steamext::run::Run(*arguments); }; });
}
