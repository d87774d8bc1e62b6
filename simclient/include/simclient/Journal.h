// Record of every SDK call the code under test made, in order, with the calling thread.
// A call identical to the entry before it (same name, arguments and thread) is folded
// into that entry by counting it, so a thread polling in a loop costs one entry.
#ifndef SIMCLIENT_JOURNAL_H
#define SIMCLIENT_JOURNAL_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace simclient {

// Each thread that calls gets a number of its own, never reused while the process lives:
// a system may hand a finished thread's std::thread::id to a later thread.
using ThreadSerial = uint64_t;
ThreadSerial ThisThreadSerial();

struct JournalEntry {
    std::string name;  // method name without interface, e.g. "FileWrite", "SteamAPI_Init"
    std::string args;  // arguments as text, comma-separated; strings quoted, null as null
    ThreadSerial thread = 0;
    uint64_t count = 1;  // identical calls in a row folded into this entry
};

// A position in the live journal, for reading only what came after it
// (World::JournalMark / World::JournalSince).
struct JournalMark {
    uint64_t epoch = 0;      // which journal: ClearJournal and Reset start a new one
    std::size_t end = 0;     // entries before this index have been read...
    uint64_t lastCount = 0;  // ...the last of them with this many repeats
};

// A snapshot of the journal; cheap queries for tests.
class Journal {
public:
    Journal() = default;
    explicit Journal(std::vector<JournalEntry> entries) : entries_(std::move(entries)) {}

    const std::vector<JournalEntry>& Entries() const { return entries_; }
    std::size_t Size() const { return entries_.size(); }

    // Entries named `name`, in order (an entry's `count` tells its repeats).
    std::vector<JournalEntry> Calls(const std::string& name) const;
    // Calls named `name`, folded repeats included.
    std::size_t Count(const std::string& name) const;
    // Index of the first call named `name`, or -1.
    long IndexOf(const std::string& name) const;
    // True when some call `first` precedes the first call `second` (and both happened).
    bool CalledBefore(const std::string& first, const std::string& second) const;
    // Names only, in order, one per entry (folded repeats appear once); handy for EXPECT_EQ on whole sequences.
    std::vector<std::string> Names() const;

private:
    std::vector<JournalEntry> entries_;
};

}  // namespace simclient

#endif  // SIMCLIENT_JOURNAL_H
