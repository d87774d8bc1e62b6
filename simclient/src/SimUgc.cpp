// ISteamUGC: subscriptions and install state from the world's items, detail queries,
// item creation and updates (recorded as submissions and applied to the item).
#include <algorithm>
#include <cstring>

#include "Args.h"
#include "SimInterfaces.h"
#include "WorldState.h"

namespace simclient {
namespace {

template <std::size_t N> void CopyText(char (&out)[N], const std::string& text)
{
    std::size_t n = std::min(text.size(), N - 1);
    std::memcpy(out, text.data(), n);
    out[n] = '\0';
}

// The platform gives install folders in the system's own form: on Windows with "\"
// between names, whatever the scenario wrote.
std::string NativeFolder(std::string folder)
{
#if defined(_WIN32)
    std::replace(folder.begin(), folder.end(), '/', '\\');
#endif
    return folder;
}

void SetSubscribed(WorkshopItem& item, bool subscribed)
{
    item.subscribed = subscribed;
    if (subscribed)
        item.state |= k_EItemStateSubscribed;
    else
        item.state &= ~uint32(k_EItemStateSubscribed);
}

// One planned upload on its way: the update it belongs to, the call whose result ends it.
struct UploadRun {
    UGCUpdateHandle_t update;
    SteamAPICall_t call;
    WorkshopUpload plan;
    SubmitItemUpdateResult_t result;
    bool ioFailure;
    bool drop;
};

// Moves the upload on by one stage (or one step of bytes); the last stage queues the result.
void UploadStep(WorldData& d, const UploadRun& run);

void ScheduleUploadStep(WorldData& d, const UploadRun& run)
{
    d.ScheduleAt(d.DueAfter(run.plan.step), [run](WorldData& data) { UploadStep(data, run); });
}

void UploadStep(WorldData& d, const UploadRun& run)
{
    auto found = d.updates.find(run.update);
    if (found == d.updates.end())
        return;
    ItemUpdate& u = found->second;
    switch (u.status) {
    case k_EItemUpdateStatusPreparingConfig:
        u.status = k_EItemUpdateStatusPreparingContent;
        break;
    case k_EItemUpdateStatusPreparingContent:
        u.status = k_EItemUpdateStatusUploadingContent;
        break;
    case k_EItemUpdateStatusUploadingContent:
        u.processed = std::min(u.total, u.processed + run.plan.bytesPerStep);
        if (u.processed >= u.total)
            u.status = k_EItemUpdateStatusUploadingPreviewFile;
        break;
    case k_EItemUpdateStatusUploadingPreviewFile:
        u.status = k_EItemUpdateStatusCommittingChanges;
        break;
    default:
        u.ended = true;
        if (!run.drop)
            d.PostResultAt(d.pump, run.call, SubmitItemUpdateResult_t::k_iCallback, run.ioFailure,
                           &run.result, sizeof run.result);
        return;
    }
    ScheduleUploadStep(d, run);
}

class SimSteamUGC final : public ISteamUGC {
public:
    UGCQueryHandle_t CreateQueryUGCDetailsRequest(PublishedFileId_t* ids, uint32 count) override
    {
        CallScope call(SIM_CALL("CreateQueryUGCDetailsRequest"), Args(ids, count));
        if (call.faults.fail || (count > 0 && !ids) || count > call.state.detailQueryLimit)
            return k_UGCQueryHandleInvalid;
        UgcQuery query;
        query.ids.assign(ids, ids + count);
        UGCQueryHandle_t handle = call.state.nextQueryHandle++;
        call.state.queries[handle] = std::move(query);
        return handle;
    }

    SteamAPICall_t SendQueryUGCRequest(UGCQueryHandle_t handle) override
    {
        CallScope call(SIM_CALL("SendQueryUGCRequest"), Args(handle));
        auto found = call.state.queries.find(handle);
        if (found == call.state.queries.end() || found->second.sent)
            return k_uAPICallInvalid;
        found->second.sent = true;
        SteamUGCQueryCompleted_t result{};
        result.m_handle = handle;
        result.m_eResult = call.faults.fail ? k_EResultFail : call.faults.result.value_or(k_EResultOK);
        if (result.m_eResult == k_EResultOK) {
            found->second.completed = true;
            result.m_unNumResultsReturned = static_cast<uint32>(found->second.ids.size());
            result.m_unTotalMatchingResults = result.m_unNumResultsReturned;
        }
        return QueueResult(call.state, result, call.faults);
    }

    bool GetQueryUGCResult(UGCQueryHandle_t handle, uint32 index, SteamUGCDetails_t* pDetails) override
    {
        CallScope call(SIM_CALL("GetQueryUGCResult"), Args(handle, index));
        auto found = call.state.queries.find(handle);
        if (call.faults.fail || !pDetails || found == call.state.queries.end() || !found->second.completed ||
            index >= found->second.ids.size())
            return false;
        PublishedFileId_t id = found->second.ids[index];
        std::memset(pDetails, 0, sizeof *pDetails);
        pDetails->m_nPublishedFileId = id;
        pDetails->m_hFile = pDetails->m_hPreviewFile = k_UGCHandleInvalid;
        auto item = call.state.items.find(id);
        if (item == call.state.items.end()) {
            pDetails->m_eResult = k_EResultFileNotFound;
            return true;
        }
        const WorkshopItem& w = item->second;
        pDetails->m_eResult = w.result;
        pDetails->m_eFileType = k_EWorkshopFileTypeCommunity;
        pDetails->m_nCreatorAppID = pDetails->m_nConsumerAppID = call.state.appId;
        CopyText(pDetails->m_rgchTitle, w.title);
        CopyText(pDetails->m_rgchDescription, w.description);
        CopyText(pDetails->m_rgchTags, w.tags);
        pDetails->m_bTagsTruncated = w.tags.size() >= k_cchTagListMax;
        pDetails->m_ulSteamIDOwner = w.owner;
        pDetails->m_rtimeCreated = w.timeCreated;
        pDetails->m_rtimeUpdated = w.timeUpdated;
        pDetails->m_eVisibility = w.visibility;
        pDetails->m_bAcceptedForUse = true;
        pDetails->m_nFileSize = static_cast<int32>(w.bytesTotal);
        return true;
    }

    bool ReleaseQueryUGCRequest(UGCQueryHandle_t handle) override
    {
        CallScope call(SIM_CALL("ReleaseQueryUGCRequest"), Args(handle));
        return call.state.queries.erase(handle) > 0;
    }

    SteamAPICall_t CreateItem(AppId_t nConsumerAppId, EWorkshopFileType eFileType) override
    {
        CallScope call(SIM_CALL("CreateItem"), Args(nConsumerAppId, eFileType));
        WorldState& s = call.state;
        CreateItemResult_t result{};
        result.m_eResult = call.faults.fail ? k_EResultFail : call.faults.result.value_or(k_EResultOK);
        result.m_bUserNeedsToAcceptWorkshopLegalAgreement = s.needsLegalAgreement;
        if (result.m_eResult == k_EResultOK) {
            WorkshopItem item;
            item.id = s.nextItemId++;
            item.owner = s.userId;
            item.visibility = k_ERemoteStoragePublishedFileVisibilityPrivate;
            item.timeCreated = item.timeUpdated = s.serverTime;
            result.m_nPublishedFileId = item.id;
            s.items[item.id] = item;
        }
        return QueueResult(s, result, call.faults);
    }

    UGCUpdateHandle_t StartItemUpdate(AppId_t appId, PublishedFileId_t id) override
    {
        CallScope call(SIM_CALL("StartItemUpdate"), Args(appId, id));
        if (call.faults.fail || id == k_PublishedFileIdInvalid)
            return k_UGCUpdateHandleInvalid;
        UGCUpdateHandle_t handle = call.state.nextUpdateHandle++;
        ItemUpdate& update = call.state.updates[handle];
        update.pending.id = id;
        update.pending.appId = appId;
        return handle;
    }

    bool SetItemTitle(UGCUpdateHandle_t handle, const char* text) override
    {
        return SetField(SIM_CALL("SetItemTitle"), handle, text, &WorkshopSubmission::title);
    }
    bool SetItemDescription(UGCUpdateHandle_t handle, const char* text) override
    {
        return SetField(SIM_CALL("SetItemDescription"), handle, text, &WorkshopSubmission::description);
    }
    bool SetItemContent(UGCUpdateHandle_t handle, const char* folder) override
    {
        return SetField(SIM_CALL("SetItemContent"), handle, folder, &WorkshopSubmission::content);
    }
    bool SetItemPreview(UGCUpdateHandle_t handle, const char* file) override
    {
        return SetField(SIM_CALL("SetItemPreview"), handle, file, &WorkshopSubmission::preview);
    }

    bool SetItemVisibility(UGCUpdateHandle_t handle,
                           ERemoteStoragePublishedFileVisibility visibility) override
    {
        CallScope call(SIM_CALL("SetItemVisibility"), Args(handle, visibility));
        auto found = call.state.updates.find(handle);
        if (call.faults.fail || found == call.state.updates.end())
            return false;
        found->second.pending.visibility = visibility;
        return true;
    }

    bool SetItemTags(UGCUpdateHandle_t handle, const SteamParamStringArray_t* pTags) override
    {
        std::string list;
        if (pTags && pTags->m_ppStrings)
            for (int32 i = 0; i < pTags->m_nNumStrings; ++i)
                list += (i ? "," : "") + std::string(pTags->m_ppStrings[i] ? pTags->m_ppStrings[i] : "");
        // The count tells an empty list from one empty tag.
        CallScope call(SIM_CALL("SetItemTags"), Args(handle, pTags ? pTags->m_nNumStrings : -1, list));
        auto found = call.state.updates.find(handle);
        if (call.faults.fail || !pTags || found == call.state.updates.end())
            return false;
        std::vector<std::string> tags;
        for (int32 i = 0; pTags->m_ppStrings && i < pTags->m_nNumStrings; ++i)
            tags.emplace_back(pTags->m_ppStrings[i] ? pTags->m_ppStrings[i] : "");
        found->second.pending.tags = tags;
        return true;
    }

    SteamAPICall_t SubmitItemUpdate(UGCUpdateHandle_t handle, const char* pchChangeNote) override
    {
        CallScope call(SIM_CALL("SubmitItemUpdate"), Args(handle, pchChangeNote));
        WorldState& s = call.state;
        auto found = s.updates.find(handle);
        if (found == s.updates.end())
            return k_uAPICallInvalid;
        WorkshopSubmission submission = found->second.pending;
        submission.changeNote = pchChangeNote ? pchChangeNote : "";
        SubmitItemUpdateResult_t result{};
        result.m_nPublishedFileId = submission.id;
        result.m_bUserNeedsToAcceptWorkshopLegalAgreement = s.needsLegalAgreement;
        result.m_eResult = call.faults.fail ? k_EResultFail : call.faults.result.value_or(k_EResultOK);
        auto item = s.items.find(submission.id);
        if (result.m_eResult == k_EResultOK && item == s.items.end())
            result.m_eResult = k_EResultFileNotFound;
        if (result.m_eResult == k_EResultOK) {
            WorkshopItem& w = item->second;
            if (submission.title)
                w.title = *submission.title;
            if (submission.description)
                w.description = *submission.description;
            if (submission.visibility)
                w.visibility = *submission.visibility;
            if (submission.tags) {
                w.tags.clear();
                for (const std::string& tag : *submission.tags)
                    w.tags += (w.tags.empty() ? "" : ",") + tag;
            }
            w.timeUpdated = s.serverTime;
        }
        s.submissions.push_back(submission);
        if (!s.upload || call.faults.zeroHandle)
            return QueueResult(s, result, call.faults);
        if (!call.faults.result && !call.faults.fail && result.m_eResult == k_EResultOK)
            result.m_eResult = s.upload->result;
        const SteamAPICall_t callHandle = s.nextHandle++;
        ItemUpdate& update = found->second;
        update.uploading = true;
        update.status = k_EItemUpdateStatusPreparingConfig;
        update.processed = 0;
        update.total = s.upload->contentBytes;  // known from the start, as the content is measured
        ScheduleUploadStep(
            s, UploadRun{handle, callHandle, *s.upload, result, call.faults.ioFailure, call.faults.drop});
        return callHandle;
    }

    EItemUpdateStatus GetItemUpdateProgress(UGCUpdateHandle_t handle, uint64* processed,
                                            uint64* total) override
    {
        CallScope call(SIM_CALL("GetItemUpdateProgress"), Args(handle));
        auto found = call.state.updates.find(handle);
        if (call.faults.fail || found == call.state.updates.end() || found->second.ended)
            return k_EItemUpdateStatusInvalid;
        const ItemUpdate& update = found->second;
        if (processed)
            *processed = update.uploading ? update.processed : call.state.updateProcessed;
        if (total)
            *total = update.uploading ? update.total : call.state.updateTotal;
        return update.uploading ? update.status : call.state.updateStatus;
    }

    SteamAPICall_t SubscribeItem(PublishedFileId_t id) override
    {
        return ChangeSubscription<RemoteStorageSubscribePublishedFileResult_t>(SIM_CALL("SubscribeItem"), id,
                                                                               true);
    }
    SteamAPICall_t UnsubscribeItem(PublishedFileId_t id) override
    {
        return ChangeSubscription<RemoteStorageUnsubscribePublishedFileResult_t>(SIM_CALL("UnsubscribeItem"),
                                                                                 id, false);
    }

    uint32 GetNumSubscribedItems() override
    {
        CallScope call(SIM_CALL("GetNumSubscribedItems"), "");
        if (call.faults.fail)
            return 0;
        if (call.state.subscribedList)
            return static_cast<uint32>(call.state.subscribedList->size());
        uint32 n = 0;
        for (const auto& entry : call.state.items)
            n += entry.second.subscribed ? 1 : 0;
        return n;
    }

    uint32 GetSubscribedItems(PublishedFileId_t* ids, uint32 cMaxEntries) override
    {
        CallScope call(SIM_CALL("GetSubscribedItems"), Args(ids, cMaxEntries));
        if (call.faults.fail || !ids)
            return 0;
        uint32 n = 0;
        if (call.state.subscribedList) {
            for (PublishedFileId_t id : *call.state.subscribedList)
                if (n < cMaxEntries)
                    ids[n++] = id;
            return n;
        }
        for (const auto& entry : call.state.items)
            if (entry.second.subscribed && n < cMaxEntries)
                ids[n++] = entry.first;
        return n;
    }

    uint32 GetItemState(PublishedFileId_t id) override
    {
        CallScope call(SIM_CALL("GetItemState"), Args(id));
        auto found = call.state.items.find(id);
        if (call.faults.fail || found == call.state.items.end())
            return k_EItemStateNone;
        return found->second.state;
    }

    bool GetItemInstallInfo(PublishedFileId_t id, uint64* sizeOnDisk, char* folder, uint32 cchFolderSize,
                            uint32* timeStamp) override
    {
        CallScope call(SIM_CALL("GetItemInstallInfo"), Args(id, cchFolderSize));
        auto found = call.state.items.find(id);
        if (call.faults.fail || found == call.state.items.end() ||
            !(found->second.state & k_EItemStateInstalled) || found->second.installInfoFails)
            return false;
        const WorkshopItem& w = found->second;
        if (sizeOnDisk)
            *sizeOnDisk = w.sizeOnDisk;
        if (timeStamp)
            *timeStamp = w.installTimestamp;
        if (folder && cchFolderSize > 0) {
            const std::string native = NativeFolder(w.folder);
            std::size_t n = std::min<std::size_t>(native.size(), cchFolderSize - 1);
            std::memcpy(folder, native.data(), n);
            folder[n] = '\0';
        }
        return true;
    }

    bool GetItemDownloadInfo(PublishedFileId_t id, uint64* downloaded, uint64* total) override
    {
        CallScope call(SIM_CALL("GetItemDownloadInfo"), Args(id));
        auto found = call.state.items.find(id);
        const uint32 transferring = k_EItemStateNeedsUpdate | k_EItemStateDownloading;
        if (call.faults.fail || found == call.state.items.end() ||
            (found->second.bytesTotal == 0 && !(found->second.state & transferring)))
            return false;
        if (downloaded)
            *downloaded = found->second.bytesDownloaded;
        if (total)
            *total = found->second.bytesTotal;
        return true;
    }

private:
    bool SetField(CallName name, UGCUpdateHandle_t handle, const char* text,
                  std::optional<std::string> WorkshopSubmission::*field)
    {
        CallScope call(name, Args(handle, text));
        auto found = call.state.updates.find(handle);
        if (call.faults.fail || !text || found == call.state.updates.end())
            return false;
        found->second.pending.*field = std::string(text);
        return true;
    }

    template <class Result>
    SteamAPICall_t ChangeSubscription(CallName name, PublishedFileId_t id, bool subscribe)
    {
        CallScope call(name, Args(id));
        WorldState& s = call.state;
        Result result{};
        result.m_nPublishedFileId = id;
        result.m_eResult = call.faults.fail ? k_EResultFail : call.faults.result.value_or(k_EResultOK);
        auto item = s.items.find(id);
        if (result.m_eResult == k_EResultOK && item == s.items.end())
            result.m_eResult = k_EResultFileNotFound;
        if (result.m_eResult == k_EResultOK)
            SetSubscribed(item->second, subscribe);
        return QueueResult(s, result, call.faults);
    }
};

}  // namespace

ISteamUGC* SimUGC()
{
    static SimSteamUGC instance;
    return &instance;
}

}  // namespace simclient
