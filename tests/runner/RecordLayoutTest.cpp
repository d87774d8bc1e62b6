// Records by field table: what a scenario names must land at the field's
// offset in the field's form, what the module wrote must come back as it
// wrote it, and a wrong name or value must be refused at its place.
#include <cstring>

#include <gtest/gtest.h>

#include "run/Expectations.h"
#include "run/RecordLayout.h"
#include "run/ScenarioFile.h"

namespace steamext::run {
namespace {

using nlohmann::json;

// Test layouts only: the services describe their own.
constexpr RecordField kItemFields[] = {
    {"id", 0, FieldKind::UInt64},          {"title", 8, FieldKind::TextPointer},
    {"progress", 16, FieldKind::Float},    {"count", 20, FieldKind::UInt32},
    {"owned", 24, FieldKind::Bool8},       {"level", 28, FieldKind::Int32},
    {"tag", 32, FieldKind::FixedText, 32},
};
static_assert(FieldsFit(kItemFields, 64));
constexpr RecordLayout kItem = MakeLayout("item", 64, kItemFields);

constexpr RecordField kScoreFields[] = {
    {"score", 0, FieldKind::Int32},
    {"rank", 4, FieldKind::Int32},
    {"userName", 8, FieldKind::FixedText, 64},
    {"userId", 72, FieldKind::FixedText, 64},
    {"detailsSize", 136, FieldKind::Int32},
    {"details", 140, FieldKind::Int32Array, 47},
    {"reserved", 328, FieldKind::Int32},
};
static_assert(FieldsFit(kScoreFields, 332));
constexpr RecordLayout kScore = MakeLayout("score", 332, kScoreFields);

// Misplaced tables FieldsFit must refuse.
constexpr RecordField kPastTheEnd[] = {{"a", 60, FieldKind::UInt64}};
constexpr RecordField kOverlapping[] = {{"a", 0, FieldKind::UInt64}, {"b", 4, FieldKind::Int32}};
constexpr RecordField kMisaligned[] = {{"a", 2, FieldKind::Int32}};
static_assert(!FieldsFit(kPastTheEnd, 64) && !FieldsFit(kOverlapping, 64) && !FieldsFit(kMisaligned, 64));

TEST(RecordLayout, NamedFieldsLandAtTheirOffsetsAndComeBack)
{
    const std::string text =
        R"({"id": "76561197960287930", "title": "Sword", "progress": 0.5, "count": 4000000000,
                                 "owned": true, "level": -3, "tag": "blue"})";
    ScenarioFile file(text, "t.json");
    auto record = EncodeRecord(kItem, json::parse(text), file, "");
    const auto* bytes = static_cast<const unsigned char*>(record->Data());
    uint64_t id = 0;
    std::memcpy(&id, bytes, 8);
    EXPECT_EQ(id, 76561197960287930ull);
    const char* title = nullptr;
    std::memcpy(&title, bytes + 8, sizeof title);
    ASSERT_NE(title, nullptr);
    EXPECT_STREQ(title, "Sword");
    EXPECT_EQ(bytes[24], 1);
    EXPECT_STREQ(reinterpret_cast<const char*>(bytes + 32), "blue");

    json decoded = DecodeRecord(kItem, record->Data());
    EXPECT_EQ(decoded, (json{{"id", 76561197960287930ull},
                             {"title", "Sword"},
                             {"progress", 0.5},
                             {"count", 4000000000u},
                             {"owned", true},
                             {"level", -3},
                             {"tag", "blue"}}));

    // Fields left out are zero: a null text, an empty fixed text, zero details.
    ScenarioFile scoreFile(R"({"score": 7, "userName": "Ann", "details": [1, 2]})", "t.json");
    auto score =
        EncodeRecord(kScore, json{{"score", 7}, {"userName", "Ann"}, {"details", {1, 2}}}, scoreFile, "");
    json back = DecodeRecord(kScore, score->Data());
    EXPECT_EQ(back["score"], 7);
    EXPECT_EQ(back["userName"], "Ann");
    EXPECT_EQ(back["userId"], "");
    EXPECT_EQ(back["details"][1], 2);
    EXPECT_EQ(back["details"][46], 0);
    EXPECT_EQ(DecodeRecord(kItem, RecordBuffer(64).Data())["title"], nullptr);
}

TEST(RecordLayout, AKeptRecordIsReadWhereItLives)
{
    // The module fills the record after the call; a later read must see that.
    RecordBuffer held(64);
    KeptRecords kept;
    kept.Keep("item1", kItem, held.Data());
    kept.Keep("none", kItem, nullptr);
    EXPECT_EQ(kept.Read("item1")["level"], 0);
    int32_t level = 12;
    std::memcpy(static_cast<unsigned char*>(held.Data()) + 28, &level, 4);
    EXPECT_EQ(kept.Read("item1")["level"], 12);
    EXPECT_EQ(kept.Read("none"), nullptr);
    EXPECT_EQ(kept.Read("never kept"), nullptr);
}

TEST(RecordLayout, RefusesUnknownFieldsAndValuesOutOfRangeAtTheirPlace)
{
    std::string manyDetails = "{\"details\": [0";
    for (int i = 1; i < 48; ++i)
        manyDetails += "," + std::to_string(i);
    manyDetails += "]}";
    struct Row {
        const char* name;
        const RecordLayout* layout;
        std::string text;
        const char* message;
    } rows[] = {
        {"unknown field", &kItem, "{\"id\": 1,\n \"titel\": \"x\"}",
         "t.json:2:11: titel: the item record has no field \"titel\"; its fields: id, title, progress"},
        {"int32 too big", &kItem, "{\"level\": 2147483648}", "level: the integer 2147483648 is out of range"},
        {"uint32 negative", &kItem, "{\"count\": -1}", "count: expected a non-negative integer"},
        {"uint32 too big", &kItem, "{\"count\": 4294967296}",
         "count: the integer 4294967296 is out of range"},
        {"float too big", &kItem, "{\"progress\": 1e39}", "progress: the number 1e+39 is out of the range"},
        {"bool as number", &kItem, "{\"owned\": 1}", "owned: expected true or false"},
        {"fixed text without room for its end", &kItem, "{\"tag\": \"0123456789012345678901234567890123\"}",
         "tag: the text is 34 bytes; the field holds at most 31"},
        {"too many details", &kScore, manyDetails, "details: the field holds 47 integers, 48 are given"},
        {"detail of another kind", &kScore, "{\"details\": [1, \"2\"]}", "details[1]: expected an integer"},
        {"not an object", &kScore, "[1]", "(top level): expected an object"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        ScenarioFile file(row.text, "t.json");
        try {
            EncodeRecord(*row.layout, json::parse(row.text), file, "");
            ADD_FAILURE() << "accepted";
        } catch (const ScenarioError& error) {
            EXPECT_NE(std::string(error.what()).find(row.message), std::string::npos) << error.what();
        }
    }
}

TEST(RecordLayout, ExpectedRecordsCompareTheNamedFieldsAsTheModuleHoldsThem)
{
    ScenarioFile file(R"({"progress": 0.1, "title": "Sword"})", "t.json");
    Expectations e;
    e.result =
        json{{"record", CheckRecordPattern(kItem, json{{"progress", 0.1}, {"title", "Sword"}}, file, "")}};
    RecordBuffer held(64);
    auto record = EncodeRecord(kItem, json{{"progress", 0.1}, {"title", "Sword"}, {"id", 9u}}, file, "");
    auto outcomes = Evaluate(e, CallResult{DecodeRecord(kItem, record->Data()), std::nullopt}, {});
    ASSERT_EQ(outcomes.size(), 1u);
    EXPECT_TRUE(outcomes[0].passed) << outcomes[0].text;  // 0.1 as a float, whatever the id
    outcomes = Evaluate(e, CallResult{DecodeRecord(kItem, held.Data()), std::nullopt}, {});
    EXPECT_FALSE(outcomes[0].passed);
    outcomes = Evaluate(e, CallResult{nullptr, std::nullopt}, {});
    EXPECT_FALSE(outcomes[0].passed);
}

}  // namespace
}  // namespace steamext::run
