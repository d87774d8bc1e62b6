// Database loading from a memory-backed file, against tinyxml2 and pugixml
// parsing the same bytes: a typical 4 KB configuration file (time per file) and
// generated files of 1 MB and 32 MB (bytes per second).
//
//   build/bench/bin/data_bench --benchmark_filter=.
#include <cstdarg>
#include <cstring>
#include <string>

#include <benchmark/benchmark.h>
#include <pugixml.hpp>
#include <tinyxml2.h>

#include "data/Database.h"
#include "data/XmlReader.h"
#include "host/HostServices.h"

namespace {

// ---- An engine table whose one file is a block in memory ------------------

struct MemoryFile {
    HostFile record;
    int64_t position;
};

const std::string* currentFile = nullptr;

HostFile* FileOpen(const char*, const char*)
{
    auto* file = new MemoryFile{{nullptr, static_cast<int64_t>(currentFile->size())}, 0};
    file->record.handle = file;
    return &file->record;
}

int64_t FileRead(void* destination, int64_t count, HostFile* record)
{
    auto* file = static_cast<MemoryFile*>(record->handle);
    const int64_t left = static_cast<int64_t>(currentFile->size()) - file->position;
    const int64_t taken = count < left ? count : left;
    std::memcpy(destination, currentFile->data() + file->position, static_cast<size_t>(taken));
    file->position += taken;
    return taken;
}

int64_t FileTell(HostFile* record)
{
    return static_cast<MemoryFile*>(record->handle)->position;
}
int32_t FileSeek(HostFile* record, int64_t position, int32_t)
{
    static_cast<MemoryFile*>(record->handle)->position = position;
    return 0;
}
void FileClose(HostFile* record)
{
    delete static_cast<MemoryFile*>(record->handle);
}
void ReportError(int32_t, const char*, ...) {}
const char* HostCommand(const char*, const char*)
{
    return nullptr;
}

void InstallTable(const std::string& file)
{
    static HostFileApi files{FileClose, FileTell, FileOpen, FileRead, FileSeek};
    static HostServices table = [] {
        HostServices services{};
        services.ReportError = ReportError;
        services.HostCommand = HostCommand;
        services.files = &files;
        return services;
    }();
    currentFile = &file;
    hostServices = &table;
}

// ---- The files -------------------------------------------------------------

// A configuration file as a game ships it: a few arrays of nodes with a handful
// of attributes, comments, and now and then a text.
std::string ConfigFile(size_t targetBytes)
{
    std::string xml = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<root>\n";
    int array = 0;
    while (xml.size() < targetBytes) {
        xml += "  <!-- category " + std::to_string(array) + " -->\n";
        xml += "  <array id=\"leaderboards_" + std::to_string(array) + "\" version=\"2\">\n";
        for (int node = 0; node < 40 && xml.size() < targetBytes; ++node) {
            const std::string n = std::to_string(node);
            xml += "    <node id=\"board_" + n + "\" name=\"Best time &amp; score " + n +
                   "\" sort=\"descending\" display=\"time_milliseconds\" filter=\"friends\" details=\"" + n +
                   "\"";
            if (node % 5 == 0)
                xml += ">Shown in the \"weekly\" list</node>\n";
            else
                xml += "/>\n";
        }
        xml += "  </array>\n";
        ++array;
    }
    xml += "</root>\n";
    return xml;
}

const std::string& File(int64_t kind)
{
    static const std::string small = ConfigFile(4 * 1024);
    static const std::string medium = ConfigFile(1024 * 1024);
    static const std::string large = ConfigFile(32 * 1024 * 1024);
    return kind == 0 ? small : kind == 1 ? medium : large;
}

void Label(benchmark::State& state, const std::string& file)
{
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) * static_cast<int64_t>(file.size()));
    state.SetLabel(std::to_string(file.size()) + " bytes");
}

void Ours(benchmark::State& state)
{
    const std::string& file = File(state.range(0));
    InstallTable(file);
    for (auto _ : state) {
        Database database;
        if (!database.Load("bench.xml"))
            state.SkipWithError("load failed");
        benchmark::DoNotOptimize(database.arrays.count);
    }
    Label(state, file);
}

// The reader alone, every block read and nothing kept: the loader's share
// beyond it is building the tree (a copy of each name and value, and the nodes,
// bumped out of the database's arena).
void OursReaderOnly(benchmark::State& state)
{
    const std::string& file = File(state.range(0));
    InstallTable(file);
    for (auto _ : state) {
        XmlReader reader;
        int64_t blocks = 0;
        if (reader.Open("bench.xml")) {
            while (reader.ReadBlock() != nullptr)
                ++blocks;
        }
        benchmark::DoNotOptimize(blocks);
    }
    Label(state, file);
}

void TinyXml2(benchmark::State& state)
{
    const std::string& file = File(state.range(0));
    for (auto _ : state) {
        tinyxml2::XMLDocument document;
        if (document.Parse(file.data(), file.size()) != tinyxml2::XML_SUCCESS)
            state.SkipWithError("parse failed");
        benchmark::DoNotOptimize(document.RootElement());
    }
    Label(state, file);
}

void PugiXml(benchmark::State& state)
{
    const std::string& file = File(state.range(0));
    for (auto _ : state) {
        pugi::xml_document document;
        if (!document.load_buffer(file.data(), file.size()))
            state.SkipWithError("parse failed");
        benchmark::DoNotOptimize(document.first_child());
    }
    Label(state, file);
}

}  // namespace

// 0: 4 KB, 1: 1 MB, 2: 32 MB.
BENCHMARK(Ours)->DenseRange(0, 2)->Unit(benchmark::kMicrosecond);
BENCHMARK(OursReaderOnly)->DenseRange(0, 2)->Unit(benchmark::kMicrosecond);
BENCHMARK(TinyXml2)->DenseRange(0, 2)->Unit(benchmark::kMicrosecond);
BENCHMARK(PugiXml)->DenseRange(0, 2)->Unit(benchmark::kMicrosecond);

BENCHMARK_MAIN();
