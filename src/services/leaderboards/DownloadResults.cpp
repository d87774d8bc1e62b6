#include "services/leaderboards/DownloadResults.h"

#include <cstring>

#include "foundation/TextFormat.h"
#include "host/HostEvent.h"
#include "host/HostReport.h"
#include "services/leaderboards/LeaderboardsImplementation.h"
#include "services/leaderboards/ScoreEntry.h"

namespace {

// Asks for the user's name until the platform has it, pausing a millisecond
// between asks so the thread does not spin a core. Gives up once the download's
// wait has lasted kNameWaitMs of engine time, or when the engine quits (then the
// clock may stand still and nobody waits for the event any more).
void WaitForName(CSteamID user, uint32_t waitStartMs)
{
    while (SteamFriends()->RequestUserInformation(user, true)) {
        if (hostServices->IsQuitting() || hostServices->GetTimeMs() - waitStartMs >= kNameWaitMs)
            return;
        hostServices->threads->ThreadSleep(1);
    }
}

int32_t RaisedToZero(int32_t value)
{
    return value < 0 ? 0 : value;
}

void BuildRecord(ScoreEntry& record, const LeaderboardEntry_t& row, const int32_t* details,
                 uint32_t waitStartMs)
{
    std::memset(&record, 0, sizeof record);
    record.score = RaisedToZero(row.m_nScore);
    record.rank = RaisedToZero(row.m_nGlobalRank);
    std::memcpy(record.details, details, kScoreDetailsBytes);
    record.detailsSize = kScoreDetailsBytes;
    record.reserved = 0;
    WaitForName(row.m_steamIDUser, waitStartMs);
    char plain[kPlainNameSize];
    PlainTextName(SteamFriends()->GetFriendPersonaName(row.m_steamIDUser), plain);
    FormatToBuffer(record.userName, sizeof record.userName, "%s", plain);
    FormatToBuffer(record.userId, 63, "%d",
                   static_cast<int32_t>(static_cast<uint32_t>(row.m_steamIDUser.ConvertToUint64())));
}

// Bytes that follow a lead byte of a multi-byte sequence; 0 for any other byte.
int32_t FollowingBytes(unsigned char byte)
{
    if ((byte & 0xE0) == 0xC0)
        return 1;
    if ((byte & 0xF0) == 0xE0)
        return 2;
    if ((byte & 0xF8) == 0xF0)
        return 3;
    return 0;
}

}  // namespace

void PlainTextName(const char* name, char (&buffer)[kPlainNameSize])
{
    int32_t written = 0;
    if (name != nullptr) {
        const char* at = name;
        while (*at != '\0' && written < kPlainNameSize - 1) {
            const int32_t following = FollowingBytes(static_cast<unsigned char>(*at));
            if (following == 0) {
                buffer[written++] = *at++;
                continue;
            }
            ++at;
            for (int32_t i = 0; i < following && *at != '\0'; ++i)
                ++at;
            buffer[written++] = ' ';
        }
    }
    buffer[written] = '\0';
}

int32_t ScoresEventStart(int32_t filter, int32_t count, int32_t firstRank)
{
    if (count <= 0)
        return 0;
    return filter == FilterFriends ? 1 : firstRank;
}

void ProcessResultsThread(void* argument)
{
    auto* results = static_cast<DownloadResults*>(argument);
    ScoreEntry* records = nullptr;
    if (results->count > 0)
        records = static_cast<ScoreEntry*>(
            hostServices->Allocate(results->count * static_cast<int32_t>(sizeof(ScoreEntry))));
    const uint32_t waitStartMs = hostServices->GetTimeMs();
    for (int32_t i = 0; i < results->count; ++i) {
        if (records != nullptr)
            BuildRecord(records[i], results->entries[i], results->details[i], waitStartMs);
        delete[] results->details[i];
    }
    // Without memory for the records the engine still gets its event, with no rows.
    const int32_t count = records != nullptr ? results->count : 0;
    const int32_t firstRank = count > 0 ? results->entries[0].m_nGlobalRank : 0;
    SendScoresEvent(results->category, results->filter == FilterFriends ? 1 : 0,
                    ScoresEventStart(results->filter, count, firstRank), count, records, results->total);
    delete[] results->details;
    delete results;
}

void SendScoresEvent(const char* category, int32_t friends, int32_t start, int32_t count, ScoreEntry* entries,
                     int32_t total)
{
    const size_t length = std::strlen(category);
    auto* categoryCopy = static_cast<char*>(hostServices->Allocate(static_cast<int32_t>(length + 1)));
    if (categoryCopy != nullptr)
        std::memcpy(categoryCopy, category, length + 1);

    ScoresEvent scores;
    std::memset(&scores, 0, sizeof scores);
    scores.type = kEventLeaderboardScores;
    scores.status = 1;
    scores.category = categoryCopy;
    scores.total = total;
    scores.filter = friends;
    scores.start = start;
    scores.count = count;
    if (count != 0)
        scores.entries = entries;

    const char* word = friends == 1 ? "FRIENDS" : friends == 0 ? "GLOBAL" : "ERROR";
    if (count >= 1)
        HostLogInfo("Sending event with scores %d..%d (%d scores of %d) for category '%s' with filter '%s'",
                    start, static_cast<int32_t>(int64_t{start} + count - 1), count, total, category, word);
    else
        HostLogInfo("Sending event with no scores (%d scores in category) for category '%s' with filter '%s'",
                    total, category, word);

    HostEvent event;
    std::memcpy(&event, &scores, sizeof event);
    hostServices->PostEvent(&event);
}
