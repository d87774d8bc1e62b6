// Record of every SDK call the code under test made, in order, with the calling thread.
#ifndef SIMCLIENT_JOURNAL_H
#define SIMCLIENT_JOURNAL_H

#include <cstddef>
#include <string>
#include <thread>
#include <vector>

namespace simclient {

struct JournalEntry {
    std::string name;  // method name without interface, e.g. "FileWrite", "SteamAPI_Init"
    std::string args;  // arguments as text, comma-separated; strings quoted, null as null
    std::thread::id thread;
};

// A snapshot of the journal; cheap queries for tests.
class Journal {
public:
    Journal() = default;
    explicit Journal(std::vector<JournalEntry> entries) : entries_(std::move(entries)) {}

    const std::vector<JournalEntry>& Entries() const { return entries_; }
    std::size_t Size() const { return entries_.size(); }

    std::vector<JournalEntry> Calls(const std::string& name) const;
    std::size_t Count(const std::string& name) const;
    // Index of the first call named `name`, or -1.
    long IndexOf(const std::string& name) const;
    // True when some call `first` precedes the first call `second` (and both happened).
    bool CalledBefore(const std::string& first, const std::string& second) const;
    // Names only, in order; handy for EXPECT_EQ on whole sequences.
    std::vector<std::string> Names() const;

private:
    std::vector<JournalEntry> entries_;
};

}  // namespace simclient

#endif  // SIMCLIENT_JOURNAL_H
