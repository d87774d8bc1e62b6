#include "EventDecoding.h"

#include <cstring>

#include "simengine/MemoryTracker.h"
#include "simengine/ThreadRegistry.h"

namespace simengine {

namespace {

// The engine reads events by position; these are the positions it reads.
constexpr size_t kStartupPlayerId = 8;
constexpr size_t kStartupErrorText = 16;

constexpr size_t kScoresCategory = 16;
constexpr size_t kScoresTotal = 24;
constexpr size_t kScoresFilter = 28;
constexpr size_t kScoresStart = 32;
constexpr size_t kScoresCount = 36;
constexpr size_t kScoresEntries = 40;

constexpr size_t kStoreItemId = 8;
constexpr size_t kStoreItemState = 16;
constexpr size_t kStorePurchaseId = 40;

// One ScoreEntry, 332 bytes apart in an array.
constexpr size_t kScoreEntrySize = 332;
constexpr size_t kEntryUserId = 0;
constexpr size_t kEntryUserName = 64;
constexpr size_t kEntryScore = 128;
constexpr size_t kEntryRank = 132;
constexpr size_t kEntryDetails = 136;
constexpr size_t kEntryDetailsSize = 324;
constexpr size_t kEntryReserved = 328;
constexpr size_t kEntryTextRoom = 64;

template <typename T> T ReadAt(const unsigned char* bytes, size_t offset)
{
    T value;
    std::memcpy(&value, bytes + offset, sizeof(T));
    return value;
}

class Decoder {
public:
    Decoder(const MemoryTracker& memory, Journal& journal) : memory_(memory), journal_(journal) {}

    // A text the event points at. Inside an Allocate block it must end within
    // the block; elsewhere (static texts of the module) it is trusted.
    std::optional<std::string> Text(const char* text, const char* field)
    {
        if (text == nullptr)
            return std::nullopt;
        size_t blockSize = 0;
        if (!memory_.FindAllocation(text, &blockSize))
            return std::string(text);
        size_t length = strnlen(text, blockSize);
        if (length == blockSize)
            journal_.Fault(std::string("event text '") + field + "' has no terminator inside its block");
        return std::string(text, length);
    }

    ScoresFields Scores(const unsigned char* raw)
    {
        ScoresFields fields;
        fields.category = Text(ReadAt<const char*>(raw, kScoresCategory), "category");
        fields.total = ReadAt<int32_t>(raw, kScoresTotal);
        fields.filter = ReadAt<int32_t>(raw, kScoresFilter);
        fields.start = ReadAt<int32_t>(raw, kScoresStart);
        fields.count = ReadAt<int32_t>(raw, kScoresCount);
        auto* entries = ReadAt<const unsigned char*>(raw, kScoresEntries);
        fields.entriesNull = entries == nullptr;
        if (entries == nullptr || fields.count <= 0)
            return fields;

        size_t rows = static_cast<size_t>(fields.count);
        size_t blockSize = 0;
        if (memory_.FindAllocation(entries, &blockSize) && blockSize / kScoreEntrySize < rows) {
            journal_.Fault("score event count " + std::to_string(fields.count) +
                           " exceeds its entries block of " + std::to_string(blockSize) + " bytes");
            rows = blockSize / kScoreEntrySize;
        }
        for (size_t i = 0; i < rows; ++i)
            fields.rows.push_back(Row(entries + i * kScoreEntrySize));
        return fields;
    }

private:
    std::string FixedText(const unsigned char* bytes, const char* field)
    {
        const char* text = reinterpret_cast<const char*>(bytes);
        size_t length = strnlen(text, kEntryTextRoom);
        if (length == kEntryTextRoom)
            journal_.Fault(std::string("score row ") + field + " fills all 64 bytes with no terminator");
        return std::string(text, length);
    }

    ScoreRow Row(const unsigned char* entry)
    {
        ScoreRow row;
        row.userId = FixedText(entry + kEntryUserId, "userId");
        row.userName = FixedText(entry + kEntryUserName, "userName");
        row.score = ReadAt<int32_t>(entry, kEntryScore);
        row.rank = ReadAt<int32_t>(entry, kEntryRank);
        std::memcpy(row.details.data(), entry + kEntryDetails, row.details.size());
        row.detailsSize = ReadAt<int32_t>(entry, kEntryDetailsSize);
        row.reserved = ReadAt<int32_t>(entry, kEntryReserved);
        return row;
    }

    const MemoryTracker& memory_;
    Journal& journal_;
};

}  // namespace

PostedEvent DecodeEvent(const HostEvent& event, const MemoryTracker& memory, Journal& journal)
{
    PostedEvent posted;
    std::memcpy(posted.raw.data(), &event, sizeof(HostEvent));
    const unsigned char* raw = posted.raw.data();
    posted.type = event.type;
    posted.status = event.status;
    posted.thread = ThreadRegistry::CurrentName();

    Decoder decode(memory, journal);
    switch (event.type) {
    case kEventSteamStartup:
        posted.startup = StartupFields{decode.Text(ReadAt<const char*>(raw, kStartupPlayerId), "PlayerId"),
                                       decode.Text(ReadAt<const char*>(raw, kStartupErrorText), "ErrorText")};
        break;
    case kEventLeaderboardScores:
        posted.scores = decode.Scores(raw);
        break;
    case kEventStoreStarted:
    case kEventStoreItemState:
    case kEventStorePurchaseOutcome:
        posted.store = StoreFields{decode.Text(ReadAt<const char*>(raw, kStoreItemId), "itemId"),
                                   ReadAt<uint8_t>(raw, kStoreItemState),
                                   decode.Text(ReadAt<const char*>(raw, kStorePurchaseId), "purchaseId")};
        break;
    default:
        // Type 42 carries its status only; unknown types keep their raw bytes.
        break;
    }
    return posted;
}

}  // namespace simengine
