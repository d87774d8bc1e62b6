#include "run/WorkshopWorldSetup.h"

#include <algorithm>

#include <simclient/World.h>

namespace steamext::run {

using nlohmann::json;
using simclient::World;

namespace {

struct StateBit {
    const char* name;
    uint32 bit;
};

const StateBit kStateBits[] = {
    {"subscribed", k_EItemStateSubscribed},   {"legacy", k_EItemStateLegacyItem},
    {"installed", k_EItemStateInstalled},     {"needs_update", k_EItemStateNeedsUpdate},
    {"downloading", k_EItemStateDownloading}, {"download_pending", k_EItemStateDownloadPending},
};

struct UpdateStatusName {
    const char* name;
    EItemUpdateStatus status;
};

const UpdateStatusName kUpdateStatuses[] = {
    {"invalid", k_EItemUpdateStatusInvalid},
    {"preparing_config", k_EItemUpdateStatusPreparingConfig},
    {"preparing_content", k_EItemUpdateStatusPreparingContent},
    {"uploading_content", k_EItemUpdateStatusUploadingContent},
    {"uploading_preview_file", k_EItemUpdateStatusUploadingPreviewFile},
    {"committing_changes", k_EItemUpdateStatusCommittingChanges},
};

std::string Shown(const json& value)
{
    return value.dump(-1, ' ', false, json::error_handler_t::replace);
}

std::string Child(const std::string& pointer, const std::string& key)
{
    return ScenarioFile::Child(pointer, key);
}

// State bits as a list of names (["installed", "needs_update"]) or as a number.
uint32 ParseState(const ScenarioFile& r, const json& value, const std::string& at)
{
    if (value.is_number())
        return static_cast<uint32>(r.Int(value, at, 0, 0xFFFF));
    r.Array(value, at);
    uint32 state = 0;
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string name = r.String(value[i], ScenarioFile::Child(at, i));
        const auto* found = std::find_if(std::begin(kStateBits), std::end(kStateBits),
                                         [&](const StateBit& b) { return name == b.name; });
        if (found == std::end(kStateBits)) {
            std::string list;
            for (const auto& b : kStateBits)
                list += std::string(list.empty() ? "" : ", ") + b.name;
            r.Fail(ScenarioFile::Child(at, i),
                   "unknown item state \"" + name + "\"; expected one of: " + list);
        }
        state |= found->bit;
    }
    return state;
}

uint64 OptionalUInt64(const ScenarioFile& r, const json& entry, const std::string& at, const char* key)
{
    return entry.contains(key) ? r.UInt64(entry[key], Child(at, key)) : 0;
}

std::string OptionalString(const ScenarioFile& r, const json& entry, const std::string& at, const char* key)
{
    return entry.contains(key) ? r.String(entry[key], Child(at, key)) : std::string();
}

// "every_pumps": n or "every_ms": n; one pump when neither is given.
simclient::Delay ParseStep(const ScenarioFile& r, const json& entry, const std::string& at)
{
    if (entry.contains("every_pumps") && entry.contains("every_ms"))
        r.Fail(at, "give \"every_pumps\" or \"every_ms\", not both");
    if (entry.contains("every_ms"))
        return simclient::Delay::EngineMs(
            static_cast<uint64_t>(r.Int(entry["every_ms"], Child(at, "every_ms"), 1)));
    if (entry.contains("every_pumps"))
        return simclient::Delay::Pumps(
            static_cast<uint64_t>(r.Int(entry["every_pumps"], Child(at, "every_pumps"), 1)));
    return simclient::Delay::Pumps(1);
}

WorldEdit ParseItems(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Array(value, pointer);
    std::vector<simclient::WorkshopItem> items;
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string at = ScenarioFile::Child(pointer, i);
        const json& entry = r.Object(value[i], at);
        r.OnlyKeys(entry, at,
                   {"id", "title", "description", "tags", "subscribed", "state", "folder", "result",
                    "bytes_downloaded", "bytes_total", "install_info_fails", "visibility"});
        if (!entry.contains("id"))
            r.Fail(at, "a workshop item needs \"id\", its published file id");
        simclient::WorkshopItem item;
        item.id = r.UInt64(entry["id"], Child(at, "id"));
        item.title = OptionalString(r, entry, at, "title");
        item.description = OptionalString(r, entry, at, "description");
        item.tags = OptionalString(r, entry, at, "tags");
        item.folder = OptionalString(r, entry, at, "folder");
        item.subscribed =
            entry.contains("subscribed") && r.Bool(entry["subscribed"], Child(at, "subscribed"));
        if (entry.contains("state"))
            item.state = ParseState(r, entry["state"], Child(at, "state"));
        if (entry.contains("result"))
            item.result = static_cast<EResult>(r.Int(entry["result"], Child(at, "result"), 0, 200));
        if (entry.contains("visibility"))
            item.visibility = static_cast<ERemoteStoragePublishedFileVisibility>(
                r.Int(entry["visibility"], Child(at, "visibility"), 0, 3));
        item.bytesDownloaded = OptionalUInt64(r, entry, at, "bytes_downloaded");
        item.bytesTotal = OptionalUInt64(r, entry, at, "bytes_total");
        item.installInfoFails = entry.contains("install_info_fails") &&
                                r.Bool(entry["install_info_fails"], Child(at, "install_info_fails"));
        items.push_back(item);
    }
    std::string ids;
    for (const auto& item : items)
        ids += (ids.empty() ? "" : ", ") + std::to_string(item.id);
    return {"workshop_items: " + ids, [items](World& w) {
                for (const auto& item : items)
                    w.AddWorkshopItem(item);
            }};
}

WorldEdit ParseDownloads(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Array(value, pointer);
    std::vector<std::pair<PublishedFileId_t, simclient::WorkshopDownload>> downloads;
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string at = ScenarioFile::Child(pointer, i);
        const json& entry = r.Object(value[i], at);
        r.OnlyKeys(entry, at, {"id", "bytes_total", "bytes_per_step", "every_pumps", "every_ms", "folder"});
        if (!entry.contains("id") || !entry.contains("bytes_total"))
            r.Fail(at, "a download needs \"id\" (an item of workshop_items) and \"bytes_total\"");
        simclient::WorkshopDownload download;
        download.bytesTotal = r.UInt64(entry["bytes_total"], Child(at, "bytes_total"));
        download.bytesPerStep = OptionalUInt64(r, entry, at, "bytes_per_step");
        download.step = ParseStep(r, entry, at);
        download.folder = OptionalString(r, entry, at, "folder");
        downloads.emplace_back(r.UInt64(entry["id"], Child(at, "id")), download);
    }
    return {"workshop_downloads " + Shown(value), [downloads](World& w) {
                // An item the world has no entry for yet is one just subscribed to.
                for (const auto& d : downloads) {
                    if (!w.StartWorkshopDownload(d.first, d.second)) {
                        simclient::WorkshopItem item;
                        item.id = d.first;
                        item.subscribed = true;
                        w.AddWorkshopItem(item);
                        w.StartWorkshopDownload(d.first, d.second);
                    }
                }
            }};
}

WorldEdit ParseUpload(const ScenarioFile& r, const json& value, const std::string& at)
{
    if (value.is_null())
        return {"workshop_upload = null", [](World& w) { w.SetWorkshopUpload(std::nullopt); }};
    const json& entry = r.Object(value, at);
    r.OnlyKeys(entry, at, {"content_bytes", "bytes_per_step", "every_pumps", "every_ms", "result"});
    simclient::WorkshopUpload upload;
    upload.contentBytes = OptionalUInt64(r, entry, at, "content_bytes");
    upload.bytesPerStep = OptionalUInt64(r, entry, at, "bytes_per_step");
    upload.step = ParseStep(r, entry, at);
    if (entry.contains("result"))
        upload.result = static_cast<EResult>(r.Int(entry["result"], Child(at, "result"), 0, 200));
    return {"workshop_upload = " + Shown(value), [upload](World& w) { w.SetWorkshopUpload(upload); }};
}

WorldEdit ParseUpdateProgress(const ScenarioFile& r, const json& value, const std::string& at)
{
    const json& entry = r.Object(value, at);
    r.OnlyKeys(entry, at, {"status", "processed", "total"});
    EItemUpdateStatus status = k_EItemUpdateStatusInvalid;
    if (entry.contains("status")) {
        const std::string name = r.String(entry["status"], Child(at, "status"));
        const auto* found = std::find_if(std::begin(kUpdateStatuses), std::end(kUpdateStatuses),
                                         [&](const UpdateStatusName& s) { return name == s.name; });
        if (found == std::end(kUpdateStatuses)) {
            std::string list;
            for (const auto& s : kUpdateStatuses)
                list += std::string(list.empty() ? "" : ", ") + s.name;
            r.Fail(Child(at, "status"), "unknown update status \"" + name + "\"; expected one of: " + list);
        }
        status = found->status;
    }
    const uint64 processed = OptionalUInt64(r, entry, at, "processed");
    const uint64 total = OptionalUInt64(r, entry, at, "total");
    return {"workshop_update_progress = " + Shown(value),
            [status, processed, total](World& w) { w.SetUpdateProgress(status, processed, total); }};
}

}  // namespace

const std::vector<std::string>& WorkshopWorldKeys()
{
    static const std::vector<std::string> kKeys = {"workshop_items", "workshop_subscribed_list",
                                                   "workshop_downloads", "workshop_upload",
                                                   "workshop_update_progress"};
    return kKeys;
}

bool IsWorkshopWorldKey(const std::string& key)
{
    const auto& keys = WorkshopWorldKeys();
    return std::find(keys.begin(), keys.end(), key) != keys.end();
}

WorldEdit ParseWorkshopWorld(const ScenarioFile& r, const std::string& key, const json& value,
                             const std::string& pointer)
{
    if (key == "workshop_items")
        return ParseItems(r, value, pointer);
    if (key == "workshop_downloads")
        return ParseDownloads(r, value, pointer);
    if (key == "workshop_subscribed_list") {
        if (value.is_null())
            return {"workshop_subscribed_list = null", [](World& w) { w.SetSubscribedList(std::nullopt); }};
        r.Array(value, pointer);
        std::vector<PublishedFileId_t> ids;
        for (std::size_t i = 0; i < value.size(); ++i)
            ids.push_back(r.UInt64(value[i], ScenarioFile::Child(pointer, i)));
        return {"workshop_subscribed_list = " + Shown(value), [ids](World& w) { w.SetSubscribedList(ids); }};
    }
    if (key == "workshop_upload")
        return ParseUpload(r, value, pointer);
    return ParseUpdateProgress(r, value, pointer);
}

}  // namespace steamext::run
