// The control API: every member takes the world lock for the duration of its own work.
#include "simclient/World.h"

#include <algorithm>
#include <stdexcept>

#include "LeaderboardRank.h"
#include "WorldState.h"
#include "simclient/GeneratedPlayers.h"

namespace simclient {

namespace {
std::unique_lock<std::mutex> Lock()
{
    return std::unique_lock<std::mutex>(State().mutex);
}
}  // namespace

std::string KnownCallList()
{
    std::string list;
    for (std::string_view name : kCallNames)
        list.append(list.empty() ? "" : ", ").append(name);
    return list;
}

World& GetWorld()
{
    static World world;
    return world;
}

void World::Reset()
{
    auto lock = Lock();
    State().ResetData();
}

void World::SetSteamRunning(bool running)
{
    auto l = Lock();
    State().steamRunning = running;
}
void World::SetInitSucceeds(bool succeeds)
{
    auto l = Lock();
    State().initSucceeds = succeeds;
}
bool World::IsInitialised() const
{
    auto l = Lock();
    return State().initialised;
}

void World::SetInterfaceAvailable(Interface which, bool available)
{
    auto l = Lock();
    State().available[int(which)] = available;
    State().BumpGeneration();
}
bool World::IsInterfaceAvailable(Interface which) const
{
    auto l = Lock();
    return State().available[int(which)];
}
uintptr_t World::InterfaceGeneration() const
{
    return State().generation.load();
}

void World::SetLocalUser(uint64 steamId, bool loggedOn, const std::string& personaName)
{
    auto l = Lock();
    State().userId = steamId;
    State().loggedOn = loggedOn;
    State().personaName = personaName;
}
uint64 World::LocalUserId() const
{
    auto l = Lock();
    return State().userId;
}
void World::SetAppId(AppId_t appId)
{
    auto l = Lock();
    State().appId = appId;
}
void World::SetOverlayEnabled(bool enabled)
{
    auto l = Lock();
    State().overlayEnabled = enabled;
}
void World::SetServerTime(uint32 t)
{
    auto l = Lock();
    State().serverTime = t;
}
std::optional<ENotificationPosition> World::NotificationPosition() const
{
    auto l = Lock();
    return State().notificationPosition;
}
void World::SetGameLanguage(std::optional<std::string> language)
{
    auto l = Lock();
    State().language = std::move(language);
}
void World::SetBetaName(std::optional<std::string> branch)
{
    auto l = Lock();
    State().beta = std::move(branch);
}
void World::SetDlcs(std::vector<Dlc> dlcs)
{
    auto l = Lock();
    State().dlcs = std::move(dlcs);
}
void World::SetDlcInstalled(AppId_t appId, bool installed)
{
    auto l = Lock();
    for (Dlc& dlc : State().dlcs)
        if (dlc.appId == appId)
            dlc.installed = installed;
}

void World::SetLatency(int pumps)
{
    auto l = Lock();
    State().latency = pumps < 1 ? 1 : pumps;
}
void World::SetHoldUnboundResults(bool hold)
{
    auto l = Lock();
    State().holdUnboundResults = hold;
}
void World::PostCallback(int callbackId, const void* data, std::size_t size)
{
    auto l = Lock();
    State().QueueCallback(callbackId, data, size);
}
void World::SetStoreVisit(std::optional<StoreVisit> visit)
{
    auto l = Lock();
    State().storeVisit = visit;
}

void World::SetOverlayActive(bool active)
{
    {
        auto l = Lock();
        State().overlayShown = active;
    }
    GameOverlayActivated_t overlay{};
    overlay.m_bActive = active ? 1 : 0;
    Post(overlay);
}
std::size_t World::PendingCount() const
{
    auto l = Lock();
    return State().queue.size();
}
uint64 World::PumpCount() const
{
    auto l = Lock();
    return State().pump;
}
int World::RegisteredCallbackCount(int callbackId) const
{
    auto l = Lock();
    auto found = State().callbacks.find(callbackId);
    return found == State().callbacks.end() ? 0 : static_cast<int>(found->second.size());
}
std::size_t World::BoundCallResultCount() const
{
    auto l = Lock();
    return State().callResults.size();
}

void World::Schedule(Due due, WorldAction action)
{
    auto l = Lock();
    State().ScheduleAt(due, std::move(action));
    State().SyncQueuedCount();
}
void World::After(Delay delay, WorldAction action)
{
    auto l = Lock();
    State().ScheduleAt(State().DueAfter(delay), std::move(action));
    State().SyncQueuedCount();
}
std::size_t World::ScheduledCount() const
{
    auto l = Lock();
    return State().scheduled.size();
}
void World::SetTimeSource(std::function<uint64_t()> nowMs)
{
    std::shared_ptr<const std::function<uint64_t()>> source;
    if (nowMs)
        source = std::make_shared<const std::function<uint64_t()>>(std::move(nowMs));
    std::atomic_store(&State().timeSource, std::move(source));
}

void World::SetCallObserver(std::function<void(const char* name, const std::string& args)> observer)
{
    std::shared_ptr<const std::function<void(const char*, const std::string&)>> kept;
    if (observer)
        kept =
            std::make_shared<const std::function<void(const char*, const std::string&)>>(std::move(observer));
    std::atomic_store(&State().callObserver, std::move(kept));
}

void World::InjectFault(const std::string& call, Fault fault)
{
    if (CallIndex(call) < 0)
        throw std::invalid_argument("no call named \"" + call +
                                    "\" to inject a fault into; known calls: " + KnownCallList());
    auto l = Lock();
    State().faults[call].push_back(fault);
}
void World::ClearFaults()
{
    auto l = Lock();
    State().faults.clear();
}
void World::SetFaultSeed(uint64 seed)
{
    auto l = Lock();
    State().faultRandom.seed(seed);
}

Journal World::GetJournal() const
{
    auto l = Lock();
    return Journal(State().journal);
}
simclient::JournalMark World::JournalMark() const
{
    auto l = Lock();
    const WorldState& s = State();
    return simclient::JournalMark{s.journalEpoch, s.journal.size(),
                                  s.journal.empty() ? 0 : s.journal.back().count};
}
Journal World::JournalSince(simclient::JournalMark& mark) const
{
    auto l = Lock();
    const WorldState& s = State();
    if (mark.epoch != s.journalEpoch || mark.end > s.journal.size())
        mark = simclient::JournalMark{s.journalEpoch, 0, 0};
    std::vector<JournalEntry> fresh;
    if (mark.end > 0 && s.journal[mark.end - 1].count > mark.lastCount) {
        fresh.push_back(s.journal[mark.end - 1]);
        fresh.back().count -= mark.lastCount;
    }
    fresh.insert(fresh.end(), s.journal.begin() + static_cast<std::ptrdiff_t>(mark.end), s.journal.end());
    mark.end = s.journal.size();
    mark.lastCount = s.journal.empty() ? 0 : s.journal.back().count;
    return Journal(std::move(fresh));
}
void World::ClearJournal()
{
    auto l = Lock();
    State().journal.clear();
    ++State().journalEpoch;
}
void World::SetJournalEnabled(bool enabled)
{
    State().journalEnabled.store(enabled);
}

bool World::EmitWarning(int severity, const char* text)
{
    SteamAPIWarningMessageHook_t hook;
    {
        auto l = Lock();
        hook = State().warningHook;
    }
    if (!hook)
        return false;
    hook(severity, text);  // outside the lock: the hook may call the SDK
    return true;
}
bool World::HasWarningHook() const
{
    auto l = Lock();
    return State().warningHook != nullptr;
}

void World::DefineStat(const std::string& name, int32 value)
{
    auto l = Lock();
    State().stats[name] = value;
}
std::optional<int32> World::Stat(const std::string& name) const
{
    auto l = Lock();
    auto found = State().stats.find(name);
    if (found == State().stats.end())
        return std::nullopt;
    return found->second;
}
void World::DefineAchievement(const std::string& name, bool unlocked)
{
    auto l = Lock();
    State().achievements[name] = unlocked;
}
std::optional<bool> World::AchievementUnlocked(const std::string& name) const
{
    auto l = Lock();
    auto found = State().achievements.find(name);
    if (found == State().achievements.end())
        return std::nullopt;
    return found->second;
}
void World::SetStatsReceivedResult(EResult result, uint64 gameId)
{
    auto l = Lock();
    State().statsReceivedResult = result;
    State().statsReceivedGameId = gameId;
}
void World::SetStatsStoredResult(EResult result, uint64 gameId)
{
    auto l = Lock();
    State().statsStoredResult = result;
    State().statsStoredGameId = gameId;
}

void World::PutFile(const std::string& name, std::vector<uint8> bytes)
{
    auto l = Lock();
    State().files[name] = std::move(bytes);
}
std::optional<std::vector<uint8>> World::File(const std::string& name) const
{
    auto l = Lock();
    auto found = State().files.find(name);
    if (found == State().files.end())
        return std::nullopt;
    return found->second;
}
std::optional<bool> World::CloudEnabledForApp() const
{
    auto l = Lock();
    return State().cloudEnabledForApp;
}

void World::SetPersonaName(uint64 steamId, const std::string& name, bool known)
{
    auto l = Lock();
    if (known)
        State().personas[steamId] = Persona{name, Persona::Arrival::Known, {}, false};
    else
        State().personas[steamId] = Persona{name, Persona::Arrival::OnRequest,
                                            Delay::Pumps(static_cast<uint64_t>(State().latency)), false};
}
void World::SetPersonaNameArrives(uint64 steamId, const std::string& name, Delay delay)
{
    auto l = Lock();
    State().personas[steamId] = Persona{name, Persona::Arrival::OnRequest, delay, false};
}
void World::SetPersonaNameNever(uint64 steamId)
{
    auto l = Lock();
    State().personas[steamId] = Persona{"[unknown]", Persona::Arrival::Never, {}, false};
}
void World::SetAllPersonaNamesArrive(Delay delay)
{
    auto l = Lock();
    for (auto& [id, persona] : State().personas)
        persona = Persona{persona.name, Persona::Arrival::OnRequest, delay, false};
}
void World::SetAllPersonaNamesNever()
{
    auto l = Lock();
    for (auto& [id, persona] : State().personas)
        persona = Persona{persona.name, Persona::Arrival::Never, {}, false};
}
void World::SetFriends(std::vector<uint64> steamIds)
{
    auto l = Lock();
    State().friends = std::move(steamIds);
}
std::vector<std::pair<AppId_t, EOverlayToStoreFlag>> World::StoreOverlayRequests() const
{
    auto l = Lock();
    return State().storeRequests;
}
std::vector<std::pair<std::string, EActivateGameOverlayToWebPageMode>> World::WebPageRequests() const
{
    auto l = Lock();
    return State().webRequests;
}

void World::AddLeaderboard(const std::string& name, ELeaderboardSortMethod sort,
                           ELeaderboardDisplayType display, std::vector<LeaderboardRow> rows)
{
    auto l = Lock();
    Leaderboard board;
    board.handle = State().leaderboards.size() + 1;
    board.name = name;
    board.sort = sort;
    board.display = display;
    board.rows = std::move(rows);
    SortRows(board);
    State().leaderboards.push_back(std::move(board));
}
void World::AddGeneratedLeaderboard(const std::string& name, ELeaderboardSortMethod sort,
                                    ELeaderboardDisplayType display, int count, uint64 seed,
                                    std::vector<LeaderboardRow> rows)
{
    GeneratedPlayers players = GeneratePlayers(count, seed);  // outside the lock: 100,000 rows take a while
    rows.insert(rows.end(), std::make_move_iterator(players.rows.begin()),
                std::make_move_iterator(players.rows.end()));
    {
        auto l = Lock();
        for (std::size_t i = 0; i < players.names.size(); ++i)
            State().personas.emplace(
                GeneratedPlayerId(static_cast<int>(i)),
                Persona{std::move(players.names[i]), Persona::Arrival::Known, {}, false});
    }
    AddLeaderboard(name, sort, display, std::move(rows));
}
bool World::HasLeaderboard(const std::string& name) const
{
    auto l = Lock();
    for (const Leaderboard& b : State().leaderboards)
        if (b.name == name)
            return true;
    return false;
}
std::vector<LeaderboardRow> World::LeaderboardRows(const std::string& name) const
{
    auto l = Lock();
    for (const Leaderboard& b : State().leaderboards)
        if (b.name == name)
            return b.rows;
    return {};
}

std::size_t World::DownloadedEntrySets() const
{
    auto l = Lock();
    return State().downloads.size();
}

void World::AddWorkshopItem(WorkshopItem item)
{
    auto l = Lock();
    if (item.subscribed)
        item.state |= k_EItemStateSubscribed;
    State().items[item.id] = std::move(item);
}
std::optional<WorkshopItem> World::GetWorkshopItem(PublishedFileId_t id) const
{
    auto l = Lock();
    auto found = State().items.find(id);
    if (found == State().items.end())
        return std::nullopt;
    return found->second;
}
void World::SetUpdateProgress(EItemUpdateStatus status, uint64 processed, uint64 total)
{
    auto l = Lock();
    State().updateStatus = status;
    State().updateProcessed = processed;
    State().updateTotal = total;
}
namespace {

// One step of a planned download (World::StartWorkshopDownload).
void DownloadStep(WorldData& d, PublishedFileId_t id, const WorkshopDownload& download)
{
    auto found = d.items.find(id);
    if (found == d.items.end())
        return;
    WorkshopItem& item = found->second;
    const uint32 subscribed = item.state & k_EItemStateSubscribed;
    if (item.state & k_EItemStateDownloadPending)
        item.state = subscribed | k_EItemStateNeedsUpdate | k_EItemStateDownloading;
    else
        item.bytesDownloaded = std::min(item.bytesTotal, item.bytesDownloaded + download.bytesPerStep);
    if (item.bytesTotal > 0 && item.bytesDownloaded >= item.bytesTotal) {
        item.state = subscribed | k_EItemStateInstalled;
        item.folder = download.folder;
        item.sizeOnDisk = item.bytesTotal;
        return;
    }
    if (item.bytesTotal == 0 && download.bytesPerStep == 0)
        return;  // a download that never moves: stays at 0 of 0
    d.ScheduleAt(d.DueAfter(download.step),
                 [id, download](WorldData& data) { DownloadStep(data, id, download); });
}

}  // namespace

bool World::StartWorkshopDownload(PublishedFileId_t id, const WorkshopDownload& download)
{
    auto l = Lock();
    WorldState& s = State();
    auto found = s.items.find(id);
    if (found == s.items.end())
        return false;
    WorkshopItem& item = found->second;
    item.state = (item.state & k_EItemStateSubscribed) | k_EItemStateDownloadPending;
    item.folder.clear();
    item.bytesDownloaded = 0;
    item.bytesTotal = download.bytesTotal;
    s.ScheduleAt(s.DueAfter(download.step),
                 [id, download](WorldData& data) { DownloadStep(data, id, download); });
    s.SyncQueuedCount();
    return true;
}
void World::SetWorkshopUpload(const std::optional<WorkshopUpload>& upload)
{
    auto l = Lock();
    State().upload = upload;
}
void World::SetSubscribedList(std::optional<std::vector<PublishedFileId_t>> ids)
{
    auto l = Lock();
    State().subscribedList = std::move(ids);
}
void World::SetDetailQueryLimit(uint32 limit)
{
    auto l = Lock();
    State().detailQueryLimit = limit;
}
void World::SetNeedsLegalAgreement(bool needs)
{
    auto l = Lock();
    State().needsLegalAgreement = needs;
}
std::vector<WorkshopSubmission> World::Submissions() const
{
    auto l = Lock();
    return State().submissions;
}

}  // namespace simclient
