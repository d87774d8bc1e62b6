#include "run/WorldSetup.h"

#include <simclient/World.h>

#include "run/StoreWorldSetup.h"
#include "run/WorkshopWorldSetup.h"
#include "run/WorldLeaderboards.h"

namespace steamext::run {

using nlohmann::json;
using simclient::World;

namespace {

struct InterfaceName {
    const char* key;
    simclient::Interface which;
};

const InterfaceName kInterfaces[] = {
    {"client", simclient::Interface::Client},
    {"user", simclient::Interface::User},
    {"utils", simclient::Interface::Utils},
    {"apps", simclient::Interface::Apps},
    {"friends", simclient::Interface::Friends},
    {"user_stats", simclient::Interface::UserStats},
    {"remote_storage", simclient::Interface::RemoteStorage},
    {"ugc", simclient::Interface::UGC},
};

struct FaultKind {
    const char* key;
    simclient::Fault::Kind kind;
    bool takesValue;
};

const FaultKind kFaultKinds[] = {
    {"fail", simclient::Fault::Kind::Fail, false},
    {"zero_handle", simclient::Fault::Kind::ZeroHandle, false},
    {"io_failure", simclient::Fault::Kind::IoFailure, false},
    {"result", simclient::Fault::Kind::Result, true},
    {"extra_latency", simclient::Fault::Kind::ExtraLatency, true},
    {"short_read", simclient::Fault::Kind::ShortRead, true},
    {"drop", simclient::Fault::Kind::Drop, false},
    {"random_latency", simclient::Fault::Kind::RandomLatency, true},
};

std::string Shown(const json& value)
{
    return value.dump(-1, ' ', false, json::error_handler_t::replace);
}

WorldEdit ParseInterfaces(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Object(value, pointer);
    std::vector<std::pair<simclient::Interface, bool>> changes;
    for (const auto& item : value.items()) {
        const std::string at = ScenarioFile::Child(pointer, item.key());
        const InterfaceName* found = nullptr;
        for (const auto& candidate : kInterfaces)
            found = item.key() == candidate.key ? &candidate : found;
        if (found == nullptr) {
            std::string list;
            for (const auto& candidate : kInterfaces)
                list += std::string(list.empty() ? "" : ", ") + candidate.key;
            r.Fail(at, "unknown interface \"" + item.key() + "\"; expected one of: " + list);
        }
        changes.emplace_back(found->which, r.Bool(item.value(), at));
    }
    return {"interfaces " + Shown(value), [changes](World& w) {
                for (const auto& change : changes)
                    w.SetInterfaceAvailable(change.first, change.second);
            }};
}

WorldEdit ParseUser(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Object(value, pointer);
    r.OnlyKeys(value, pointer, {"steam_id", "logged_on", "name"});
    if (!value.contains("steam_id"))
        r.Fail(pointer, "a user needs \"steam_id\"");
    uint64 id = r.UInt64(value["steam_id"], ScenarioFile::Child(pointer, "steam_id"));
    bool loggedOn = value.contains("logged_on")
                        ? r.Bool(value["logged_on"], ScenarioFile::Child(pointer, "logged_on"))
                        : true;
    std::string name = value.contains("name") ? r.String(value["name"], ScenarioFile::Child(pointer, "name"))
                                              : std::string("Player");
    return {"user " + Shown(value), [id, loggedOn, name](World& w) { w.SetLocalUser(id, loggedOn, name); }};
}

WorldEdit ParseStatsResult(const ScenarioFile& r, const json& value, const std::string& pointer,
                           bool received)
{
    // A result code, or {"result": code, "game_id": id} to answer for another game.
    int32_t result = 0;
    uint64 gameId = 0;
    if (value.is_object()) {
        r.OnlyKeys(value, pointer, {"result", "game_id"});
        if (!value.contains("result"))
            r.Fail(pointer, "needs \"result\", the platform's result code (1 is OK)");
        result = r.Int(value["result"], ScenarioFile::Child(pointer, "result"), 0, 200);
        if (value.contains("game_id"))
            gameId = r.UInt64(value["game_id"], ScenarioFile::Child(pointer, "game_id"));
    } else {
        result = r.Int(value, pointer, 0, 200);
    }
    std::string label = received ? "stats_received_result " : "stats_stored_result ";
    return {label + Shown(value), [result, gameId, received](World& w) {
                if (received)
                    w.SetStatsReceivedResult(static_cast<EResult>(result), gameId);
                else
                    w.SetStatsStoredResult(static_cast<EResult>(result), gameId);
            }};
}

WorldEdit ParseFaults(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Array(value, pointer);
    std::vector<std::pair<std::string, simclient::Fault>> faults;
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string at = ScenarioFile::Child(pointer, i);
        const json& entry = r.Object(value[i], at);
        r.OnlyKeys(entry, at, {"call", "kind", "value", "skip", "times", "chance"});
        if (!entry.contains("call") || !entry.contains("kind"))
            r.Fail(at, "a fault needs \"call\" (the platform call's name) and \"kind\"");
        std::string call = r.String(entry["call"], ScenarioFile::Child(at, "call"));
        if (simclient::CallIndex(call) < 0)
            r.Fail(ScenarioFile::Child(at, "call"),
                   "unknown platform call \"" + call + "\"; known calls: " + simclient::KnownCallList());
        std::string kindName = r.String(entry["kind"], ScenarioFile::Child(at, "kind"));
        const FaultKind* kind = nullptr;
        for (const auto& candidate : kFaultKinds)
            kind = kindName == candidate.key ? &candidate : kind;
        if (kind == nullptr) {
            std::string list;
            for (const auto& candidate : kFaultKinds) {
                if (!list.empty())
                    list += ", ";
                list += candidate.key;
            }
            r.Fail(ScenarioFile::Child(at, "kind"),
                   "unknown fault kind \"" + kindName + "\"; expected one of: " + list);
        }
        simclient::Fault fault;
        fault.kind = kind->kind;
        if (kind->takesValue) {
            if (!entry.contains("value"))
                r.Fail(at, "the fault \"" + kindName + "\" needs \"value\"");
            fault.value = r.Int(entry["value"], ScenarioFile::Child(at, "value"));
        } else if (entry.contains("value")) {
            r.Fail(ScenarioFile::Child(at, "value"), "the fault \"" + kindName + "\" takes no value");
        }
        if (entry.contains("skip"))
            fault.skip = r.Int(entry["skip"], ScenarioFile::Child(at, "skip"), 0);
        if (entry.contains("times"))
            fault.times = r.Int(entry["times"], ScenarioFile::Child(at, "times"), 0);
        if (entry.contains("chance"))
            fault.chance = r.Int(entry["chance"], ScenarioFile::Child(at, "chance"), 1, 100);
        faults.emplace_back(call, fault);
    }
    return {"faults " + Shown(value), [faults](World& w) {
                for (const auto& fault : faults)
                    w.InjectFault(fault.first, fault.second);
            }};
}

WorldEdit ParseCloudFiles(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Object(value, pointer);
    std::vector<std::pair<std::string, std::vector<uint8>>> files;
    for (const auto& item : value.items()) {
        std::string bytes = r.Bytes(item.value(), ScenarioFile::Child(pointer, item.key()));
        files.emplace_back(item.key(), std::vector<uint8>(bytes.begin(), bytes.end()));
    }
    std::string names;
    for (const auto& file : files)
        names += (names.empty() ? "" : ", ") + file.first;
    return {"cloud_files: " + names, [files](World& w) {
                for (const auto& file : files)
                    w.PutFile(file.first, file.second);
            }};
}

// The state keys, the workshop's after them, then the faults and actions.
std::vector<std::string> WithWorkshopKeys(std::vector<std::string> state,
                                          const std::vector<std::string>& actions)
{
    const auto& workshop = WorkshopWorldKeys();
    state.insert(state.end(), workshop.begin(), workshop.end());
    state.insert(state.end(), actions.begin(), actions.end());
    return state;
}

}  // namespace

std::vector<WorldEdit> ParseWorld(const ScenarioFile& r, const json& world, const std::string& pointer)
{
    r.Object(world, pointer);
    static const std::vector<std::string> kKeys =
        WithWorkshopKeys({"steam_running",
                          "init_succeeds",
                          "interfaces",
                          "user",
                          "app_id",
                          "overlay_enabled",
                          "server_time",
                          "language",
                          "branch",
                          "latency",
                          "stats",
                          "achievements",
                          "stats_received_result",
                          "stats_stored_result",
                          "cloud_files",
                          "dlcs",
                          "dlc_installed",
                          "store_visit",
                          "leaderboards",
                          "friends",
                          "personas",
                          "all_names_arrive",
                          "fault_seed"},
                         {"clear_faults", "faults", "overlay_active", "warning"});
    r.OnlyKeys(world, pointer, kKeys);
    std::vector<WorldEdit> edits;
    // Keys apply in the order of kKeys, whatever their order in the file: the
    // state first, then faults (cleared before new ones), then the actions.
    for (const std::string& key : kKeys) {
        if (!world.contains(key))
            continue;
        const json& value = world[key];
        const std::string at = ScenarioFile::Child(pointer, key);
        const std::string shown = key + " = " + Shown(value);
        if (key == "steam_running") {
            bool on = r.Bool(value, at);
            edits.push_back({shown, [on](World& w) { w.SetSteamRunning(on); }});
        } else if (key == "init_succeeds") {
            bool on = r.Bool(value, at);
            edits.push_back({shown, [on](World& w) { w.SetInitSucceeds(on); }});
        } else if (key == "interfaces") {
            edits.push_back(ParseInterfaces(r, value, at));
        } else if (key == "user") {
            edits.push_back(ParseUser(r, value, at));
        } else if (key == "app_id") {
            AppId_t id = static_cast<AppId_t>(r.Int(value, at, 0));
            edits.push_back({shown, [id](World& w) { w.SetAppId(id); }});
        } else if (key == "overlay_enabled") {
            bool on = r.Bool(value, at);
            edits.push_back({shown, [on](World& w) { w.SetOverlayEnabled(on); }});
        } else if (key == "server_time") {
            if (!value.is_number_unsigned() || value.get<uint64_t>() > UINT32_MAX)
                r.Fail(at, "expected seconds since 1970 as an unsigned 32-bit integer, got " +
                               ScenarioFile::Describe(value));
            uint32 seconds = value.get<uint32>();
            edits.push_back({shown, [seconds](World& w) { w.SetServerTime(seconds); }});
        } else if (key == "language" || key == "branch") {
            std::optional<std::string> text = r.StringOrNull(value, at);
            bool language = key == "language";
            edits.push_back({shown, [text, language](World& w) {
                                 if (language)
                                     w.SetGameLanguage(text);
                                 else
                                     w.SetBetaName(text);
                             }});
        } else if (key == "latency") {
            int pumps = r.Int(value, at, 0, 1000);
            edits.push_back({shown, [pumps](World& w) { w.SetLatency(pumps); }});
        } else if (key == "stats") {
            r.Object(value, at);
            std::vector<std::pair<std::string, int32>> stats;
            for (const auto& stat : value.items())
                stats.emplace_back(stat.key(), r.Int(stat.value(), ScenarioFile::Child(at, stat.key())));
            edits.push_back({shown, [stats](World& w) {
                                 for (const auto& stat : stats)
                                     w.DefineStat(stat.first, stat.second);
                             }});
        } else if (key == "achievements") {
            r.Object(value, at);
            std::vector<std::pair<std::string, bool>> achievements;
            for (const auto& a : value.items())
                achievements.emplace_back(a.key(), r.Bool(a.value(), ScenarioFile::Child(at, a.key())));
            edits.push_back({shown, [achievements](World& w) {
                                 for (const auto& a : achievements)
                                     w.DefineAchievement(a.first, a.second);
                             }});
        } else if (key == "stats_received_result" || key == "stats_stored_result") {
            edits.push_back(ParseStatsResult(r, value, at, key == "stats_received_result"));
        } else if (key == "cloud_files") {
            edits.push_back(ParseCloudFiles(r, value, at));
        } else if (IsStoreWorldKey(key)) {
            edits.push_back(ParseStoreWorldKey(r, key, value, at));
        } else if (key == "leaderboards") {
            edits.push_back(ParseLeaderboards(r, value, at));
        } else if (key == "friends") {
            edits.push_back(ParseFriends(r, value, at));
        } else if (key == "personas") {
            edits.push_back(ParsePersonas(r, value, at));
        } else if (key == "all_names_arrive") {
            edits.push_back(ParseAllNames(r, value, at));
        } else if (key == "fault_seed") {
            uint64 seed = r.UInt64(value, at);
            edits.push_back({shown, [seed](World& w) { w.SetFaultSeed(seed); }});
        } else if (IsWorkshopWorldKey(key)) {
            edits.push_back(ParseWorkshopWorld(r, key, value, at));
        } else if (key == "faults") {
            edits.push_back(ParseFaults(r, value, at));
        } else if (key == "clear_faults") {
            if (!r.Bool(value, at))
                r.Fail(at, "\"clear_faults\" only takes true");
            edits.push_back({shown, [](World& w) { w.ClearFaults(); }});
        } else if (key == "overlay_active") {
            // The overlay opening or closing: the client posts its callback for the next pump.
            bool on = r.Bool(value, at);
            edits.push_back({on ? "the overlay opens" : "the overlay closes",
                             [on](World& w) { w.SetOverlayActive(on); }});
        } else if (key == "warning") {
            std::string text = r.String(value, at);
            edits.push_back({"the client sends the warning " + Shown(value),
                             [text](World& w) { w.EmitWarning(0, text.c_str()); }});
        }
    }
    return edits;
}

}  // namespace steamext::run
