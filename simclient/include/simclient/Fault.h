// One injected failure for one kind of SDK call, e.g.
//   world.InjectFault("UploadLeaderboardScore", Fault::ZeroHandle());
//   world.InjectFault("FileRead", Fault::ShortRead(3));
//   world.InjectFault("FindOrCreateLeaderboard", Fault::IoFailure().Skip(1));
//   world.InjectFault("DownloadLeaderboardEntries", Fault::RandomLatency(20).Always());
//   world.InjectFault("UploadLeaderboardScore", Fault::Fail().Chance(10).Always());
// On the asynchronous calls Fail is the result saying no: m_bLeaderboardFound 0 for a find,
// m_bSuccess 0 for an upload, no rows for a download.
// A fault applies to the next matching call (after Skip calls), Times() calls in a row;
// every fault queued for a call kind applies to the same call, so they combine.
#ifndef SIMCLIENT_FAULT_H
#define SIMCLIENT_FAULT_H

#include <steam/steam_api.h>

namespace simclient {

struct Fault {
    enum class Kind {
        Fail,           // the call returns its failure value (false, 0, invalid handle, null)
        ZeroHandle,     // an asynchronous call returns k_uAPICallInvalid; nothing is queued
        IoFailure,      // the call result arrives with bIOFailure = true
        Result,         // the result struct carries this EResult (or "not found"/"no success")
        ExtraLatency,   // delivery waits this many more pumps
        ShortRead,      // FileRead returns at most this many bytes
        Drop,           // a handle is returned but its result never arrives
        RandomLatency,  // delivery waits 0 to this many more pumps, chosen per call
    };

    Kind kind = Kind::Fail;
    int value = 0;
    int skip = 0;   // matching calls to let through first
    int times = 1;  // calls affected; 0 means every call from then on
    // Percent of the matching calls (after Skip) that the fault hits, chosen per call with
    // the world's fault seed (World::SetFaultSeed); a call it spares doesn't count in Times.
    int chance = 100;

    static Fault Fail() { return Fault{Kind::Fail}; }
    static Fault ZeroHandle() { return Fault{Kind::ZeroHandle}; }
    static Fault IoFailure() { return Fault{Kind::IoFailure}; }
    static Fault Result(EResult r) { return Fault{Kind::Result, r}; }
    static Fault ExtraLatency(int pumps) { return Fault{Kind::ExtraLatency, pumps}; }
    static Fault ShortRead(int bytes) { return Fault{Kind::ShortRead, bytes}; }
    static Fault Drop() { return Fault{Kind::Drop}; }
    static Fault RandomLatency(int maxPumps) { return Fault{Kind::RandomLatency, maxPumps}; }

    Fault Skip(int n) const
    {
        Fault f = *this;
        f.skip = n;
        return f;
    }
    Fault Times(int n) const
    {
        Fault f = *this;
        f.times = n;
        return f;
    }
    Fault Always() const { return Times(0); }
    Fault Chance(int percent) const
    {
        Fault f = *this;
        f.chance = percent;
        return f;
    }
};

}  // namespace simclient

#endif  // SIMCLIENT_FAULT_H
