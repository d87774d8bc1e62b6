#include "run/Timeline.h"

#include <algorithm>
#include <cstdio>

#include "run/Records.h"

namespace steamext::run {

using nlohmann::json;

namespace {

// ---------------------------------------------------------------- readable

class ReadableTimeline : public Timeline {
public:
    ReadableTimeline(std::ostream& out, bool colour, bool verbose)
        : out_(out), colour_(colour), verbose_(verbose)
    {
    }

    void Begin(const std::string& scenario, const std::string& description,
               const std::string& module) override
    {
        out_ << Paint(kBold, "steamext run: " + scenario) << "\n";
        if (!description.empty())
            out_ << "  " << description << "\n";
        out_ << Paint(kDim, "  module " + module) << "\n\n";
        out_ << Paint(kDim, " frame     clock") << "\n";
    }

    void Phase(const Moment& at, const std::string& title) override
    {
        FlushGathered();
        out_ << Prefix(at) << Paint(kBold, "-- " + title + " --") << "\n";
    }

    void Step(const Moment& at, std::size_t index, const std::string& headline, const std::string& note,
              const json&) override
    {
        FlushGathered();
        if (!note.empty())
            out_ << Blank() << Paint(kDim, "# " + note) << "\n";
        out_ << Prefix(at) << Paint(kBold, "#" + std::to_string(index) + " ") << Paint(kCyan, headline)
             << "\n";
        out_.flush();  // a step that waits shows what it waits for at once
    }

    void Outcome(const Moment&, const std::string& text) override
    {
        FlushGathered();
        out_ << Blank() << "  " << text << "\n";
    }

    void Record(const Moment&, const json& record) override
    {
        const std::string kind = record.value("kind", "");
        if (kind == "input") {
            // Hundreds of calls per overlay change: gathered into runs of ids.
            bool button = record.value("call", "") == "SetInputButton";
            (button ? buttons_ : axes_).push_back(record.value("id", 0));
            if (record.value("value", 0.0) != 0.0)
                nonZero_ = true;
            return;
        }
        if (kind == "platform_call") {
            if (!verbose_)
                return;
            // A pump per frame: repeated calls are counted, not listed.
            std::string line = DescribeRecord(record);
            if (line == repeated_) {
                ++repeats_;
                return;
            }
            FlushGathered();
            repeated_ = line;
            out_ << Blank() << "  " << Paint(kDim, line) << "\n";
            return;
        }
        FlushGathered();
        const char* colour = kind == "event" ? kMagenta : "";
        if (kind == "log") {
            int level = record.value("level", 0);
            colour = level == 1 ? kYellow : level >= 2 ? kRed : "";
        }
        const std::string text = DescribeRecord(record);
        for (std::size_t from = 0, to = 0; from <= text.size(); from = to + 1) {
            to = std::min(text.find('\n', from), text.size());
            out_ << Blank() << "  " << Paint(colour, text.substr(from, to - from)) << "\n";
        }
    }

    void Check(std::size_t, bool passed, const std::string& text) override
    {
        FlushGathered();
        if (passed)
            out_ << Blank() << "  " << Paint(kGreen, "ok    ") << text << "\n";
        else
            out_ << Blank() << "  " << Paint(kRed, "FAILED " + text) << "\n";
    }

    void End(const RunSummary& s) override
    {
        FlushGathered();
        out_ << "\n"
             << Paint(kBold, "Summary") << "  (" << s.end.frame << " frames, engine clock " << s.end.clockMs
             << " ms)\n";
        std::string events;
        for (const auto& entry : s.eventsByType)
            events += (events.empty() ? "" : ", ") +
                      ("type " + std::to_string(entry.first) + " x" + std::to_string(entry.second));
        out_ << "  events posted     " << (events.empty() ? "none" : events) << "\n";
        out_ << "  logged            "
             << Paint(s.warnings ? kYellow : "", std::to_string(s.warnings) + " warning(s)") << ", "
             << Paint(s.errors ? kRed : "", std::to_string(s.errors) + " error(s)") << "\n";
        out_ << "  platform calls    " << s.platformCalls << (verbose_ ? "" : "  (-v lists them)") << "\n";
        out_ << "  expectations      " << Paint(kGreen, std::to_string(s.passed) + " passed") << ", "
             << Paint(s.failed ? kRed : "", std::to_string(s.failed) + " failed") << "\n";
        for (const auto& failure : s.failures)
            out_ << "    " << Paint(kRed, failure) << "\n";
        out_.flush();
    }

private:
    static constexpr const char* kBold = "\033[1m";
    static constexpr const char* kDim = "\033[2m";
    static constexpr const char* kRed = "\033[31m";
    static constexpr const char* kGreen = "\033[32m";
    static constexpr const char* kYellow = "\033[33m";
    static constexpr const char* kMagenta = "\033[35m";
    static constexpr const char* kCyan = "\033[36m";

    std::string Paint(const char* colour, const std::string& text) const
    {
        if (!colour_ || colour == nullptr || *colour == '\0')
            return text;
        return colour + text + "\033[0m";
    }

    std::string Prefix(const Moment& at) const
    {
        char buffer[48];
        std::snprintf(buffer, sizeof buffer, "%6llu %7u ms  ", static_cast<unsigned long long>(at.frame),
                      at.clockMs);
        return Paint(kDim, buffer);
    }

    static std::string Blank() { return std::string(19, ' '); }

    // Called before anything else is written: what was gathered up goes out first.
    void FlushGathered()
    {
        if (repeats_ > 0)
            out_ << Blank() << "  " << Paint(kDim, "... and " + std::to_string(repeats_) + " more time(s)")
                 << "\n";
        repeats_ = 0;
        repeated_.clear();
        if (buttons_.empty() && axes_.empty())
            return;
        std::string line =
            "inputs cleared" + std::string(nonZero_ ? " (some to a value other than 0)" : "") + ":";
        if (!buttons_.empty())
            line += " " + std::to_string(buttons_.size()) + " buttons " + IdRanges(buttons_) + ";";
        if (!axes_.empty())
            line += " " + std::to_string(axes_.size()) + " axes " + IdRanges(axes_);
        out_ << Blank() << "  " << line << "\n";
        buttons_.clear();
        axes_.clear();
        nonZero_ = false;
    }

    std::ostream& out_;
    bool colour_;
    bool verbose_;
    std::vector<int> buttons_;
    std::vector<int> axes_;
    bool nonZero_ = false;
    std::string repeated_;
    int repeats_ = 0;
};

// ---------------------------------------------------------------- JSON lines

class JsonTimeline : public Timeline {
public:
    explicit JsonTimeline(std::ostream& out) : out_(out) {}

    void Begin(const std::string& scenario, const std::string& description,
               const std::string& module) override
    {
        Write({{"kind", "run"}, {"scenario", scenario}, {"description", description}, {"module", module}});
    }

    void Phase(const Moment& at, const std::string& title) override
    {
        step_ = 0;
        Write(At(at, {{"kind", "phase"}, {"title", title}}));
    }

    void Step(const Moment& at, std::size_t index, const std::string& headline, const std::string& note,
              const json& detail) override
    {
        step_ = index;
        json line = At(at, {{"kind", "step"}, {"step", index}, {"headline", headline}});
        if (!note.empty())
            line["note"] = note;
        for (const auto& item : detail.items())
            line[item.key()] = item.value();
        Write(line);
    }

    void Outcome(const Moment& at, const std::string& text) override
    {
        Write(At(at, {{"kind", "outcome"}, {"step", step_}, {"text", text}}));
    }

    void Record(const Moment& at, const json& record) override
    {
        json line = At(at, record);
        line["step"] = step_;
        Write(line);
    }

    void Check(std::size_t step, bool passed, const std::string& text) override
    {
        Write({{"kind", "check"}, {"step", step}, {"passed", passed}, {"text", text}});
    }

    void End(const RunSummary& s) override
    {
        json events = json::object();
        for (const auto& entry : s.eventsByType)
            events[std::to_string(entry.first)] = entry.second;
        Write({{"kind", "summary"},
               {"frames", s.end.frame},
               {"clock_ms", s.end.clockMs},
               {"events", events},
               {"warnings", s.warnings},
               {"errors", s.errors},
               {"platform_calls", s.platformCalls},
               {"passed", s.passed},
               {"failed", s.failed},
               {"failures", s.failures}});
        out_.flush();
    }

private:
    static json At(const Moment& at, json line)
    {
        line["frame"] = at.frame;
        line["clock_ms"] = at.clockMs;
        return line;
    }

    void Write(const json& line) { out_ << Compact(line) << "\n"; }

    std::ostream& out_;
    std::size_t step_ = 0;
};

}  // namespace

std::unique_ptr<Timeline> MakeReadableTimeline(std::ostream& out, bool colour, bool verbose)
{
    return std::make_unique<ReadableTimeline>(out, colour, verbose);
}

std::unique_ptr<Timeline> MakeJsonTimeline(std::ostream& out)
{
    return std::make_unique<JsonTimeline>(out);
}

}  // namespace steamext::run
