// CSV arrays: fields counted across lines, the end-of-file rule for a last field,
// and one FileRead per byte.
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "data/Database.h"
#include "host/HostServices.h"
#include "simengine/Engine.h"

namespace {

const char* kPath = "t.csv";

std::string Text(const char* text)
{
    return text != nullptr ? text : "~";
}

struct CsvLoad {
    bool loaded = false;
    int arrays = 0;
    std::vector<std::string> nodes;  // "a=1,b=2", null as "~"
    std::vector<std::string> logs;
    std::vector<std::string> reports;
    int reads = 0;
};

CsvLoad LoadCsv(const std::string* bytes)
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    hostServices = engine.Table();
    if (bytes != nullptr)
        engine.Files().AddMemoryFile(kPath, *bytes);
    Database database;
    CsvLoad result;
    result.loaded = database.Load(kPath);
    result.arrays = database.arrays.count;
    for (const DataArray* array : database.arrays) {
        EXPECT_EQ(array->name.text, nullptr);
        for (const DataNode* node : array->nodes) {
            EXPECT_EQ(node->id.text, nullptr);
            std::string out;
            for (int i = 0; i < node->values.count; ++i)
                out += (i ? "," : "") + Text(node->values[i].name.text) + "=" + Text(node->values[i].value);
            result.nodes.push_back(out);
        }
    }
    const simengine::JournalView journal = engine.Records().All();
    for (const simengine::LogLine& line : journal.Logs(simengine::LogKind::Info))
        result.logs.push_back(line.text);
    for (const simengine::LogLine& line : journal.Logs(simengine::LogKind::Report))
        result.reports.push_back(line.text);
    result.reads = engine.Files().ReadCalls(kPath);
    return result;
}

std::string Loaded(int nodes)
{
    return "1 CSV Arrays loaded with total " + std::to_string(nodes) + " nodes.";
}

TEST(CsvLoader, Rows)
{
    // Catches fields counted per line instead of per node, a carriage return kept,
    // an empty field taken as null, the last-field rule or a field limit off by one,
    // and dropped bytes that end a field early.
    struct Row {
        const char* name;
        std::string file;
        std::vector<std::string> nodes;
    };
    const Row rows[] = {
        {"one row", "a;b\n1;2\n", {"a=1,b=2"}},
        {"crlf", "a;b\r\n1;2\r\n", {"a=1,b=2"}},
        {"cr inside a field", "a;b\n1\r1;2\n", {"a=11,b=2"}},
        {"empty field is empty text", "a;b;c\n1;;3\n", {"a=1,b=,c=3"}},
        {"last field of two bytes kept", "a;b\n1;22", {"a=1,b=22"}},
        {"last field of one byte lost", "a;b\n1;2", {"a=1,b=~"}},
        {"short line borrows from the next", "a;b\n1\n2;3\n", {"a=1,b=2", "a=3,b=~"}},
        {"long line leaves the surplus", "a;b\n1;2;3\n", {"a=1,b=2", "a=3,b=~"}},
        {"quotes are bytes", "a\n\"x;y\"\n", {"a=\"x", "a=y\""}},
        {"empty file", "", {}},
        {"header only", "a;b\n", {}},
        {"last header name without line feed not counted", "a;b", {"a=~"}},
        {"no separator at all", "abc", {}},
        {"empty header name", ";b\n1;2\n", {"=1,b=2"}},
        {"bytes above 127", "\xe9;b\n\xff;\x80\x81\n", {"\xe9=\xff,b=\x80\x81"}},
        {"names cut at 511 bytes, values at 4095",
         std::string(600, 'n') + ";b\n" + std::string(5000, 'v') + ";2\n",
         {std::string(511, 'n') + "=" + std::string(4095, 'v') + ",b=2"}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        const CsvLoad result = LoadCsv(&row.file);
        EXPECT_TRUE(result.loaded);
        EXPECT_EQ(result.arrays, 1);
        EXPECT_EQ(result.nodes, row.nodes);
        EXPECT_EQ(result.logs, std::vector<std::string>{Loaded(static_cast<int>(row.nodes.size()))});
        EXPECT_TRUE(result.reports.empty());
    }
}

TEST(CsvLoader, OneReadPerByteAndMissingFile)
{
    // Catches a buffered reader (the engine sees one FileRead per byte: the
    // header twice, then the rows) and a missing file that still makes an array.
    const std::string file = "a;b\n1;2\n";
    EXPECT_EQ(LoadCsv(&file).reads, 4 + 8);

    const CsvLoad missing = LoadCsv(nullptr);
    EXPECT_FALSE(missing.loaded);
    EXPECT_EQ(missing.arrays, 0);
    EXPECT_EQ(missing.reports, std::vector<std::string>{"CSV Array File 't.csv' not found!"});
    EXPECT_TRUE(missing.logs.empty());
}

}  // namespace
