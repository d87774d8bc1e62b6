#include "simclient/Journal.h"

#include <atomic>

namespace simclient {

ThreadSerial ThisThreadSerial()
{
    static std::atomic<ThreadSerial> last{0};
    thread_local const ThreadSerial serial = last.fetch_add(1, std::memory_order_relaxed) + 1;
    return serial;
}

std::vector<JournalEntry> Journal::Calls(const std::string& name) const
{
    std::vector<JournalEntry> out;
    for (const JournalEntry& e : entries_)
        if (e.name == name)
            out.push_back(e);
    return out;
}

std::size_t Journal::Count(const std::string& name) const
{
    std::size_t n = 0;
    for (const JournalEntry& e : entries_)
        n += e.name == name ? e.count : 0;
    return n;
}

long Journal::IndexOf(const std::string& name) const
{
    for (std::size_t i = 0; i < entries_.size(); ++i)
        if (entries_[i].name == name)
            return static_cast<long>(i);
    return -1;
}

bool Journal::CalledBefore(const std::string& first, const std::string& second) const
{
    long a = IndexOf(first), b = IndexOf(second);
    return a >= 0 && b >= 0 && a < b;
}

std::vector<std::string> Journal::Names() const
{
    std::vector<std::string> out;
    for (const JournalEntry& e : entries_)
        out.push_back(e.name);
    return out;
}

}  // namespace simclient
