// Posted events are read by position and copied out, so a test sees what the
// engine would read even after the module has reused its memory.
#include <cstring>

#include "EngineFixture.h"

using simengine::PostedEvent;

namespace {

constexpr size_t kScoreEntrySize = 332;

template <typename T> void WriteAt(void* base, size_t offset, T value)
{
    std::memcpy(static_cast<unsigned char*>(base) + offset, &value, sizeof(T));
}

char* AllocateText(HostServices* table, const char* text)
{
    auto* copy = static_cast<char*>(table->Allocate(static_cast<int32_t>(std::strlen(text) + 1)));
    std::strcpy(copy, text);
    return copy;
}

void WriteScoreRow(unsigned char* entry, const char* userId, const char* userName, int32_t score,
                   int32_t rank)
{
    std::memset(entry, 0, kScoreEntrySize);
    std::strcpy(reinterpret_cast<char*>(entry), userId);
    std::strcpy(reinterpret_cast<char*>(entry + 64), userName);
    WriteAt(entry, 128, score);
    WriteAt(entry, 132, rank);
    for (size_t i = 0; i < 188; ++i)
        entry[136 + i] = static_cast<unsigned char>(i);
    WriteAt(entry, 324, int32_t{188});
}

}  // namespace

using EventDecodingTest = EngineTest;

TEST_F(EventDecodingTest, StartupEventCopiesBothTexts)
{
    // Catches texts kept by pointer: the module's buffer is overwritten after posting.
    char playerId[64] = "-12345";
    HostEvent event;
    table->InitEvent(&event, kEventSteamStartup);
    event.status = 1;
    WriteAt(event.payload, 0, static_cast<const char*>(playerId));
    table->PostEvent(&event);
    std::strcpy(playerId, "changed");

    std::vector<PostedEvent> events = engine.Records().All().Events(kEventSteamStartup);
    ASSERT_EQ(events.size(), 1u);
    ASSERT_TRUE(events[0].startup.has_value());
    EXPECT_EQ(events[0].status, 1);
    EXPECT_EQ(events[0].startup->playerId, "-12345");
    EXPECT_FALSE(events[0].startup->errorText.has_value());
}

TEST_F(EventDecodingTest, ScoreEventCopiesEveryRecord)
{
    // Catches a wrong stride or field offset in the 332-byte records.
    auto* entries = static_cast<unsigned char*>(table->Allocate(2 * kScoreEntrySize));
    WriteScoreRow(entries, "-1", "Anna", 900, 1);
    WriteScoreRow(entries + kScoreEntrySize, "77", "Bob", 800, 2);
    HostEvent event{};
    event.type = kEventLeaderboardScores;
    event.status = 1;
    WriteAt(&event, 16, AllocateText(table, "Speedrun"));
    WriteAt(&event, 24, int32_t{40});
    WriteAt(&event, 28, int32_t{1});
    WriteAt(&event, 32, int32_t{1});
    WriteAt(&event, 36, int32_t{2});
    WriteAt(&event, 40, entries);
    table->PostEvent(&event);

    std::vector<PostedEvent> events = engine.Records().All().Events(kEventLeaderboardScores);
    ASSERT_EQ(events.size(), 1u);
    const auto& scores = *events[0].scores;
    EXPECT_EQ(scores.category, "Speedrun");
    EXPECT_EQ(scores.total, 40);
    EXPECT_EQ(scores.filter, 1);
    EXPECT_EQ(scores.start, 1);
    EXPECT_EQ(scores.count, 2);
    EXPECT_FALSE(scores.entriesNull);
    ASSERT_EQ(scores.rows.size(), 2u);
    EXPECT_EQ(scores.rows[0].userId, "-1");
    EXPECT_EQ(scores.rows[0].userName, "Anna");
    EXPECT_EQ(scores.rows[1].userId, "77");
    EXPECT_EQ(scores.rows[1].userName, "Bob");
    EXPECT_EQ(scores.rows[1].score, 800);
    EXPECT_EQ(scores.rows[1].rank, 2);
    EXPECT_EQ(scores.rows[1].details[187], 187);
    EXPECT_EQ(scores.rows[1].detailsSize, 188);
    EXPECT_EQ(scores.rows[1].reserved, 0);
}

TEST_F(EventDecodingTest, ScoreCountBeyondItsBlockIsAFault)
{
    // Catches reading past an Allocate block when the count says more rows than exist.
    expectFaults = true;
    auto* entries = static_cast<unsigned char*>(table->Allocate(kScoreEntrySize));
    WriteScoreRow(entries, "5", "Solo", 10, 3);
    HostEvent event{};
    event.type = kEventLeaderboardScores;
    WriteAt(&event, 36, int32_t{3});
    WriteAt(&event, 40, entries);
    table->PostEvent(&event);

    std::vector<PostedEvent> events = engine.Records().All().Events(kEventLeaderboardScores);
    ASSERT_EQ(events.size(), 1u);
    const auto& scores = *events[0].scores;
    EXPECT_FALSE(scores.category.has_value());
    EXPECT_EQ(scores.count, 3);
    EXPECT_EQ(scores.rows.size(), 1u);
    EXPECT_EQ(engine.Records().All().Faults().size(), 1u);
}

TEST_F(EventDecodingTest, StoreEventsDecodeTheirFields)
{
    // Catches itemState read from the wrong byte or purchaseId from the wrong slot.
    struct Row {
        const char* name;
        int32_t type;
        const char* itemId;
        uint8_t itemState;
        const char* purchaseId;
    } rows[] = {
        {"started", kEventStoreStarted, nullptr, 0, nullptr},
        {"item state", kEventStoreItemState, "dlc_a", 2, nullptr},
        {"purchase ok", kEventStorePurchaseOutcome, "dlc_b", 1, "dlc_b"},
        {"purchase failed", kEventStorePurchaseOutcome, nullptr, 0, nullptr},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        engine.Records().Clear();
        HostEvent event;
        table->InitEvent(&event, row.type);
        event.status = 1;
        WriteAt(event.payload, 0, row.itemId != nullptr ? AllocateText(table, row.itemId) : nullptr);
        WriteAt(event.payload, 8, row.itemState);
        WriteAt(event.payload, 32, row.purchaseId != nullptr ? AllocateText(table, row.purchaseId) : nullptr);
        table->PostEvent(&event);

        std::vector<PostedEvent> events = engine.Records().All().Events(row.type);
        ASSERT_EQ(events.size(), 1u);
        ASSERT_TRUE(events[0].store.has_value());
        EXPECT_EQ(events[0].store->itemId.has_value(), row.itemId != nullptr);
        if (row.itemId != nullptr) {
            EXPECT_EQ(*events[0].store->itemId, row.itemId);
        }
        EXPECT_EQ(events[0].store->itemState, row.itemState);
        EXPECT_EQ(events[0].store->purchaseId.has_value(), row.purchaseId != nullptr);
    }
}

TEST_F(EventDecodingTest, OtherTypesKeepStatusAndRawBytes)
{
    // Catches decoding applied to types that define no pointers (42) or are unknown,
    // and an InitEvent that leaves the poster's stack garbage in the payload.
    for (int32_t type : {int32_t{kEventWorkshopPublished}, int32_t{99}}) {
        SCOPED_TRACE(type);
        engine.Records().Clear();
        HostEvent event;
        std::memset(&event, 0xAB, sizeof(event));
        table->InitEvent(&event, type);
        EXPECT_EQ(event.status, 0);
        event.status = 1;
        event.payload[63] = 0x5A;
        table->PostEvent(&event);

        std::vector<PostedEvent> events = engine.Records().All().Events(type);
        ASSERT_EQ(events.size(), 1u);
        EXPECT_EQ(events[0].status, 1);
        EXPECT_FALSE(events[0].startup || events[0].scores || events[0].store);
        for (size_t i = 8; i < 71; ++i)
            ASSERT_EQ(events[0].raw[i], 0) << "byte " << i;
        EXPECT_EQ(events[0].raw[71], 0x5A);
    }
}
