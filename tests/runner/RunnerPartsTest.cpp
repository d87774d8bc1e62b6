// The runner's own parts: where errors point, how records are matched and
// how a step's expectations are judged. A fault here would make a scenario
// pass that should fail, or point a user at the wrong line.
#include <gtest/gtest.h>

#include "run/Expectations.h"
#include "run/JsonLocator.h"
#include "run/Records.h"
#include "run/Scenario.h"
#include "run/ScenarioFile.h"
#include "run/ScenarioParser.h"
#include "simclient/GeneratedPlayers.h"
#include "simclient/World.h"

namespace steamext::run {
namespace {

using nlohmann::json;

TEST(JsonLocator, FindsNestedValuesAndSkipsTrickyStrings)
{
    // Brackets, commas and escaped quotes inside strings must not move positions.
    const std::string text = "{\n"
                             "  \"a\": \"x,]}\\\"[\",\n"
                             "  \"steps\": [\n"
                             "    {\"call\": \"C\", \"args\": [1, {\"k\\\"ey\": null}]},\n"
                             "    [ ]\n"
                             "  ]\n"
                             "}\n";
    JsonLocator locator(text);
    struct Row {
        const char* pointer;
        int line, column;
    } rows[] = {
        {"", 1, 1},
        {"/a", 2, 8},
        {"/steps", 3, 12},
        {"/steps/0", 4, 5},
        {"/steps/0/call", 4, 14},
        {"/steps/0/args/1", 4, 31},
        {"/steps/0/args/1/k\"ey", 4, 41},
        {"/steps/1", 5, 5},
        {"/steps/1/7", 5, 5},  // not there: the nearest parent
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.pointer);
        TextPosition at = locator.Find(row.pointer);
        EXPECT_EQ(at.line, row.line);
        EXPECT_EQ(at.column, row.column);
    }
    EXPECT_EQ(ReadablePath("/steps/3/args/0"), "steps[3].args[0]");
    EXPECT_EQ(ReadablePath(""), "(top level)");
}

TEST(Records, IdRangesKeepCallOrder)
{
    // The overlay's input reset is checked through these ranges; a merged
    // repeat or a reordering must show.
    EXPECT_EQ(IdRanges({}), "");
    EXPECT_EQ(IdRanges({0, 1, 2, 3, 801, 802}), "0-3,801-802");
    EXPECT_EQ(IdRanges({5}), "5");
    EXPECT_EQ(IdRanges({1, 1, 2}), "1,1-2");
    EXPECT_EQ(IdRanges({3, 2, 1}), "3,2,1");
}

TEST(Records, PatternsMatchFieldsAndContains)
{
    json log = {{"kind", "log"}, {"level", 1}, {"text", "Steam still not running."}};
    EXPECT_TRUE(MatchesPattern(log, {{"level", 1}}));
    EXPECT_TRUE(MatchesPattern(log, {{"text_contains", "not running"}, {"count", 3}}));
    EXPECT_FALSE(MatchesPattern(log, {{"level", 2}}));
    EXPECT_FALSE(MatchesPattern(log, {{"text_contains", "Running"}}));
    EXPECT_FALSE(MatchesPattern(log, {{"source", "Log"}}));  // a missing field never matches
    json event = {{"kind", "event"}, {"type", 17}, {"PlayerId", nullptr}};
    EXPECT_TRUE(MatchesPattern(event, {{"PlayerId", nullptr}}));
    EXPECT_FALSE(MatchesPattern(event, {{"PlayerId", "0"}}));
    // Rows of a scores event: each object names some fields of its row; the count must agree.
    json scores = {{"kind", "event"},
                   {"type", 19},
                   {"entries", {{{"rank", 1}, {"userName", "Ann"}, {"details", {1, 2}}}, {{"rank", 2}}}}};
    EXPECT_TRUE(MatchesPattern(scores, {{"entries", {{{"userName", "Ann"}}, json::object()}}}));
    EXPECT_TRUE(MatchesPattern(scores, {{"entries", {{{"details", {1, 2}}}, {{"rank", 2}}}}}));
    EXPECT_FALSE(MatchesPattern(scores, {{"entries", {{{"rank", 2}}, {{"rank", 1}}}}}));
    EXPECT_FALSE(MatchesPattern(scores, {{"entries", {{{"rank", 1}}}}}));
    EXPECT_FALSE(MatchesPattern(scores, {{"entries", {{{"details", {1}}}, json::object()}}}));
    EXPECT_FALSE(MatchesPattern(scores, {{"entries", nullptr}}));
}

TEST(Base64, RoundTripsAndRefusesGarbage)
{
    for (const std::string& bytes : {std::string(""), std::string("a"), std::string("ab"), std::string("abc"),
                                     std::string("\0\1\2\3\xff", 5)}) {
        bool ok = false;
        EXPECT_EQ(DecodeBase64(EncodeBase64(bytes), ok), bytes);
        EXPECT_TRUE(ok);
    }
    for (const char* bad : {"not base64!", "QQ=A", "Q", "QQ==="}) {
        SCOPED_TRACE(bad);
        bool ok = true;
        DecodeBase64(bad, ok);
        EXPECT_FALSE(ok);
    }
}

json Log(int level, const char* text)
{
    return {{"kind", "log"}, {"level", level}, {"text", text}};
}

json Call(const char* name)
{
    return {{"kind", "platform_call"}, {"name", name}, {"args", ""}};
}

int Failed(const std::vector<CheckOutcome>& outcomes)
{
    int failed = 0;
    for (const auto& outcome : outcomes)
        failed += outcome.passed ? 0 : 1;
    return failed;
}

TEST(Expectations, LogsAndCallsAreCheckedInOrder)
{
    std::vector<json> records = {Log(0, "a"), Call("X"), Log(1, "b"), Call("Y"), Call("X")};
    struct Row {
        const char* name;
        std::vector<json> logs;
        std::vector<json> calls;
        int failed;
    } rows[] = {
        {"in order with gaps",
         {json{{"text", "a"}}, json{{"text", "b"}}},
         {json{{"name", "X"}}, json{{"name", "Y"}}},
         0},
        {"logs out of order", {json{{"text", "b"}}, json{{"text", "a"}}}, {}, 1},
        {"a call that never came", {}, {json{{"name", "Z"}}}, 1},
        {"counted", {}, {json{{"name", "X"}, {"count", 2}}, json{{"name", "Y"}, {"count", 1}}}, 0},
        {"count off by one", {}, {json{{"name", "X"}, {"count", 1}}}, 1},
        {"a pattern used twice needs two records", {json{{"text", "a"}}, json{{"text", "a"}}}, {}, 1},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        Expectations e;
        e.logs = row.logs;
        e.platformCalls = row.calls;
        EXPECT_EQ(Failed(Evaluate(e, std::nullopt, records)), row.failed);
    }
}

TEST(Expectations, EventsAreExactAndNegativesCatchAnyHit)
{
    json started = {{"kind", "event"}, {"type", 17}, {"status", 1}};
    Expectations e;
    e.events = std::vector<json>{json{{"type", 17}}};
    EXPECT_EQ(Failed(Evaluate(e, std::nullopt, {started})), 0);
    EXPECT_EQ(Failed(Evaluate(e, std::nullopt, {started, started})), 1);  // one too many
    EXPECT_EQ(Failed(Evaluate(e, std::nullopt, {})), 1);
    e.events = std::vector<json>{};
    EXPECT_EQ(Failed(Evaluate(e, std::nullopt, {started})), 1);

    Expectations none;
    none.noPlatformCalls = {json{{"name", "StoreStats"}}};
    EXPECT_EQ(Failed(Evaluate(none, std::nullopt, {Call("SetStat")})), 0);
    EXPECT_EQ(Failed(Evaluate(none, std::nullopt, {Call("SetStat"), Call("StoreStats")})), 1);
}

TEST(Expectations, ResultsCompareByValueAndBuffersByBytes)
{
    Expectations e;
    e.result = json(nullptr);
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json(nullptr), std::nullopt}, {})), 0);
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json("OK"), std::nullopt}, {})), 1);
    // A buffer is never null, even an empty one.
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json::object(), std::string()}, {})), 1);
    e.result = json{{"bytes", std::string("ab\0", 3)}};
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json::object(), std::string("ab\0", 3)}, {})), 0);
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json::object(), std::string("ab")}, {})), 1);
    e.result = json(7);
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json(7), std::nullopt}, {})), 0);
    EXPECT_EQ(Failed(Evaluate(e, CallResult{json("7"), std::nullopt}, {})), 1);

    Expectations inputs;
    inputs.inputButtons = "0-1, 5";
    json button = {{"kind", "input"}, {"call", "SetInputButton"}, {"id", 0}};
    std::vector<json> records = {button, button, button};
    records[1]["id"] = 1;
    records[2]["id"] = 5;
    EXPECT_EQ(Failed(Evaluate(inputs, std::nullopt, records)), 0);
    records.pop_back();
    EXPECT_EQ(Failed(Evaluate(inputs, std::nullopt, records)), 1);
}

// Mistakes a scenario writer makes, and the place and words the error must give.
TEST(ScenarioParser, NamesThePlaceOfEachMistake)
{
    struct Row {
        const char* text;
        const char* message;
    } rows[] = {
        {"{\"steps\": [{\"call\": \"Command\", \"args\": [1]}]}",
         "t.json:1:41: steps[0].args[0]: expected a string or null"},
        {"{\"steps\": [{\"call\": \"cloud.WriteFile\", \"args\": {\"name\": \"a\", \"dat\": \"b\"}}]}",
         "steps[0].args.dat: \"cloud.WriteFile\" has no argument \"dat\""},
        {"{\"steps\": [{\"call\": \"GetName\", \"expect\": 3}]}",
         "steps[0].expect: expected a string, got an integer"},
        {"{\"steps\": [{\"frames\": 1, \"expect\": true}]}", "needs \"call\" or \"read\" in the same step"},
        {"{\"steps\": [{\"wait_for\": {\"event\": 17, \"log\": \"x\"}}]}", "wait for exactly one thing"},
        {"{\"steps\": [{\"logs\": [{}]}]}", "steps[0].logs[0]: an empty pattern matches anything"},
        {"{\"steps\": [{\"inputs\": {\"keys\": \"1\"}}]}", "steps[0].inputs.keys: unknown key"},
        {"{\"steps\": [{}]}", "steps[0]: an empty step"},
        {"{\"steps\": [{\"read\": \"item1\"}]}",
         "steps[0].read: no earlier step keeps a record as \"item1\""},
        {"{\"steps\": [{\"call\": \"GetName\", \"keep_as\": \"n\"}]}",
         "steps[0].keep_as: \"GetName\" gives no record to keep"},
        {"{\"steps\": [{\"frames\": 1, \"keep_as\": \"n\"}]}", "\"keep_as\" belongs to a \"call\""},
        {"{\"engine\": {\"clock\": \"fast\"}, \"steps\": []}", "engine.clock: the clock is"},
        {"{\"engine\": {\"clock\": \"manual\", \"time_scale\": 4}, \"steps\": []}",
         "only applies to the \"scaled\" clock"},
        {"{\"world\": {\"user\": {\"steam_id\": -4}}, \"steps\": []}",
         "world.user.steam_id: expected a non-negative"},
        {"{\"world\": {\"server_time\": 1.5}, \"steps\": []}", "world.server_time: expected seconds"},
        {R"({"world": {"leaderboards": [{"rows": []}]}, "steps": []})",
         "world.leaderboards[0]: a leaderboard needs \"name\""},
        {R"({"world": {"leaderboards": [{"name": "B", "sort": "ASCENDING"}]}, "steps": []})",
         "world.leaderboards[0].sort: unknown word \"ASCENDING\"; expected one of: descending, ascending, "
         "none"},
        {R"({"world": {"leaderboards": [{"name": "B", "rows": [{"steam_id": 1, "score": 1, "details": [)"
         "0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,"
         "0,0,0,0,"
         R"(0,0,0,0,0,0,0,0,0,0,0,0]}]}]}, "steps": []})",
         "world.leaderboards[0].rows[0].details: at most 64 details"},
        {R"({"world": {"leaderboards": [{"name": "B", "generated": {"seed": 2}}]}, "steps": []})",
         "world.leaderboards[0].generated: generated rows need \"count\""},
        {R"({"world": {"friends": [{"generated": -1}]}, "steps": []})",
         "world.friends[0].generated: the integer -1"},
        {R"({"world": {"personas": [{"steam_id": 5, "arrives": {"pumps": 2}}]}, "steps": []})",
         "world.personas[0]: a player's name needs \"name\""},
        {R"({"world": {"personas": [{"steam_id": 5, "name": "A", "arrives": {"pumps": 2, "ms": 3}}]}, "steps": []})",
         "world.personas[0].arrives: expected {\"pumps\": n}"},
        {R"({"world": {"all_names_arrive": "later"}, "steps": []})", "world.all_names_arrive: expected"},
        {R"({"world": {"faults": [{"call": "FileRead", "kind": "fail", "chance": 0}]}, "steps": []})",
         "world.faults[0].chance: the integer 0 is out of range 1..100"},
        {R"({"steps": [{"wait_for": {"threads_ended": 3}}]})",
         "steps[0].wait_for.threads_ended: expected a string"},
        {R"({"steps": [{"call": "leaderboards.SubmitScore", "args": [0, {"scor": 1}, "B"]}]})",
         "steps[0].args[1].scor: the score record has no field \"scor\""},
        {R"({"steps": [{"fail_allocations": 0}]})",
         "steps[0].fail_allocations: the integer 0 is out of range"},
        {"[1, 2]", "t.json:1:1: (top level): expected an object"},
        {"", "t.json:1:1: not valid JSON"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.text);
        try {
            ParseScenario(row.text, "t.json", ".");
            ADD_FAILURE() << "accepted";
        } catch (const ScenarioError& error) {
            EXPECT_NE(std::string(error.what()).find(row.message), std::string::npos) << error.what();
        }
    }
}

// The world's leaderboard keys, applied to the simulated client, give the boards and the
// names a scenario asked for.
TEST(ScenarioParser, WorldBuildsBoardsFriendsAndNames)
{
    Scenario s = ParseScenario(
        R"({"world": {"leaderboards": [{"name": "B", "sort": "ascending", "rows": [{"steam_id": 7, "score": 3,
                "details": [4]}], "generated": {"count": 5, "seed": 9}}],
            "friends": [7, {"generated": 2}],
            "personas": [{"steam_id": 7, "name": {"base64": "QW7D"}}, {"steam_id": {"generated": 1}, "arrives": "never"}],
            "fault_seed": 4}, "steps": []})",
        "t.json", ".");
    simclient::World& world = simclient::GetWorld();
    world.Reset();
    for (const WorldEdit& edit : s.world)
        edit.apply(world);
    const auto rows = world.LeaderboardRows("B");
    ASSERT_EQ(rows.size(), 6u);
    for (std::size_t i = 1; i < rows.size(); ++i)
        EXPECT_LE(rows[i - 1].score, rows[i].score);  // ascending
    ASSERT_TRUE(SteamAPI_Init());
    EXPECT_STREQ(SteamFriends()->GetFriendPersonaName(CSteamID(uint64{7})), "An\xC3");
    EXPECT_STREQ(SteamFriends()->GetFriendPersonaName(CSteamID(simclient::GeneratedPlayerId(2))),
                 simclient::GeneratedPlayerName(2).c_str());
    EXPECT_TRUE(SteamFriends()->RequestUserInformation(CSteamID(simclient::GeneratedPlayerId(1)), true));
    world.Reset();
}

TEST(ScenarioParser, FillsDefaultsAndSizes)
{
    Scenario s = ParseScenario(
        R"({"steps": [{"call": "cloud.WriteFile", "args": ["a", {"base64": "AAEC"}]},
                      {"call": "Command", "args": {"name": "GetLanguage"}},
                      {"call": "achievements.UnlockAchievement", "args": {"name": "ACH"}}]})",
        "t.json", ".");
    ASSERT_EQ(s.steps.size(), 3u);
    EXPECT_EQ(s.steps[0].args[1].bytes, std::string("\0\1\2", 3));
    EXPECT_EQ(s.steps[0].args[2].number, 3);            // the size follows the data
    EXPECT_FALSE(s.steps[1].args[1].text.has_value());  // an omitted argument is null
    EXPECT_EQ(s.steps[2].args[0].number, 0);
    EXPECT_EQ(*s.steps[2].args[1].text, "ACH");
    EXPECT_EQ(s.steps[2].index, 3u);
}

}  // namespace
}  // namespace steamext::run
