// steamext data check / dump / scramble / unscramble, run as a game developer runs
// them: the built program in a scratch folder, paths relative to it.
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include "ProgramRun.h"

namespace {

namespace fs = std::filesystem;
// Ordered, so that comparing two dumps also compares their key order.
using Json = nlohmann::ordered_json;

using Outcome = testsupport::ProgramOutcome;

std::string ReadBytes(const fs::path& path)
{
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

void WriteBytes(const fs::path& path, const std::string& bytes)
{
    std::ofstream(path, std::ios::binary | std::ios::trunc)
        .write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

std::vector<std::string> Lines(const std::string& text)
{
    std::vector<std::string> lines;
    size_t start = 0;
    for (size_t end; (end = text.find('\n', start)) != std::string::npos; start = end + 1)
        lines.push_back(text.substr(start, end - start));
    if (start < text.size())
        lines.push_back(text.substr(start));
    return lines;
}

// Each test gets a fresh folder to run in; stderr is kept beside it.
class DataTools : public ::testing::Test {
protected:
    void SetUp() override
    {
        static int serial = 0;
        root_ =
            fs::temp_directory_path() / ("steamext_tools_" + std::to_string(testsupport::ThisProcessId()) +
                                         "_" + std::to_string(++serial));
        fs::remove_all(root_);
        fs::create_directories(root_ / "w");
    }
    void TearDown() override { fs::remove_all(root_); }

    fs::path Work() const { return root_ / "w"; }
    void Put(const std::string& name, const std::string& bytes) const { WriteBytes(Work() / name, bytes); }

    Outcome Run(const std::vector<std::string>& args) const
    {
        return testsupport::RunProgram(STEAMEXT_PROGRAM, args, Work(), root_);
    }

    // A refusal: non-zero status, nothing on stdout, one line on stderr naming the fault.
    void ExpectOneLineError(const Outcome& outcome, const std::string& fragment) const
    {
        EXPECT_NE(outcome.status, 0);
        EXPECT_EQ(outcome.out, "");
        EXPECT_EQ(Lines(outcome.err).size(), 1u) << outcome.err;
        EXPECT_NE(outcome.err.find(fragment), std::string::npos) << outcome.err;
        EXPECT_EQ(outcome.err.find("terminate called"), std::string::npos);
    }

private:
    fs::path root_;
};

const std::string kDecl = "<?xml version=\"1.0\"?>\n";
const std::string kGoodXml =
    kDecl + "<root>\n <array id=\"A\" k=\"v\">\n  <node id=\"n1\" x=\"caf\xe9\">text</node>\n"
            "  <node y=\"2\"/>\n </array>\n</root>\n";
// A name without '=': the parse error's character is 0, so printf's text stops there.
const std::string kCaseOneXml = kDecl + "<root><a b>\n</root>\n";

TEST_F(DataTools, DumpPrintsTreeMessagesAndPopups)
{
    // Catches a wrong JSON shape or key order, bytes above 127 not mapped to U+0080-U+00FF,
    // reports not cut at their zero byte, and popups answered out of order or
    // past the given answers.
    const std::string caseOne =
        "Parsing error (Reading next block (case #1)) around line 2 in XML 'bad.xml'. Unexpected character '";
    const std::string m2 =
        "DataManager: XML database needs to end with root block closing. 'bad.xml' is invalid.";
    const std::string popup = "CANCEL_TRY_CONTINUE,Failed to load XML file 'bad.xml'.";
    struct Row {
        const char* name;
        std::string file;
        std::string bytes;
        std::vector<std::string> answers;
        Json expected;
    };
    const Row rows[] = {
        {"loaded xml", "good.xml", kGoodXml, {}, Json::parse(R"({"path": "good.xml", "loaded": true,
            "arrays": [{"name": "A", "values": [["k", "v"]], "nodes": [
                {"id": "n1", "values": [["id", "n1"], ["x", "caf\u00e9"], ["DATA", "text"]]},
                {"id": null, "values": [["y", "2"]]}]}],
            "reports": [], "popups": [], "logs": []})")},
        {"csv with a null value", "t.csv", "a;b\n1\n", {}, Json::parse(R"({"path": "t.csv", "loaded": true,
            "arrays": [{"name": null, "values": [], "nodes": [{"id": null, "values": [["a", "1"], ["b", null]]}]}],
            "reports": [], "popups": [], "logs": [["info", "1 CSV Arrays loaded with total 1 nodes."]]})")},
        {"high bytes in path and message", "d\xe9.xml", "\xe9<", {}, Json::parse(R"({"path": "d\u00e9.xml",
            "loaded": false, "arrays": [],
            "reports": [[1, "First non-whitespace char in XML document needs to be '<'. First char in 'd\u00e9.xml' is #233 '\u00e9'."]],
            "popups": ["CANCEL_TRY_CONTINUE,Failed to load XML file 'd\u00e9.xml'."], "logs": []})")},
        {"unknown ending",
         "notes.txt",
         "x",
         {},
         Json::parse(R"({"path": "notes.txt", "loaded": false, "arrays": [],
            "reports": [[1, "Unknown database file type 'notes.txt'. Supported formats are: .csv .xml"]],
            "popups": [], "logs": []})")},
        {"answers run out, then null",
         "bad.xml",
         kCaseOneXml,
         {"TRY_AGAIN"},
         {{"path", "bad.xml"},
          {"loaded", false},
          {"arrays", Json::array()},
          {"reports", {{1, caseOne}, {1, m2}, {1, caseOne}, {1, m2}}},
          {"popups", Json::array({popup, popup})},
          {"logs", Json::array()}}},
        {"answers used in order, other case gives up",
         "bad.xml",
         kCaseOneXml,
         {"TRY_AGAIN", "try_again", "TRY_AGAIN"},
         {{"path", "bad.xml"},
          {"loaded", false},
          {"arrays", Json::array()},
          {"reports", {{1, caseOne}, {1, m2}, {1, caseOne}, {1, m2}}},
          {"popups", Json::array({popup, popup})},
          {"logs", Json::array()}}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        Put(row.file, row.bytes);
        std::vector<std::string> args = {"data", "dump", row.file};
        for (const std::string& answer : row.answers) {
            args.push_back("--popup-answer");
            args.push_back(answer);
        }
        const Outcome outcome = Run(args);
        EXPECT_EQ(outcome.status, 0);
        EXPECT_EQ(outcome.err, "");
        const Json dump = Json::parse(outcome.out, nullptr, false);
        ASSERT_FALSE(dump.is_discarded()) << outcome.out;
        EXPECT_EQ(dump, row.expected);
    }
}

TEST_F(DataTools, CheckPrintsMessagesThenVerdicts)
{
    // Catches a failed load that does not set the exit status, messages out of
    // order with their popup, and verdicts that miscount.
    Put("good.xml", kGoodXml);
    Put("t.csv", "a;b\n1;2\n3;4\n");
    Put("bad.xml", kDecl + "<root>\n");
    const std::vector<std::string> goodLines = {"good.xml: ok (1 arrays, 2 nodes)",
                                                "LogInfo: 1 CSV Arrays loaded with total 2 nodes.",
                                                "t.csv: ok (1 arrays, 2 nodes)"};
    const Outcome good = Run({"data", "check", "good.xml", "t.csv"});
    EXPECT_EQ(good.status, 0);
    EXPECT_EQ(Lines(good.out), goodLines);

    const Outcome mixed = Run({"data", "check", "bad.xml", "good.xml"});
    EXPECT_EQ(mixed.status, 1);
    EXPECT_EQ(Lines(mixed.out),
              (std::vector<std::string>{"ReportError(1): DataManager: XML database needs to end with root "
                                        "block closing. 'bad.xml' is invalid.",
                                        "ShowPopup: CANCEL_TRY_CONTINUE,Failed to load XML file 'bad.xml'.",
                                        "bad.xml: FAILED to load", "good.xml: ok (1 arrays, 2 nodes)"}));
}

TEST_F(DataTools, ScrambleRoundTripLoadsAsThePlainFile)
{
    // Catches a writer that is not the reader's inverse: a wrong checksum, key or
    // index wrap, or header layout makes the module refuse the file.
    std::string every;
    for (int i = 0; i < 600; ++i)
        every.push_back(static_cast<char>(i * 7));
    Put("every.bin", every);
    ASSERT_EQ(Run({"data", "scramble", "every.bin", "every.dat"}).status, 0);
    const std::string envelope = ReadBytes(Work() / "every.dat");
    ASSERT_EQ(envelope.size(), 22u + every.size());
    EXPECT_EQ(envelope.substr(0, 14), std::string("MORVEN_STRATA\0", 14));
    EXPECT_EQ(envelope.substr(14, 4), std::string("\x58\x02\x00\x00", 4));
    EXPECT_NE(envelope.substr(22), every);
    ASSERT_EQ(Run({"data", "unscramble", "every.dat", "every.out"}).status, 0);
    EXPECT_EQ(ReadBytes(Work() / "every.out"), every);

    // The module reads the envelope by content, whatever the name says.
    Put("plain.xml", kGoodXml);
    ASSERT_EQ(Run({"data", "scramble", "plain.xml", "wrapped.xml"}).status, 0);
    Json plain = Json::parse(Run({"data", "dump", "plain.xml"}).out);
    Json wrapped = Json::parse(Run({"data", "dump", "wrapped.xml"}).out);
    EXPECT_TRUE(wrapped["loaded"].get<bool>());
    EXPECT_EQ(wrapped["arrays"], plain["arrays"]);
    EXPECT_EQ(wrapped["reports"], Json::array());
}

TEST_F(DataTools, ErrorsAreOneLine)
{
    // Catches a crash or a multi-line usage dump on a missing or unreadable file or
    // on bad arguments, an envelope accepted with a wrong length or checksum, and a
    // refusal that does not name its fault or still writes its output.
    Put("plain.xml", kGoodXml);
    ASSERT_EQ(Run({"data", "scramble", "plain.xml", "good.dat"}).status, 0);
    const std::string good = ReadBytes(Work() / "good.dat");
    std::string changed = good;
    changed[22 + 5] = static_cast<char>(changed[22 + 5] ^ 1);
    fs::create_directory(Work() / "folder.xml");
    const std::vector<std::string> unscramble = {"data", "unscramble", "in.dat", "out.xml"};
    struct Row {
        const char* name;
        std::vector<std::string> args;
        const char* fragment;
        std::string inDat;  // written to in.dat first
    };
    const Row rows[] = {
        {"one byte more", unscramble, "length", good + "x"},
        {"one byte less", unscramble, "length", good.substr(0, good.size() - 1)},
        {"changed payload byte", unscramble, "checksum", changed},
        {"plain text", unscramble, "not a scrambled file", kGoodXml},
        {"magic but too short", unscramble, "not a scrambled file", good.substr(0, 21)},
        {"dump missing", {"data", "dump", "missing.xml"}, "missing.xml", ""},
        {"check missing", {"data", "check", "missing.xml"}, "missing.xml", ""},
        {"dump a folder", {"data", "dump", "folder.xml"}, "folder.xml", ""},
        {"scramble missing", {"data", "scramble", "missing.xml", "out.xml"}, "missing.xml", ""},
        {"unscramble missing", {"data", "unscramble", "missing.dat", "out.xml"}, "missing.dat", ""},
        {"no output folder",
         {"data", "scramble", "plain.xml", "no/such/folder/out.dat"},
         "no/such/folder/out.dat",
         ""},
        {"no subcommand", {"data"}, "steamext data", ""},
        {"check without files", {"data", "check"}, "steamext data check", ""},
        {"dump of two files", {"data", "dump", "plain.xml", "plain.xml"}, "steamext data dump", ""},
        {"answer missing", {"data", "dump", "plain.xml", "--popup-answer"}, "--popup-answer", ""},
        {"scramble without output", {"data", "scramble", "plain.xml"}, "steamext data scramble", ""},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        Put("in.dat", row.inDat);
        ExpectOneLineError(Run(row.args), row.fragment);
        EXPECT_FALSE(fs::exists(Work() / "out.xml"));
    }
}

TEST_F(DataTools, CheckWarnsAboutLeaderboardCategoriesTheModuleWouldNotReach)
{
    // Catches a wrong line, a warning missed or given for a word the module does accept,
    // a node's text or close tag taken for a node of its own, a path matched by a loose
    // ending, and --strict not failing.
    fs::create_directories(Work() / "leaderboards");
    fs::create_directories(Work() / "game" / "leaderboards");
    const std::string thirtyOne(31, 'a');
    const std::string thirtyTwo(32, 'b');
    struct Warning {
        int line;
        std::string fragment;
    };
    struct Row {
        const char* name;
        std::string xml;
        std::vector<Warning> warnings;
    };
    const Row rows[] = {
        {"clean",
         kDecl + "<root>\n<array id=\"CATEGORIES\">\n<node id=\"" + thirtyOne +
             "\" sort=\"LOWEST_SCORE_FIRST\" display_type=\"MILLISECONDS\"/>\n"
             "<node id=\"b\" sort=\"DESCENDING\" display_type=\"SECONDS\">text</node>\n"
             "<node id=\"c\" sort=\"ASCENDING\" display_type=\"NUMERIC\"></node>\n</array>\n"
             "<array id=\"OTHER\"><node sort=\"x\"/></array>\n</root>\n",
         {}},
        {"each fault once",
         kDecl +
             "<root>\n<array id=\"CATEGORIES\">\n"
             "<node id=\"" +
             thirtyTwo +
             "\"/>\n"
             "<node id=\"a\" sort=\"ascending\"/>\n"
             "<node\n   id=\"a\" display_type=\"Seconds\"/>\n"
             "<node sort=\"ASCENDING\"/>\n"
             "</array>\n<array id=\"CATEGORIES\"><node id=\"z\"/></array>\n</root>\n",
         {{4, "is 32 characters long"},
          {5, "sort \"ascending\" is none of ASCENDING, LOWEST_SCORE_FIRST, DESCENDING"},
          {6, "category id \"a\" repeats the one on line 5"},
          {6, "display_type \"Seconds\" is none of NUMERIC, SECONDS, MILLISECONDS"},
          {8, "a category without \"id\""},
          {10, "a second array \"CATEGORIES\" (the first is on line 3)"}}},
        {"no categories",
         kDecl + "\n<root>\n<array id=\"categories\"><node id=\"a\"/></array>\n</root>\n",
         {{3, "no array \"CATEGORIES\""}}},
        {"empty categories",
         kDecl + "<root>\n<array id=\"CATEGORIES\">\n</array>\n</root>\n",
         {{3, "has no nodes"}}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        for (const char* path : {"leaderboards/leaderboards.xml", "game/leaderboards/leaderboards.xml"}) {
            Put(path, row.xml);
            const Outcome outcome = Run({"data", "check", path});
            EXPECT_EQ(outcome.status, 0) << outcome.out;
            std::vector<std::string> lines = Lines(outcome.out);
            ASSERT_EQ(lines.size(), row.warnings.size() + 1) << outcome.out;
            for (std::size_t i = 0; i < row.warnings.size(); ++i) {
                const std::string prefix =
                    "warning: " + std::string(path) + ":" + std::to_string(row.warnings[i].line) + ": ";
                EXPECT_EQ(lines[i].rfind(prefix, 0), 0u) << lines[i];
                EXPECT_NE(lines[i].find(row.warnings[i].fragment), std::string::npos) << lines[i];
            }
            const Outcome strict = Run({"data", "check", "--strict", path});
            EXPECT_EQ(strict.status, row.warnings.empty() ? 0 : 1);
            EXPECT_EQ(Lines(strict.out).back().find("FAILED under --strict") != std::string::npos,
                      !row.warnings.empty());
        }
    }
    // The same file elsewhere, or under a name that only ends alike, is not a leaderboard file;
    // scrambled, it is.
    Put("leaderboards/leaderboards.xml", rows[2].xml);
    Put("myleaderboards.xml", rows[2].xml);
    fs::create_directories(Work() / "xleaderboards");
    Put("xleaderboards/leaderboards.xml", rows[2].xml);
    EXPECT_EQ(
        Run({"data", "check", "--strict", "myleaderboards.xml", "xleaderboards/leaderboards.xml"}).status, 0);
    ASSERT_EQ(Run({"data", "scramble", "leaderboards/leaderboards.xml", "game/leaderboards/leaderboards.xml"})
                  .status,
              0);
    const Outcome scrambled = Run({"data", "check", "game/leaderboards/leaderboards.xml"});
    EXPECT_EQ(scrambled.out.rfind("warning: game/leaderboards/leaderboards.xml:3: no array", 0), 0u)
        << scrambled.out;
}

}  // namespace
