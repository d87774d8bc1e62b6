// Engine commands: scripted popup answers in order, path mapping both ways,
// every call journaled, and answers that stay readable.
#include <string>

#include "EngineFixture.h"

using CommandHostTest = EngineTest;

TEST_F(CommandHostTest, PopupAnswersComeFromTheQueueThenNull)
{
    // Catches a queue served out of order or an answer reused after the queue ran dry.
    engine.Commands().QueuePopupAnswer("TRY_AGAIN");
    engine.Commands().QueuePopupAnswer(std::nullopt);
    engine.Commands().QueuePopupAnswer("CANCEL");

    const char* first = table->HostCommand("ShowPopup", "CANCEL_TRY_CONTINUE,one");
    const char* second = table->HostCommand("ShowPopup", "CANCEL_TRY_CONTINUE,two");
    const char* third = table->HostCommand("ShowPopup", "CANCEL_TRY_CONTINUE,three");
    const char* fourth = table->HostCommand("ShowPopup", "CANCEL_TRY_CONTINUE,four");
    ASSERT_NE(first, nullptr);
    EXPECT_STREQ(first, "TRY_AGAIN") << "an earlier answer must stay valid";
    EXPECT_EQ(second, nullptr);
    EXPECT_STREQ(third, "CANCEL");
    EXPECT_EQ(fourth, nullptr);
    EXPECT_EQ(engine.Records().All().Popups(),
              (std::vector<std::string>{"CANCEL_TRY_CONTINUE,one", "CANCEL_TRY_CONTINUE,two",
                                        "CANCEL_TRY_CONTINUE,three", "CANCEL_TRY_CONTINUE,four"}));
}

TEST_F(CommandHostTest, PathCommandsMapThroughTheDataRoot)
{
    // Catches a doubled or missing separator, or a trailing "/" on a folder.
    engine.Paths().SetDataRoot("/games/demo/data/");
    struct Row {
        const char* command;
        const char* argument;
        const char* expected;
    } rows[] = {
        {"GetNativeOSPath", "workshop/item1", "/games/demo/data/workshop/item1"},
        {"GetNativeOSPath", "workshop/item1/", "/games/demo/data/workshop/item1"},
        {"GetNativeOSPath", "./maps", "/games/demo/data/maps"},
        {"GetNativeOSPath", "/already/native", "/already/native"},
        {"ConvertNativeOSPathToStaticPath", "/games/demo/data/ugc/42", "ugc/42"},
        {"ConvertNativeOSPathToStaticPath", "/games/demo/database", "/games/demo/database"},
        {"ConvertNativeOSPathToStaticPath", "/elsewhere/ugc/42", "/elsewhere/ugc/42"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(std::string(row.command) + " " + row.argument);
        const char* answer = table->HostCommand(row.command, row.argument);
        ASSERT_NE(answer, nullptr);
        EXPECT_STREQ(answer, row.expected);
    }
}

TEST_F(CommandHostTest, RecordsEveryCommandWithArgumentAndAnswer)
{
    // Catches commands that answer but are not journaled, or a lost null argument (the
    // tour checks a command and its argument through the journal).
    engine.Commands().QueueAnswer("GetNativeOSPath", "/scripted");
    EXPECT_EQ(table->HostCommand("SetUGCBasePath", "/steam/content/480"), nullptr);
    EXPECT_STREQ(table->HostCommand("GetNativeOSPath", "anything"), "/scripted");
    EXPECT_EQ(table->HostCommand("Unknown", nullptr), nullptr);

    std::vector<simengine::CommandCall> calls = engine.Records().All().Commands();
    ASSERT_EQ(calls.size(), 3u);
    EXPECT_EQ(calls[1].answer, "/scripted");
    EXPECT_FALSE(calls[2].argument.has_value());
    EXPECT_EQ(engine.Commands().UgcBasePath(), "/steam/content/480");
    EXPECT_EQ(engine.Records().All().Commands("Unknown").size(), 1u);
}

TEST_F(CommandHostTest, ConfigurationAnswersFromItsMaps)
{
    // Catches values that leak across a reset or features enabled by default.
    EXPECT_EQ(table->GetProductValue("steam_app_id"), nullptr);
    EXPECT_FALSE(table->IsFeatureEnabled("LEADERBOARDS"));
    engine.SetProductValue("steam_app_id", "480");
    engine.SetFeatureEnabled("LEADERBOARDS", true);
    EXPECT_STREQ(table->GetProductValue("steam_app_id"), "480");
    EXPECT_TRUE(table->IsFeatureEnabled("LEADERBOARDS"));
    EXPECT_FALSE(table->IsFeatureEnabled("leaderboards"));
    engine.Reset();
    EXPECT_EQ(table->GetProductValue("steam_app_id"), nullptr);
    EXPECT_FALSE(table->IsFeatureEnabled("LEADERBOARDS"));
}
