// "steamext data dump FILE [--popup-answer TEXT]...": one JSON object with the
// loaded tree and everything the load said to the engine.
#include <iostream>

#include "data/DataTool.h"

namespace datatool {

namespace {

using Json = nlohmann::ordered_json;

Json TextOrNull(const char* text)
{
    return text != nullptr ? Json(BytesAsText(text)) : Json(nullptr);
}

struct DumpOptions {
    std::string file;
    std::vector<std::string> answers;
};

int RunDump(const DumpOptions& options)
{
    std::string bytes;
    std::string error;
    if (!ReadFile(options.file, bytes, error)) {
        std::cerr << "steamext data dump: " << error << "\n";
        return 2;
    }
    const std::vector<std::optional<std::string>> answers(options.answers.begin(), options.answers.end());
    const LoadOutcome outcome = LoadThroughEngine(options.file, answers);
    std::cout << DumpJson(options.file, outcome).dump(2) << "\n";
    return 0;
}

}  // namespace

Json DumpJson(const std::string& path, const LoadOutcome& outcome)
{
    Json arrays = Json::array();
    for (const DataArray* array : outcome.database->arrays) {
        Json values = Json::array();
        for (const DataValue& pair : array->values)
            values.push_back(Json::array({TextOrNull(pair.name.text), TextOrNull(pair.value)}));
        Json nodes = Json::array();
        for (const DataNode* node : array->nodes) {
            Json pairs = Json::array();
            for (const DataValue& pair : node->values)
                pairs.push_back(Json::array({TextOrNull(pair.name.text), TextOrNull(pair.value)}));
            Json entry = Json::object();
            entry["id"] = TextOrNull(node->id.text);
            entry["values"] = std::move(pairs);
            nodes.push_back(std::move(entry));
        }
        Json entry = Json::object();
        entry["name"] = TextOrNull(array->name.text);
        entry["values"] = std::move(values);
        entry["nodes"] = std::move(nodes);
        arrays.push_back(std::move(entry));
    }

    Json reports = Json::array();
    Json logs = Json::array();
    for (const simengine::LogLine& line : outcome.journal.Logs()) {
        const std::string text = BytesAsText(CutAtZero(line.text));
        switch (line.kind) {
        case simengine::LogKind::Report:
            reports.push_back(Json::array({line.level, text}));
            break;
        case simengine::LogKind::Log:
            logs.push_back(Json::array({line.level, text}));
            break;
        case simengine::LogKind::Info:
            logs.push_back(Json::array({"info", text}));
            break;
        }
    }
    Json popups = Json::array();
    for (const simengine::CommandCall& call : outcome.journal.Commands("ShowPopup"))
        popups.push_back(BytesAsText(call.argument.value_or("")));

    Json dump = Json::object();
    dump["path"] = BytesAsText(path);
    dump["loaded"] = outcome.loaded;
    dump["arrays"] = std::move(arrays);
    dump["reports"] = std::move(reports);
    dump["popups"] = std::move(popups);
    dump["logs"] = std::move(logs);
    return dump;
}

void AddDumpCommand(CLI::App& data, SubcommandAction& action)
{
    auto options = std::make_shared<DumpOptions>();
    CLI::App* dump = data.add_subcommand("dump", "Load one file as the module would and print it as JSON");
    dump->add_option("file", options->file, "Data file (.xml, .dat, .csv)")->required();
    dump->add_option("--popup-answer", options->answers,
                     "Answer to the next \"ShowPopup\", in order (null once they run out)")
        ->take_all()
        ->allow_extra_args(false);
    dump->callback([options, &action] { action = [options] { return RunDump(*options); }; });
}

}  // namespace datatool
