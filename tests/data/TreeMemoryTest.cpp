// Memory of a database's tree: texts, nodes and pair blocks come from the
// database's arena, go with Clear, and tolerate a refusing text heap.
#include <string>

#include <gtest/gtest.h>

#include "../foundation/CountingTextHeap.h"
#include "data/DataArray.h"
#include "data/DataNode.h"
#include "data/Database.h"

namespace {

void Build(Database& database, int nodes)
{
    DataArray* array = database.AddArray();
    array->SetName("boards");
    array->SetValue("version", "2");
    for (int n = 0; n < nodes; ++n) {
        const std::string id = "board_" + std::to_string(n);
        DataNode* node = array->AddNode();
        node->SetId(id.c_str());
        node->ReserveValues(3);
        node->AddValue("id", id.c_str());
        node->AddValue("sort", n % 2 ? "ascending" : "descending");
        node->AddValue("DATA", nullptr);
    }
}

void ExpectBuilt(const Database& database, int nodes)
{
    const DataArray* array = database.FindArray("boards");
    ASSERT_NE(array, nullptr);
    ASSERT_EQ(array->nodes.count, nodes);
    ASSERT_EQ(array->values.count, 1);
    EXPECT_STREQ(array->values[0].value, "2");
    for (int n = 0; n < nodes; ++n) {
        const std::string id = "board_" + std::to_string(n);
        const DataNode* node = array->FindNode(id.c_str());
        ASSERT_EQ(node, array->nodes[n]) << id;
        EXPECT_STREQ(node->GetValue("id"), id.c_str());
        EXPECT_STREQ(node->GetValue("sort"), n % 2 ? "ascending" : "descending");
        EXPECT_EQ(node->GetValue("DATA"), nullptr);
        EXPECT_EQ(node->values.capacity, 3);
    }
}

TEST(TreeMemory, TextsComeFromChunksAndClearGivesThemBack)
{
    // Catches a tree that takes a heap block per text again, or a Clear that keeps
    // (or loses track of) the chunks, or a rebuilt tree reading stale memory.
    Database database;
    database.SetPath("boards.xml");
    for (int round = 0; round < 2; ++round) {
        SCOPED_TRACE(round);
        {
            CountingTextHeap heap;
            Build(database, 500);
            // 500 nodes hold 2500 texts.
            EXPECT_LE(heap.Allocations(), 12);
        }
        ExpectBuilt(database, 500);
        EXPECT_GT(database.arena.ChunkCount(), 0);
        database.Clear();
        EXPECT_EQ(database.arena.ChunkCount(), 0);
        EXPECT_EQ(database.FindArray("boards"), nullptr);
        EXPECT_STREQ(database.path.text, "boards.xml");
    }
    Build(database, 3);
    ExpectBuilt(database, 3);
}

TEST(TreeMemory, RefusedTextsAreNullAndSkipped)
{
    // Catches an arena copy that is hashed or read although the heap refused it.
    Database database;
    DataArray* array = database.AddArray();
    DataNode* node = array->AddNode();
    {
        CountingTextHeap heap;
        heap.FailAll();
        array->SetName("A");
        array->SetValue("k", "v");
        node->SetId("x");
        node->AddValue("a", "b");
    }
    EXPECT_EQ(array->name.text, nullptr);
    ASSERT_EQ(array->values.count, 1);
    EXPECT_EQ(array->values[0].name.text, nullptr);
    EXPECT_EQ(array->values[0].value, nullptr);
    EXPECT_EQ(node->id.text, nullptr);
    EXPECT_EQ(node->id.hash, 0u);
    ASSERT_EQ(node->values.count, 1);
    EXPECT_EQ(node->values[0].name.text, nullptr);
    EXPECT_EQ(node->GetValue("a"), nullptr);
    EXPECT_EQ(node->GetValue(""), nullptr);
    EXPECT_EQ(array->FindNode(""), nullptr);
    EXPECT_EQ(database.FindArray(""), nullptr);
}

TEST(TreeMemory, ArenaTreeKeepsTheRulesOfTheHeapTree)
{
    // Catches an arena node whose pairs grow by a different rule or through the heap
    // (freeing arena memory), a name set from its own text that reads a freed copy,
    // and an array pair whose replaced value is freed to the heap.
    Database database;
    DataArray* array = database.AddArray();
    DataNode* node = array->AddNode();
    EXPECT_EQ(node->arena, &database.arena);
    node->ReserveValues(1);
    const int32_t capacities[] = {1, 8, 8, 8, 8, 8, 8, 8, 16, 16};
    for (int i = 0; i < 10; ++i) {
        const std::string name = "k" + std::to_string(i);
        node->AddValue(name.c_str(), name.c_str());
        EXPECT_EQ(node->values.capacity, capacities[i]) << i;
    }
    for (int i = 0; i < 10; ++i) {
        const std::string name = "k" + std::to_string(i);
        EXPECT_STREQ(node->GetValue(name.c_str()), name.c_str());
    }

    node->SetId("board");
    node->SetId(node->id.text + 2);
    EXPECT_STREQ(node->id.text, "ard");
    EXPECT_EQ(node->id.hash, HashText("ard"));

    array->SetValue("kind", "a");
    array->SetValue("kind", "b");
    array->SetValue("id", "named");
    ASSERT_EQ(array->values.count, 1);
    EXPECT_STREQ(array->values[0].value, "b");
    EXPECT_STREQ(array->name.text, "named");
}

}  // namespace
