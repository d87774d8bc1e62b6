// The cache of databases: identity, case, endings, and its mutex calls.
#include <optional>
#include <string>

#include <gtest/gtest.h>

#include "data/DataManager.h"
#include "host/HostServices.h"
#include "simengine/Engine.h"

namespace {

// Each test uses paths of its own: the cache lives as long as the process.
simengine::Engine& FreshEngine()
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    hostServices = engine.Table();
    engine.Mutexes().ResetCounts();
    return engine;
}

const std::string kGood =
    "<?xml version=\"1.0\"?><root><array id=\"A\"><node id=\"n\" v=\"1\"/></array></root>";

int OpensOf(simengine::Engine& engine, const std::string& path)
{
    int opens = 0;
    for (const simengine::FileOpenCall& call : engine.Records().All().FileOpens())
        opens += call.path == path;
    return opens;
}

TEST(DataCache, SamePathSameDatabaseLoadedOnce)
{
    // Catches a cache that reloads, or matches by hash alone.
    simengine::Engine& engine = FreshEngine();
    engine.Files().AddMemoryFile("cache/one.xml", kGood);
    Database* first = DataManager::GetDatabase("cache/one.xml");
    Database* second = DataManager::GetDatabase("cache/one.xml");
    EXPECT_EQ(first, second);
    EXPECT_EQ(OpensOf(engine, "cache/one.xml"), 1);
    const DataNode* node = DataArray::FindNode(first->FindArray("A"), "n");
    ASSERT_NE(node, nullptr);
    EXPECT_STREQ(node->GetValue("v"), "1");

    // "bA" and "af" hash alike: two paths, two databases.
    engine.Files().AddMemoryFile("cache/bA.xml", kGood);
    engine.Files().AddMemoryFile("cache/af.xml", kGood);
    EXPECT_NE(DataManager::GetDatabase("cache/bA.xml"), DataManager::GetDatabase("cache/af.xml"));
}

TEST(DataCache, CaseAndEndings)
{
    // Catches a case-insensitive key, a case-sensitive ending, and the unknown
    // type reported more than once.
    simengine::Engine& engine = FreshEngine();
    engine.Files().AddMemoryFile("cache/Case.XML", kGood);
    engine.Files().AddMemoryFile("cache/case.xml", kGood);
    engine.Files().AddMemoryFile("cache/t.Csv", "a\n12\n");
    engine.Files().AddMemoryFile("cache/t.DAT", kGood);
    Database* upper = DataManager::GetDatabase("cache/Case.XML");
    EXPECT_NE(upper, DataManager::GetDatabase("cache/case.xml"));
    EXPECT_STREQ(upper->path.text, "cache/Case.XML");
    EXPECT_NE(upper->FindArray("A"), nullptr);
    EXPECT_EQ(DataManager::GetDatabase("cache/t.Csv")->arrays.count, 1);
    EXPECT_NE(DataManager::GetDatabase("cache/t.DAT")->FindArray("A"), nullptr);

    const std::string unknown = "Unknown database file type 'cache/x.txt'. Supported formats are: .csv .xml";
    Database* text = DataManager::GetDatabase("cache/x.txt");
    EXPECT_EQ(DataManager::GetDatabase("cache/x.txt"), text);
    EXPECT_EQ(engine.Records().All().Logs(simengine::LogKind::Report).size(), 1u);
    EXPECT_EQ(engine.Records().All().Logs(simengine::LogKind::Report)[0].text, unknown);
    EXPECT_EQ(text->arrays.count, 0);

    // Under four characters: no load, no message.
    Database* tiny = DataManager::GetDatabase("a.x");
    EXPECT_EQ(tiny->arrays.count, 0);
    EXPECT_EQ(engine.Records().All().Logs(simengine::LogKind::Report).size(), 1u);
    EXPECT_TRUE(engine.Records().All().FileOpens().size() == 4u);
}

TEST(DataCache, FailedLoadStaysAndNullPath)
{
    // Catches a failed load retried on the next request, and a null path that
    // matches an earlier one.
    simengine::Engine& engine = FreshEngine();
    Database* missing = DataManager::GetDatabase("cache/missing.xml");
    EXPECT_EQ(engine.Records().All().Popups().size(), 1u);
    EXPECT_EQ(DataManager::GetDatabase("cache/missing.xml"), missing);
    EXPECT_EQ(engine.Records().All().Popups().size(), 1u);
    EXPECT_EQ(missing->FindArray("A"), nullptr);

    Database* nullOne = DataManager::GetDatabase(nullptr);
    Database* nullTwo = DataManager::GetDatabase(nullptr);
    EXPECT_NE(nullOne, nullTwo);
    EXPECT_STREQ(nullOne->path.text, "");
}

// The engine's table with a HostCommand that notes the mutex counts when a load
// raises its popup.
simengine::MutexCounts countsAtPopup;
const char* (*engineCommand)(const char*, const char*) = nullptr;

const char* NotingCommand(const char* command, const char* argument)
{
    countsAtPopup = simengine::Engine::Instance().Mutexes().Counts("DATAMAN");
    return engineCommand(command, argument);
}

bool popupSawUnlocked()
{
    simengine::Engine& engine = FreshEngine();
    HostServices table = *engine.Table();
    engineCommand = table.HostCommand;
    table.HostCommand = NotingCommand;
    hostServices = &table;
    countsAtPopup = {};
    DataManager::GetDatabase("cache/mutex-missing.xml");
    hostServices = engine.Table();
    return countsAtPopup.locks == 1 && countsAtPopup.unlocks == 1;
}

TEST(DataCache, MutexPerRequestAndLoadOutsideIt)
{
    // Catches a handle kept across requests, an unbalanced lock, and a load run
    // while the list is locked.
    simengine::Engine& engine = FreshEngine();
    engine.Files().AddMemoryFile("cache/mutex.xml", kGood);
    DataManager::GetDatabase("cache/mutex.xml");
    DataManager::GetDatabase("cache/mutex.xml");
    const simengine::MutexCounts counts = engine.Mutexes().Counts("DATAMAN");
    EXPECT_EQ(counts.creates, 2);
    EXPECT_EQ(counts.locks, 2);
    EXPECT_EQ(counts.unlocks, 2);
    EXPECT_TRUE(engine.Records().All().Faults().empty());

    EXPECT_TRUE(popupSawUnlocked());
}

}  // namespace
