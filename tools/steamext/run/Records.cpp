#include "run/Records.h"

namespace steamext::run {

using nlohmann::json;

namespace {

// A value matches when equal; an object in an array (a row of an event) is a pattern of
// its own, so that rows can be checked by some of their fields.
bool Matches(const json& value, const json& pattern)
{
    if (!pattern.is_array() || !value.is_array() || pattern.size() != value.size())
        return value == pattern;
    for (std::size_t i = 0; i < pattern.size(); ++i) {
        const bool rowPattern = pattern[i].is_object() && value[i].is_object();
        if (rowPattern ? !MatchesPattern(value[i], pattern[i]) : value[i] != pattern[i])
            return false;
    }
    return true;
}

}  // namespace

bool MatchesPattern(const json& record, const json& pattern)
{
    static const std::string kContains = "_contains";
    for (const auto& item : pattern.items()) {
        const std::string& key = item.key();
        if (key == "count")
            continue;
        if (key.size() > kContains.size() &&
            key.compare(key.size() - kContains.size(), kContains.size(), kContains) == 0) {
            std::string field = key.substr(0, key.size() - kContains.size());
            auto found = record.find(field);
            if (found == record.end() || !found->is_string() ||
                found->get_ref<const std::string&>().find(item.value().get<std::string>()) ==
                    std::string::npos)
                return false;
            continue;
        }
        auto found = record.find(key);
        if (found == record.end() || !Matches(*found, item.value()))
            return false;
    }
    return true;
}

std::string IdRanges(const std::vector<int>& ids)
{
    std::string out;
    std::size_t i = 0;
    while (i < ids.size()) {
        std::size_t j = i;
        while (j + 1 < ids.size() && ids[j + 1] == ids[j] + 1)
            ++j;
        out += (out.empty() ? "" : ",") + std::to_string(ids[i]);
        if (j > i)
            out += "-" + std::to_string(ids[j]);
        i = j + 1;
    }
    return out;
}

std::string Compact(const json& value)
{
    return value.dump(-1, ' ', false, json::error_handler_t::replace);
}

std::string DescribeRecord(const json& record)
{
    const std::string kind = record.value("kind", "");
    if (kind == "event") {
        std::string line = "event " + std::to_string(record.value("type", 0));
        const json* rows = nullptr;
        for (const auto& item : record.items()) {
            if (item.key() == "entries" && item.value().is_array())
                rows = &item.value();
            else if (item.key() != "kind" && item.key() != "type")
                line += "  " + item.key() + "=" + Compact(item.value());
        }
        if (rows != nullptr) {  // a leaderboard's rows, one line each
            line += "  entries:";
            static const char* const kOrder[] = {"rank",        "score",   "userId",  "userName",
                                                 "detailsSize", "details", "reserved"};
            for (const json& row : *rows) {
                line += "\n   ";
                for (const char* key : kOrder)
                    if (row.contains(key))
                        line += std::string(" ") + key + "=" + Compact(row[key]);
            }
        }
        return line;
    }
    if (kind == "log") {
        static const char* const kLevels[] = {"info", "warning", "error"};
        int level = record.value("level", 0);
        std::string name = level >= 0 && level <= 2 ? kLevels[level] : "level " + std::to_string(level);
        std::string source = record.value("source", "Log");
        return "log " + name + (source == "ReportError" ? " (ReportError)" : "") + "  " +
               record.value("text", "");
    }
    if (kind == "host_command") {
        return "engine command " + record.value("command", "") + "(" + Compact(record["argument"]) + ") -> " +
               Compact(record["answer"]);
    }
    if (kind == "platform_call") {
        std::string thread = record.value("thread", "main");
        return record.value("name", "") + "(" + record.value("args", "") + ")" +
               (thread == "main" ? "" : "  [" + thread + "]");
    }
    if (kind == "thread_start")
        return "engine thread started: " + record.value("name", "");
    if (kind == "file_open")
        return "engine file " + record.value("path", "") + " (" + record.value("mode", "") + ")" +
               (record.value("opened", false) ? "" : ": not found");
    if (kind == "engine_fault")
        return "the engine caught a misuse: " + record.value("text", "");
    return Compact(record);
}

}  // namespace steamext::run
