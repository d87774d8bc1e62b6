// "steamext data check FILE...": each file loaded as the module would, popups
// answered "give up"; the module's messages as they reach the engine, then one
// verdict line per file. Beside them the tool's own warnings (DataWarnings.h) about what
// the module would quietly ignore. Exit 1 if a file failed to load (or, with --strict,
// had warnings), 2 if one was unreadable.
#include <iostream>

#include "data/DataTool.h"
#include "data/DataWarnings.h"

namespace datatool {

namespace {

struct CheckOptions {
    std::vector<std::string> files;
    bool strict = false;
};

const char* KindName(const simengine::LogLine& line)
{
    switch (line.kind) {
    case simengine::LogKind::Report:
        return "ReportError";
    case simengine::LogKind::Log:
        return "Log";
    case simengine::LogKind::Info:
        return "LogInfo";
    }
    return "?";
}

int RunCheck(const CheckOptions& options)
{
    int status = 0;
    for (const std::string& file : options.files) {
        std::string bytes;
        std::string error;
        if (!ReadFile(file, bytes, error)) {
            std::cerr << "steamext data check: " << error << "\n";
            status = 2;
            continue;
        }
        const LoadOutcome outcome = LoadThroughEngine(file, {});
        for (const simengine::JournalEntry& entry : outcome.journal.Entries()) {
            if (const auto* line = std::get_if<simengine::LogLine>(&entry.record)) {
                std::cout << KindName(*line);
                if (line->kind != simengine::LogKind::Info)
                    std::cout << "(" << line->level << ")";
                std::cout << ": " << CutAtZero(line->text) << "\n";
            } else if (const auto* command = std::get_if<simengine::CommandCall>(&entry.record)) {
                if (command->command == "ShowPopup")
                    std::cout << "ShowPopup: " << command->argument.value_or("") << "\n";
            }
        }
        int arrays = 0;
        int nodes = 0;
        for (const DataArray* array : outcome.database->arrays) {
            ++arrays;
            nodes += array->nodes.count;
        }
        const int warnings = outcome.loaded ? PrintDataWarnings(file, bytes, outcome, std::cout) : 0;
        if (outcome.loaded && warnings > 0 && options.strict) {
            std::cout << file << ": FAILED under --strict (" << warnings << " warnings)\n";
            if (status == 0)
                status = 1;
        } else if (outcome.loaded) {
            std::cout << file << ": ok (" << arrays << " arrays, " << nodes << " nodes)";
            if (warnings > 0)
                std::cout << ", " << warnings << " warnings";
            std::cout << "\n";
        } else {
            std::cout << file << ": FAILED to load\n";
            if (status == 0)
                status = 1;
        }
    }
    return status;
}

}  // namespace

void AddCheckCommand(CLI::App& data, SubcommandAction& action)
{
    auto options = std::make_shared<CheckOptions>();
    CLI::App* check =
        data.add_subcommand("check", "Load each file as the module would and report what it says");
    check->add_option("files", options->files, "Data files (.xml, .dat, .csv)")->required();
    check->add_flag("--strict", options->strict, "Fail a file that has warnings");
    check->callback([options, &action] { action = [options] { return RunCheck(*options); }; });
}

}  // namespace datatool
