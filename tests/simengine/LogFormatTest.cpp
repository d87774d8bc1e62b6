// Log lines must read exactly as C printf would write them, keep their level,
// kind and order, and name the thread that logged.
#include <string>

#include "EngineFixture.h"

using simengine::LogKind;
using simengine::LogLine;

namespace {

struct Worker {
    static void Run(void* argument)
    {
        static_cast<HostServices*>(argument)->Log(kHostLogWarning, "from %s", "worker");
    }
};

}  // namespace

using LogFormatTest = EngineTest;

TEST_F(LogFormatTest, FormatsLikePrintf)
{
    // Catches a formatter that drops arguments, truncates or mangles conversions, or a
    // fixed-size buffer that cuts long lines around the lengths where it would end.
    table->LogInfo("%d|%u|%x|%5.2f|%-4s|%c|%%", -7, 4294967295u, 0xBEEFu, 3.14159, "ab", 'z');
    table->LogInfo("%lld %llu", -9000000000LL, 18446744073709551615ULL);
    table->LogInfo("plain text");
    table->LogInfo("%s", "");
    std::vector<std::string> expected = {
        "-7|4294967295|beef| 3.14|ab  |z|%",
        "-9000000000 18446744073709551615",
        "plain text",
        "",
    };
    for (size_t length : {254u, 255u, 256u, 257u, 5000u}) {
        expected.emplace_back(length, 'x');
        expected.back().back() = 'E';
        table->Log(kHostLogInfo, "%s", expected.back().c_str());
    }
    EXPECT_EQ(engine.Records().All().LogTexts(), expected);
}

TEST_F(LogFormatTest, KeepsKindLevelAndOrder)
{
    // Catches levels swapped between entries, report and log lines merged, or a mark
    // that gives the whole journal or loses the entry just after it.
    table->ReportError(1, "report %d", 1);
    table->Log(kHostLogError, "log %d", 2);
    const uint64_t mark = engine.Records().Mark();
    table->LogInfo("info %d", 3);
    table->Log(kHostLogWarning, "log %d", 4);

    std::vector<LogLine> lines = engine.Records().All().Logs();
    ASSERT_EQ(lines.size(), 4u);
    struct Row {
        LogKind kind;
        int32_t level;
        const char* text;
    } rows[] = {
        {LogKind::Report, 1, "report 1"},
        {LogKind::Log, 2, "log 2"},
        {LogKind::Info, 0, "info 3"},
        {LogKind::Log, 1, "log 4"},
    };
    for (size_t i = 0; i < lines.size(); ++i) {
        SCOPED_TRACE(rows[i].text);
        EXPECT_EQ(lines[i].kind, rows[i].kind);
        EXPECT_EQ(lines[i].level, rows[i].level);
        EXPECT_EQ(lines[i].text, rows[i].text);
        EXPECT_EQ(lines[i].thread, "main");
    }
    EXPECT_EQ(engine.Records().All().Logs(LogKind::Log).size(), 2u);
    EXPECT_EQ(engine.Records().All().LogsAtLevel(1).size(), 2u);
    EXPECT_EQ(engine.Records().Since(mark).LogTexts(), (std::vector<std::string>{"info 3", "log 4"}));
}

TEST_F(LogFormatTest, NamesTheLoggingThread)
{
    // Catches a thread name lost between StartThread and the thread's calls.
    table->threads->StartThread("Log_Worker", &Worker::Run, table, 0);
    engine.Threads().Join("Log_Worker");

    std::vector<LogLine> lines = engine.Records().All().Logs();
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_EQ(lines[0].text, "from worker");
    EXPECT_EQ(lines[0].thread, "Log_Worker");
}
