// The leaderboard service as the engine sees it, with helpers that step its
// threads on the manual clock: the configuration thread is joined, the queue
// threads are woken by one millisecond and waited for until they sleep again,
// and results threads are joined after the pump that started them.
#pragma once

#include <string>
#include <vector>

#include "ModuleHarness.h"
#include "services/leaderboards/LeaderboardsImplementation.h"
#include "services/leaderboards/ScoreEntry.h"

namespace leaderboard_test {

constexpr const char* kConfigThread = "Steam_Leaderboards_Initialize";
constexpr const char* kRequestThread = "Steam_Leaderboards_RequestScore";
constexpr const char* kSubmitThread = "Steam_Leaderboards_SubmitScore";
constexpr const char* kUserThread = "Steam_Leaderboards_RequestUser";
constexpr const char* kResultsThread = "STEAM_ProcessResultsDownloadResults";
constexpr const char* kConfigPath = "leaderboards/leaderboards.xml";

constexpr const char* kXmlHead = "<?xml version=\"1.0\"?>\n";

// A configuration file with one node per text of `nodes` (the node's attributes).
inline std::string ConfigWith(const std::vector<std::string>& nodes)
{
    std::string xml = std::string(kXmlHead) + "<root><array id=\"CATEGORIES\">";
    for (const std::string& node : nodes)
        xml += "<node " + node + "/>";
    return xml + "</array></root>";
}

// A player id whose low 32 bits are `account`.
inline uint64 Player(uint32_t account)
{
    return kIndividualAccountBase + account;
}

class LeaderboardTest : public ModuleTest {
protected:
    // Loads `xml` as the configuration, starts the module and the service, waits for
    // the configuration thread and delivers the finds. False if anything failed.
    void StartService(const std::string& xml)
    {
        engine.SetFeatureEnabled("LEADERBOARDS", true);
        engine.Files().AddMemoryFile(kConfigPath, xml);
        ASSERT_TRUE(Start());
        service = ServiceAt<LeaderboardsImplementation>(2);
        ASSERT_NE(service, nullptr);
        ASSERT_TRUE(service->Initialize());
        engine.Threads().Join(kConfigThread);
        AwaitQueueThreadsAsleep();
        module->Update();
    }

    // The queue threads must be asleep before anything is queued: one that has
    // found its queue empty but not yet slept would sleep through the first step.
    void AwaitQueueThreadsAsleep()
    {
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kRequestThread));
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kSubmitThread));
    }

    // Wakes the queue threads for one pass of everything queued.
    void ServeQueues()
    {
        engine.Time().Advance(1);
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kRequestThread));
        ASSERT_TRUE(engine.Time().WaitUntilSleeping(kSubmitThread));
    }

    // Pumps once and waits for the results threads that the pump started.
    void DeliverAndJoin()
    {
        module->Update();
        engine.Threads().Join(kResultsThread);
    }

    // Queues, serves, delivers: the scores events that one request leads to.
    std::vector<simengine::PostedEvent> EventsOf(int32_t start, int32_t count, int32_t filter,
                                                 const char* category)
    {
        const uint64_t mark = engine.Records().Mark();
        EXPECT_TRUE(service->RequestScores(start, count, filter, category));
        ServeQueues();
        DeliverAndJoin();
        return engine.Records().Since(mark).Events(19);
    }

    // Arguments of the platform calls named `name`, in order.
    std::vector<std::string> CallArgs(const std::string& name) const
    {
        std::vector<std::string> args;
        for (const simclient::JournalEntry& entry : world.GetJournal().Calls(name))
            for (uint64_t i = 0; i < entry.count; ++i)
                args.push_back(entry.args);
        return args;
    }

    // A board of `count` rows with scores count..1 and known names "P<i>".
    void AddBoard(const std::string& name, int count, uint32_t firstAccount = 1000)
    {
        std::vector<simclient::LeaderboardRow> rows;
        for (int i = 0; i < count; ++i) {
            const uint64 id = Player(firstAccount + static_cast<uint32_t>(i));
            world.SetPersonaName(id, "P" + std::to_string(i));
            rows.push_back({id, count - i, {i, i + 1}, k_UGCHandleInvalid});
        }
        world.AddLeaderboard(name, k_ELeaderboardSortMethodDescending, k_ELeaderboardDisplayTypeNumeric,
                             std::move(rows));
    }

    LeaderboardsImplementation* service = nullptr;
};

}  // namespace leaderboard_test
