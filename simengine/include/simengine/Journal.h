// What the module did to the engine, in the order the engine saw it.
//
// Every call that matters to a test (events, log lines, engine commands, input
// calls, file opens, thread starts, and misuse the engine caught) becomes one
// typed record. Tests take a JournalView, a copy, and query it; a mark taken
// before a step gives "everything since the last step".
#pragma once

#include <array>
#include <cstdint>
#include <mutex>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace simengine {

enum class LogKind {
    Report,
    Log,
    Info
};

struct LogLine {
    LogKind kind;
    int32_t level;  // LogInfo lines carry 0
    std::string text;
    std::string thread;
};

// One 332-byte leaderboard row, copied out of the event's entries.
struct ScoreRow {
    std::string userId;
    std::string userName;
    int32_t score = 0;
    int32_t rank = 0;
    std::array<unsigned char, 188> details{};
    int32_t detailsSize = 0;
    int32_t reserved = 0;
};

struct StartupFields {  // type 17
    std::optional<std::string> playerId;
    std::optional<std::string> errorText;
};

struct ScoresFields {  // type 19
    std::optional<std::string> category;
    int32_t total = 0;
    int32_t filter = 0;
    int32_t start = 0;
    int32_t count = 0;
    bool entriesNull = true;
    std::vector<ScoreRow> rows;  // at most `count`, fewer if the block was too small
};

struct StoreFields {  // types 32, 33, 34
    std::optional<std::string> itemId;
    uint8_t itemState = 0;
    std::optional<std::string> purchaseId;
};

struct PostedEvent {
    int32_t type = 0;
    int32_t status = 0;
    std::array<unsigned char, 72> raw{};  // the record as posted, for any type
    std::string thread;
    std::optional<StartupFields> startup;
    std::optional<ScoresFields> scores;
    std::optional<StoreFields> store;
};

struct CommandCall {
    std::string command;
    std::optional<std::string> argument;
    std::optional<std::string> answer;
    std::string thread;
};

struct InputCall {
    enum class Kind {
        Button,
        Axis
    };
    Kind kind;
    int32_t inputId;
    int32_t buttonValue;  // Button calls
    float axisValue;      // Axis calls
};

struct FileOpenCall {
    std::string path;
    std::string mode;
    bool opened;
    bool inMemory;
};

struct ThreadStartCall {
    std::string name;
    int32_t flags;
};

// Misuse that the engine caught: a double release, an unknown handle, a text
// running past its block. A clean run has none.
struct EngineFault {
    std::string text;
    std::string thread;
};

using JournalRecord =
    std::variant<PostedEvent, LogLine, CommandCall, InputCall, FileOpenCall, ThreadStartCall, EngineFault>;

struct JournalEntry {
    uint64_t sequence;
    JournalRecord record;
};

// An immutable copy of part of the journal, with the queries tests need.
class JournalView {
public:
    JournalView() = default;
    explicit JournalView(std::vector<JournalEntry> entries) : entries_(std::move(entries)) {}

    const std::vector<JournalEntry>& Entries() const { return entries_; }

    std::vector<PostedEvent> Events() const;
    std::vector<PostedEvent> Events(int32_t type) const;
    std::vector<LogLine> Logs() const;
    std::vector<LogLine> Logs(LogKind kind) const;
    std::vector<LogLine> LogsAtLevel(int32_t level) const;
    std::vector<std::string> LogTexts() const;
    std::vector<CommandCall> Commands() const;
    std::vector<CommandCall> Commands(const std::string& command) const;
    // Texts given to "ShowPopup", in order; a null text shows as "".
    std::vector<std::string> Popups() const;
    std::vector<InputCall> Inputs() const;
    std::vector<FileOpenCall> FileOpens() const;
    std::vector<ThreadStartCall> ThreadStarts() const;
    std::vector<EngineFault> Faults() const;

private:
    template <typename T> std::vector<T> All() const
    {
        std::vector<T> found;
        for (const JournalEntry& entry : entries_)
            if (const T* record = std::get_if<T>(&entry.record))
                found.push_back(*record);
        return found;
    }

    std::vector<JournalEntry> entries_;
};

class Journal {
public:
    void Record(JournalRecord record);
    void Fault(std::string text);  // journals an EngineFault on the calling thread

    // The sequence number the next record will get; pass it to Since().
    uint64_t Mark() const;
    JournalView All() const;
    JournalView Since(uint64_t mark) const;
    // Drops the records; sequence numbers keep counting so old marks stay meaningful.
    void Clear();

private:
    mutable std::mutex mutex_;
    std::vector<JournalEntry> entries_;
    uint64_t nextSequence_ = 0;
};

}  // namespace simengine
