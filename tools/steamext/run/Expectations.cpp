#include "run/Expectations.h"

#include <algorithm>

#include "run/Base64.h"
#include "run/Records.h"

namespace steamext::run {

using nlohmann::json;

namespace {

std::vector<json> OfKind(const std::vector<json>& records, const char* kind)
{
    std::vector<json> found;
    for (const auto& record : records)
        if (record.value("kind", "") == kind)
            found.push_back(record);
    return found;
}

// What a step saw of one kind, for a failure message; long lists are cut.
std::string Seen(const std::vector<json>& records)
{
    if (records.empty())
        return "none";
    std::string out;
    std::size_t shown = std::min<std::size_t>(records.size(), 8);
    for (std::size_t i = 0; i < shown; ++i)
        out += (i ? "; " : "") + DescribeRecord(records[i]);
    if (records.size() > shown)
        out += "; ... " + std::to_string(records.size() - shown) + " more";
    return out;
}

std::string ShowBytes(const std::string& bytes)
{
    bool printable = std::all_of(bytes.begin(), bytes.end(),
                                 [](char c) { return (c >= 0x20 && c < 0x7F) || c == '\n' || c == '\t'; });
    return printable ? Compact(json(bytes)) : "base64 " + EncodeBase64(bytes);
}

void InOrder(const std::vector<json>& patterns, const std::vector<json>& seen, const std::string& what,
             std::vector<CheckOutcome>& out)
{
    std::vector<json> ordered;
    for (const auto& pattern : patterns) {
        if (pattern.contains("count")) {
            // A platform call repeated in a row is one record with a "count".
            long count = 0;
            for (const json& r : seen)
                count += MatchesPattern(r, pattern) ? r.value("count", 1L) : 0L;
            int wanted = pattern["count"].get<int>();
            json shown = pattern;
            shown.erase("count");
            std::string text = what + " " + Compact(shown) + " " + std::to_string(wanted) + " time(s)";
            out.push_back({count == wanted, count == wanted ? text
                                                            : text + ", saw it " + std::to_string(count) +
                                                                  " time(s): " + Seen(seen)});
        } else {
            ordered.push_back(pattern);
        }
    }
    if (ordered.empty())
        return;
    std::size_t at = 0;
    for (std::size_t i = 0; i < ordered.size(); ++i) {
        while (at < seen.size() && !MatchesPattern(seen[at], ordered[i]))
            ++at;
        if (at == seen.size()) {
            std::string text = what + " " + Compact(ordered[i]);
            if (ordered.size() > 1)
                text += " (" + std::to_string(i + 1) + " of " + std::to_string(ordered.size()) + " in order)";
            out.push_back({false, text + ", saw: " + Seen(seen)});
            return;
        }
        ++at;
    }
    std::string list;
    for (const auto& pattern : ordered)
        list += (list.empty() ? "" : ", ") + Compact(pattern);
    out.push_back({true, what + (ordered.size() > 1 ? " in order " : " ") + list});
}

void NoneOf(const std::vector<json>& patterns, const std::vector<json>& seen, const std::string& what,
            std::vector<CheckOutcome>& out)
{
    for (const auto& pattern : patterns) {
        auto hit =
            std::find_if(seen.begin(), seen.end(), [&](const json& r) { return MatchesPattern(r, pattern); });
        std::string text = "no " + what + " " + Compact(pattern);
        out.push_back({hit == seen.end(), hit == seen.end() ? text : text + ", saw " + DescribeRecord(*hit)});
    }
}

std::string WithoutSpaces(std::string text)
{
    text.erase(std::remove(text.begin(), text.end(), ' '), text.end());
    return text;
}

}  // namespace

std::string ShowResult(const CallResult& result, ResultType type)
{
    switch (type) {
    case ResultType::None:
        return "";
    case ResultType::Buffer:
        return result.bytes ? "buffer of " + std::to_string(result.bytes->size()) + " bytes " +
                                  ShowBytes(*result.bytes)
                            : "null";
    default:
        return Compact(result.value);
    }
}

std::vector<CheckOutcome> Evaluate(const Expectations& expect, const std::optional<CallResult>& result,
                                   const std::vector<json>& records)
{
    std::vector<CheckOutcome> out;
    if (expect.result && result) {
        const json& wanted = *expect.result;
        bool passed;
        std::string shownWanted;
        std::string shownSeen;
        if (wanted.is_object() && wanted.contains("bytes")) {
            const std::string bytes = wanted["bytes"].get<std::string>();
            passed = result->bytes && *result->bytes == bytes;
            shownWanted = "buffer " + ShowBytes(bytes);
            shownSeen = result->bytes ? "buffer " + ShowBytes(*result->bytes) : "null";
        } else if (wanted.is_object() && wanted.contains("record")) {
            // The fields named; the record's others may hold anything.
            passed = result->value.is_object();
            for (const auto& field : wanted["record"].items())
                passed = passed && result->value.contains(field.key()) &&
                         result->value[field.key()] == field.value();
            shownWanted = "record with " + Compact(wanted["record"]);
            shownSeen = Compact(result->value);
        } else if (wanted.is_null() && result->bytes) {
            passed = false;
            shownWanted = "null";
            shownSeen = "buffer " + ShowBytes(*result->bytes);
        } else {
            passed = result->value == wanted;
            shownWanted = Compact(wanted);
            shownSeen = Compact(result->value);
        }
        out.push_back({passed, "result " + shownWanted + (passed ? "" : ", saw " + shownSeen)});
    }
    if (expect.events) {
        std::vector<json> events = OfKind(records, "event");
        bool passed = events.size() == expect.events->size();
        for (std::size_t i = 0; passed && i < events.size(); ++i)
            passed = MatchesPattern(events[i], (*expect.events)[i]);
        std::string list;
        for (const auto& pattern : *expect.events)
            list += (list.empty() ? "" : ", ") + Compact(pattern);
        std::string text = expect.events->empty() ? "no events" : "events exactly " + list;
        out.push_back({passed, passed ? text : text + ", saw: " + Seen(events)});
    }
    std::vector<json> logs = OfKind(records, "log");
    std::vector<json> calls = OfKind(records, "platform_call");
    InOrder(expect.logs, logs, "log", out);
    NoneOf(expect.noLogs, logs, "log", out);
    InOrder(expect.platformCalls, calls, "platform call", out);
    NoneOf(expect.noPlatformCalls, calls, "platform call", out);
    InOrder(expect.hostCommands, OfKind(records, "host_command"), "engine command", out);
    if (expect.inputButtons || expect.inputAxes) {
        std::vector<int> buttons;
        std::vector<int> axes;
        for (const auto& input : OfKind(records, "input"))
            (input.value("call", "") == "SetInputButton" ? buttons : axes).push_back(input.value("id", 0));
        auto check = [&out](const std::optional<std::string>& wanted, const std::vector<int>& ids,
                            const char* what) {
            if (!wanted)
                return;
            std::string seen = IdRanges(ids);
            bool passed = WithoutSpaces(*wanted) == seen;
            std::string text = std::string(what) + " " + (wanted->empty() ? "none" : *wanted);
            out.push_back({passed, passed ? text : text + ", saw " + (seen.empty() ? "none" : seen)});
        };
        check(expect.inputButtons, buttons, "input buttons cleared");
        check(expect.inputAxes, axes, "input axes cleared");
    }
    return out;
}

}  // namespace steamext::run
