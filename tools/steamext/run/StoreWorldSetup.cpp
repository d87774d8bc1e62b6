#include "run/StoreWorldSetup.h"

#include <simclient/World.h>

namespace steamext::run {

using nlohmann::json;
using simclient::World;

namespace {

std::string Shown(const json& value)
{
    return value.dump(-1, ' ', false, json::error_handler_t::replace);
}

AppId_t ProductNumber(const ScenarioFile& r, const json& value, const std::string& at)
{
    const uint64_t number = r.UInt64(value, at);
    if (number > UINT32_MAX)
        r.Fail(at, "a product number is an unsigned 32-bit integer, got " + ScenarioFile::Describe(value));
    return static_cast<AppId_t>(number);
}

WorldEdit ParseDlcs(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Array(value, pointer);
    std::vector<simclient::Dlc> dlcs;
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string at = ScenarioFile::Child(pointer, i);
        const json& entry = r.Object(value[i], at);
        r.OnlyKeys(entry, at, {"app_id", "name", "available", "installed"});
        if (!entry.contains("app_id"))
            r.Fail(at, "a product needs \"app_id\", its number on the platform");
        simclient::Dlc dlc;
        dlc.appId = ProductNumber(r, entry["app_id"], ScenarioFile::Child(at, "app_id"));
        if (entry.contains("name"))
            dlc.name = r.String(entry["name"], ScenarioFile::Child(at, "name"));
        if (entry.contains("available"))
            dlc.available = r.Bool(entry["available"], ScenarioFile::Child(at, "available"));
        if (entry.contains("installed"))
            dlc.installed = r.Bool(entry["installed"], ScenarioFile::Child(at, "installed"));
        dlcs.push_back(dlc);
    }
    return {"dlcs = " + Shown(value), [dlcs](World& w) { w.SetDlcs(dlcs); }};
}

WorldEdit ParseDlcInstalled(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Object(value, pointer);
    std::vector<std::pair<AppId_t, bool>> changes;
    for (const auto& item : value.items()) {
        const std::string at = ScenarioFile::Child(pointer, item.key());
        AppId_t number = ProductNumber(r, json(item.key()), at);
        changes.emplace_back(number, r.Bool(item.value(), at));
    }
    return {"dlc_installed = " + Shown(value), [changes](World& w) {
                for (const auto& change : changes)
                    w.SetDlcInstalled(change.first, change.second);
            }};
}

// {"pumps": 2} or {"ms": 1500}.
simclient::Delay ParseDelay(const ScenarioFile& r, const json& value, const std::string& at)
{
    r.Object(value, at);
    r.OnlyKeys(value, at, {"pumps", "ms"});
    if (value.size() != 1)
        r.Fail(at, "a delay is {\"pumps\": n} or {\"ms\": n}");
    if (value.contains("pumps"))
        return simclient::Delay::Pumps(
            static_cast<uint64_t>(r.Int(value["pumps"], ScenarioFile::Child(at, "pumps"), 0)));
    return simclient::Delay::EngineMs(
        static_cast<uint64_t>(r.Int(value["ms"], ScenarioFile::Child(at, "ms"), 0)));
}

WorldEdit ParseStoreVisit(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    if (value.is_null())
        return {"store_visit = null (the overlay stays open)",
                [](World& w) { w.SetStoreVisit(std::nullopt); }};
    r.Object(value, pointer);
    r.OnlyKeys(value, pointer, {"buy_after", "close_after", "install_after"});
    if (!value.contains("close_after"))
        r.Fail(pointer, "a store visit needs \"close_after\", when the user closes the overlay");
    simclient::StoreVisit visit;
    visit.closeAfter = ParseDelay(r, value["close_after"], ScenarioFile::Child(pointer, "close_after"));
    if (value.contains("buy_after"))
        visit.buyAfter = ParseDelay(r, value["buy_after"], ScenarioFile::Child(pointer, "buy_after"));
    if (value.contains("install_after")) {
        if (!visit.buyAfter)
            r.Fail(ScenarioFile::Child(pointer, "install_after"),
                   "only a product bought installs: give \"buy_after\" too");
        visit.installAfter =
            ParseDelay(r, value["install_after"], ScenarioFile::Child(pointer, "install_after"));
    }
    return {"store_visit = " + Shown(value), [visit](World& w) { w.SetStoreVisit(visit); }};
}

}  // namespace

bool IsStoreWorldKey(const std::string& key)
{
    return key == "dlcs" || key == "dlc_installed" || key == "store_visit";
}

WorldEdit ParseStoreWorldKey(const ScenarioFile& r, const std::string& key, const json& value,
                             const std::string& pointer)
{
    if (key == "dlcs")
        return ParseDlcs(r, value, pointer);
    if (key == "dlc_installed")
        return ParseDlcInstalled(r, value, pointer);
    return ParseStoreVisit(r, value, pointer);
}

}  // namespace steamext::run
