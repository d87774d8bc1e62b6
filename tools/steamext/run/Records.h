// What the runner saw happen, one JSON object per record:
//   {"kind": "event", "type": 17, "status": 1, "PlayerId": "22202", "ErrorText": null}
//   {"kind": "log", "level": 1, "source": "Log", "text": "Steam still not running."}
//   {"kind": "input", "call": "SetInputButton", "id": 3, "value": 0}
//   {"kind": "host_command", "command": "OpenURL", "argument": "steam://...", "answer": null}
//   {"kind": "platform_call", "name": "SteamAPI_Init", "args": "", "thread": "main"}
// Patterns in a scenario are the same objects with fewer fields.
#pragma once

#include <string>
#include <vector>

#include <nlohmann/json.hpp>

namespace steamext::run {

// True when every field of `pattern` equals the record's; a field "x_contains"
// matches a text field "x" holding it; in a list of as many objects (an event's rows),
// each object is a pattern for its row. "count" is not a field and is ignored.
bool MatchesPattern(const nlohmann::json& record, const nlohmann::json& pattern);

// Input ids in call order, consecutive ascending runs joined: "0-254,801-863".
std::string IdRanges(const std::vector<int>& ids);

// A short line for the timeline: "event 17  status=1 PlayerId=\"22202\"". An event's rows
// follow, one line each ("\n    userId=... score=...").
std::string DescribeRecord(const nlohmann::json& record);

// One-line JSON, never throwing on bytes that are not UTF-8.
std::string Compact(const nlohmann::json& value);

}  // namespace steamext::run
