#include "simengine/Journal.h"

#include "simengine/ThreadRegistry.h"

namespace simengine {

std::vector<PostedEvent> JournalView::Events() const
{
    return All<PostedEvent>();
}

std::vector<PostedEvent> JournalView::Events(int32_t type) const
{
    std::vector<PostedEvent> found;
    for (PostedEvent& event : All<PostedEvent>())
        if (event.type == type)
            found.push_back(std::move(event));
    return found;
}

std::vector<LogLine> JournalView::Logs() const
{
    return All<LogLine>();
}

std::vector<LogLine> JournalView::Logs(LogKind kind) const
{
    std::vector<LogLine> found;
    for (LogLine& line : All<LogLine>())
        if (line.kind == kind)
            found.push_back(std::move(line));
    return found;
}

std::vector<LogLine> JournalView::LogsAtLevel(int32_t level) const
{
    std::vector<LogLine> found;
    for (LogLine& line : All<LogLine>())
        if (line.level == level)
            found.push_back(std::move(line));
    return found;
}

std::vector<std::string> JournalView::LogTexts() const
{
    std::vector<std::string> texts;
    for (LogLine& line : All<LogLine>())
        texts.push_back(std::move(line.text));
    return texts;
}

std::vector<CommandCall> JournalView::Commands() const
{
    return All<CommandCall>();
}

std::vector<CommandCall> JournalView::Commands(const std::string& command) const
{
    std::vector<CommandCall> found;
    for (CommandCall& call : All<CommandCall>())
        if (call.command == command)
            found.push_back(std::move(call));
    return found;
}

std::vector<std::string> JournalView::Popups() const
{
    std::vector<std::string> texts;
    for (CommandCall& call : Commands("ShowPopup"))
        texts.push_back(call.argument.value_or(""));
    return texts;
}

std::vector<InputCall> JournalView::Inputs() const
{
    return All<InputCall>();
}
std::vector<FileOpenCall> JournalView::FileOpens() const
{
    return All<FileOpenCall>();
}
std::vector<ThreadStartCall> JournalView::ThreadStarts() const
{
    return All<ThreadStartCall>();
}
std::vector<EngineFault> JournalView::Faults() const
{
    return All<EngineFault>();
}

void Journal::Record(JournalRecord record)
{
    std::lock_guard<std::mutex> lock(mutex_);
    entries_.push_back(JournalEntry{nextSequence_++, std::move(record)});
}

void Journal::Fault(std::string text)
{
    Record(EngineFault{std::move(text), ThreadRegistry::CurrentName()});
}

uint64_t Journal::Mark() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return nextSequence_;
}

JournalView Journal::All() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return JournalView(entries_);
}

JournalView Journal::Since(uint64_t mark) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    std::vector<JournalEntry> recent;
    for (const JournalEntry& entry : entries_)
        if (entry.sequence >= mark)
            recent.push_back(entry);
    return JournalView(std::move(recent));
}

void Journal::Clear()
{
    std::lock_guard<std::mutex> lock(mutex_);
    entries_.clear();
}

}  // namespace simengine
