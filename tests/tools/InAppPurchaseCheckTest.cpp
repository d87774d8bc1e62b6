// "steamext data check" on the store's configuration: a warning, with its line,
// for each item the module would silently never sell or never report.
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ProgramRun.h"

namespace {

namespace fs = std::filesystem;

class InAppPurchaseCheck : public ::testing::Test {
protected:
    void SetUp() override
    {
        root_ = fs::temp_directory_path() / ("steamext_iap_" + std::to_string(testsupport::ThisProcessId()));
        fs::remove_all(root_);
        fs::create_directories(root_ / "in-app-purchases");
    }
    void TearDown() override { fs::remove_all(root_); }

    void Put(const std::string& text) const
    {
        std::ofstream(root_ / "in-app-purchases" / "in-app-purchases.xml", std::ios::binary) << text;
    }

    testsupport::ProgramOutcome Check(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.begin(), {"data", "check"});
        arguments.push_back("in-app-purchases/in-app-purchases.xml");
        return testsupport::RunProgram(STEAMEXT_PROGRAM, arguments, root_, root_);
    }

    fs::path root_;
};

TEST_F(InAppPurchaseCheck, WarnsWithTheLineAboutWhatTheModuleIgnores)
{
    Put("<?xml version=\"1.0\"?>\n<root>\n<array id=\"ITEMS\">\n"
        "  <node id=\"1001\" steam_id=\"1001\"/>\n"
        "  <node id=\"sword\" steam_id=\"1002\"/>\n"
        "  <node id=\"01003\" steam_id=\"1003\"/>\n"
        "  <node id=\"1004\" steam_id=\"1004abc\"/>\n"
        "  <node id=\"free\" steam_id=\"0\"/>\n"
        "  <node id=\"nothing\"/>\n"
        "  <node id=\"1001\" steam_id=\"1001\"/>\n"
        "  <node\n     id=\"1005\" steam_id=\"+1005\"/>\n"
        "</array>\n</root>\n");
    const std::string file = "in-app-purchases/in-app-purchases.xml";
    const std::string expected =
        "warning: " + file +
        ":5: item \"sword\" is product 1002 but its id is not \"1002\": a purchase of it is never "
        "reported\n" +
        "warning: " + file +
        ":6: item \"01003\" is product 1003 but its id is not \"1003\": a purchase of it is never "
        "reported\n" +
        "warning: " + file +
        ":7: item \"1004\": \"steam_id\" \"1004abc\" has characters after its digits: the platform "
        "is asked about 1004, the store address gets the whole text\n" +
        "warning: " + file + ":8: item \"free\": \"steam_id\" \"0\" reads as 0: the item is not sold\n" +
        "warning: " + file + ":9: item \"nothing\" has no \"steam_id\": the item is not sold\n" +
        "warning: " + file + ":10: item \"1001\" repeats an id (first at line 4): only the first is read\n" +
        "warning: " + file +
        ":11: item \"1005\": \"steam_id\" \"+1005\" is not plain decimal digits: the platform is "
        "asked about 1005, the store address gets the whole text\n" +
        file + ": ok (1 arrays, 8 nodes), 7 warnings\n";
    testsupport::ProgramOutcome plain = Check({});
    EXPECT_EQ(plain.status, 0);
    EXPECT_EQ(plain.out, expected);

    testsupport::ProgramOutcome strict = Check({"--strict"});
    EXPECT_EQ(strict.status, 1);
    EXPECT_NE(strict.out.find(file + ": FAILED under --strict (7 warnings)\n"), std::string::npos)
        << strict.out;
}

TEST_F(InAppPurchaseCheck, CleanFilesPassStrict)
{
    Put("<?xml version=\"1.0\"?>\n<root>\n<array id=\"ITEMS\">\n<node id=\"1001\" steam_id=\"1001\"/>\n"
        "</array>\n<array id=\"ITEMS\">\n<node id=\"x\" steam_id=\"0\"/>\n</array>\n</root>\n");
    // The second array is never read, so nothing in it is warned about.
    testsupport::ProgramOutcome strict = Check({"--strict"});
    EXPECT_EQ(strict.status, 0);
    EXPECT_EQ(strict.out, "in-app-purchases/in-app-purchases.xml: ok (2 arrays, 2 nodes)\n");

    Put("<?xml version=\"1.0\"?>\n<root>\n<array id=\"SHOP\">\n</array>\n</root>\n");
    EXPECT_EQ(Check({"--strict"}).status, 1);
}

}  // namespace
