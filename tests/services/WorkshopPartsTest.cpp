// The workshop's arithmetic and text pieces, on their own: the progress scale,
// the text replacement and the install folder turned into engine paths.
#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <string>

#include "host/HostServices.h"
#include "services/workshop/CWorkshopSubscriptions.h"
#include "services/workshop/UGCImplementationSteam.h"
#include "simclient/World.h"
#include "simengine/Engine.h"

namespace {

// Expected values worked out apart from this code (exact rationals and IEEE single
// precision step by step). The rows pick the places where the single-precision steps
// part from exact arithmetic or from a double-precision shortcut: a fault there
// shows as one step off.
TEST(WorkshopScaleProgress, SinglePrecisionStepsThenTruncation)
{
    constexpr uint64_t kMax = std::numeric_limits<uint64_t>::max();
    struct Row {
        uint64_t done, total;
        int32_t expected;
    } rows[] = {
        {0, 1, 5},
        {1, 1, 100},
        {1, 2, 52},    // 52.5 truncated, not rounded
        {2, 1, 100},   // clamped at 1
        {1, 95, 6},    // exact 6
        {49, 95, 53},  // exact 54; single precision lands just below
        {53, 95, 58},  // a double-precision shortcut gives 57
        {56, 95, 61},  // a double-precision shortcut gives 60
        {94, 95, 99},
        {199, 200, 99},
        {999999, 1000000, 99},
        {99999999, 100000000, 100},  // exact 99; the quotient rounds to 1.0f
        {1, kMax, 5},
        {kMax - 1, kMax, 100},
        {uint64_t{1} << 63, kMax, 52},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(std::to_string(row.done) + "/" + std::to_string(row.total));
        EXPECT_EQ(UGCImplementationSteam::ScaleProgress(row.done, row.total), row.expected);
    }
}

// Runs ReplaceAllText on a marked buffer: bytes past what it may write must stay 0x7E.
struct ReplaceOutcome {
    const char* result;
    std::string text;
    bool markerIntact;
};

ReplaceOutcome Replace(const char* source, const char* search, const char* replacement, int32_t size)
{
    static char buffer[64];
    std::memset(buffer, 0x7E, sizeof buffer);
    const char* result = CWorkshopSubscriptions::ReplaceAllText(source, search, replacement, buffer, size);
    bool intact = true;
    for (std::size_t i = static_cast<std::size_t>(size > 0 ? size : 0); i < sizeof buffer; ++i)
        intact = intact && buffer[i] == 0x7E;
    std::string text =
        result == buffer && buffer[0] != 0x7E ? std::string(buffer) : std::string("<untouched>");
    return {result, text, intact};
}

TEST(WorkshopReplaceAllText, Table)
{
    struct Row {
        const char* name;
        const char* source;
        const char* search;
        const char* replacement;
        int32_t size;
        const char* expected;  // null: the call gives null
    } rows[] = {
        {"backslashes to slashes", "a\\b\\c", "\\", "/", 6, "a/b/c"},
        {"no occurrence", "abc", "\\", "/", 4, "abc"},
        {"shrinking", "a--b--c", "--", "-", 8, "a-b-c"},
        {"search goes on behind the inserted text", "aa", "a", "aa", 16, "aaaa"},
        {"growing until the room runs out", "x.x.x", ".", "...", 9, "x...x.x"},
        {"growing exactly into the room", "x.x", ".", "...", 6, "x...x"},
        {"source with terminator does not fit", "abcd", "b", "c", 4, "<untouched>"},
        {"source fits exactly", "abc", "b", "c", 4, "acc"},
        {"empty search replaces nothing", "abc", "", "z", 4, "abc"},
        {"null source", nullptr, "a", "b", 4, nullptr},
        {"size 0", "", "a", "b", 0, nullptr},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        ReplaceOutcome outcome = Replace(row.source, row.search, row.replacement, row.size);
        if (row.expected == nullptr) {
            EXPECT_EQ(outcome.result, nullptr);
            continue;
        }
        EXPECT_NE(outcome.result, nullptr);
        EXPECT_EQ(outcome.text, row.expected);
        EXPECT_TRUE(outcome.markerIntact) << "wrote past its size";
    }
    char buffer[8] = "keep";
    EXPECT_EQ(CWorkshopSubscriptions::ReplaceAllText("a", "a", "b", nullptr, 8), nullptr);
    // In place, as GetInstallPath uses it.
    std::strcpy(buffer, "p\\q");
    EXPECT_STREQ(CWorkshopSubscriptions::ReplaceAllText(buffer, "\\", "/", buffer, 8), "p/q");
}

// GetInstallPath against the simulated client and engine, without loading the module.
class WorkshopInstallPath : public ::testing::Test {
protected:
    void SetUp() override
    {
        world.Reset();
        engine.Reset();
        hostServices = engine.Table();
        ASSERT_TRUE(SteamAPI_Init());
    }
    void TearDown() override
    {
        SteamAPI_Shutdown();
        hostServices = nullptr;
        world.Reset();
        engine.Reset();
    }

    simclient::World& world = simclient::GetWorld();
    simengine::Engine& engine = simengine::Engine::Instance();
};

TEST_F(WorkshopInstallPath, BaseFolderAndEnginePath)
{
    struct Row {
        const char* folder;
        uint32 state;
        const char* base;       // "" when no base is sent
        const char* converted;  // "" when no conversion is asked
        const char* result;     // null for the empty result
    } rows[] = {
        {"a\\b\\c", k_EItemStateInstalled, "a/b", "a/b/c", "a/b/c"},
        {"C:\\ws\\9", k_EItemStateInstalled, "C:/ws", "C:/ws/9", "C:/ws/9"},
        {"flat", k_EItemStateInstalled, "flat", "flat", "flat"},
        {"z/item", k_EItemStateInstalled, "", "z/item", "z/item"},
        {"/top", k_EItemStateInstalled, "", "/top", "/top"},
        {"", k_EItemStateInstalled, "", "", nullptr},
        {"/never/shown", k_EItemStateDownloadPending, "", "", nullptr},
    };
    PublishedFileId_t id = 100;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.folder);
        simclient::WorkshopItem item;
        item.id = ++id;
        item.state = row.state;
        item.folder = row.folder;
        world.AddWorkshopItem(item);
        const uint64_t mark = engine.Records().Mark();

        CWorkshopSubscriptions subscriptions(480);
        InlineString path = subscriptions.GetInstallPath(id);

        simengine::JournalView seen = engine.Records().Since(mark);
        auto bases = seen.Commands("SetUGCBasePath");
        auto conversions = seen.Commands("ConvertNativeOSPathToStaticPath");
        ASSERT_EQ(bases.size(), row.base[0] != '\0' ? 1u : 0u);
        if (!bases.empty()) {
            EXPECT_EQ(bases[0].argument, row.base);
        }
        ASSERT_EQ(conversions.size(), row.converted[0] != '\0' ? 1u : 0u);
        if (!conversions.empty()) {
            EXPECT_EQ(conversions[0].argument, row.converted);
        }
        if (row.result == nullptr) {
            EXPECT_EQ(path.Text(), nullptr);
            EXPECT_EQ(path.Length(), 0);
        } else {
            EXPECT_STREQ(path.Text(), row.result);
            EXPECT_EQ(path.Length(), static_cast<int32_t>(std::strlen(row.result)));
        }
    }
}

TEST_F(WorkshopInstallPath, BaseComesBeforeConversionAndTheAnswerIsCopied)
{
    simclient::WorkshopItem item;
    item.id = 7;
    item.state = k_EItemStateInstalled;
    item.folder = "/games/ws/7";
    world.AddWorkshopItem(item);
    engine.Commands().QueueAnswer("ConvertNativeOSPathToStaticPath", std::string("workshop/7"));

    CWorkshopSubscriptions subscriptions(480);
    InlineString path = subscriptions.GetInstallPath(7);

    auto commands = engine.Records().All().Commands();
    ASSERT_EQ(commands.size(), 2u);
    EXPECT_EQ(commands[0].command, "SetUGCBasePath");
    EXPECT_EQ(commands[1].command, "ConvertNativeOSPathToStaticPath");
    EXPECT_STREQ(path.Text(), "workshop/7");
    EXPECT_EQ(engine.Records().All().LogTexts().back(), "Install path: 'workshop/7'");
}

}  // namespace
