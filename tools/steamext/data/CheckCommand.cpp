// "steamext data check FILE...": each file loaded as the module would, popups
// answered "give up"; the module's messages as they reach the engine, warnings
// about what the module would ignore in a file it knows, then one verdict line
// per file. Exit 1 if a file failed to load (or, with --strict, got a warning),
// 2 if one was unreadable.
#include <iostream>

#include "data/DataTool.h"
#include "data/InAppPurchaseWarnings.h"

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
        int warnings = WarnAboutInAppPurchases(file, bytes, outcome, std::cout);
        int arrays = 0;
        int nodes = 0;
        for (const DataArray* array : outcome.database->arrays) {
            ++arrays;
            nodes += array->nodes.count;
        }
        if (outcome.loaded && options.strict && warnings > 0) {
            std::cout << file << ": FAILED: " << warnings << " warning(s) under --strict\n";
            if (status == 0)
                status = 1;
        } else if (outcome.loaded) {
            std::cout << file << ": ok (" << arrays << " arrays, " << nodes << " nodes)\n";
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
    check->add_flag("--strict", options->strict, "Fail a file that gets warnings, as one that does not load");
    check->callback([options, &action] { action = [options] { return RunCheck(*options); }; });
}

}  // namespace datatool
