#include <cstring>
#include <string>

#include <gtest/gtest.h>

#include "../foundation/RefusingTextHeap.h"
#include "data/DataArray.h"
#include "data/DataNode.h"
#include "data/Database.h"
#include "data/HashedName.h"

namespace {

// "bA" and "af" hash alike (98 * 37 + 65 == 97 * 37 + 102): only the text tells them apart.
constexpr const char* kCollideA = "bA";
constexpr const char* kCollideB = "af";

TEST(HashText, Values)
{
    // Catches signed bytes, a counted terminator, or a different multiplier.
    // Expected values worked out by hand from h = h * 37 + byte mod 2^32.
    struct Row {
        const char* text;
        uint32_t hash;
    };
    const Row rows[] = {
        {nullptr, 0},
        {"", 0},
        {"a", 97},
        {"abc", 136518},
        {"id", 3985},
        {"DATA", 3536562},
        {"\xff", 255},
        {"\xff\x80", 9563},
        {"\x80"
         "abc",
         6620102},
        {"zzzzzzzzzz", 3689885900u},
        {"leaderboards/leaderboards.xml", 1999625986u},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.text != nullptr ? row.text : "(null)");
        EXPECT_EQ(HashText(row.text), row.hash);
    }
    EXPECT_EQ(HashText(kCollideA), HashText(kCollideB));
}

TEST(HashedName, SetCopiesAndHashes)
{
    // Catches a name that keeps the caller's pointer, or frees its text before copying it.
    char source[] = "abc";
    HashedName name;
    name.Set(source);
    ASSERT_NE(name.text, nullptr);
    EXPECT_NE(name.text, source);
    source[0] = 'X';
    EXPECT_STREQ(name.text, "abc");
    EXPECT_EQ(name.hash, 136518u);

    name.Set(name.text + 1);
    EXPECT_STREQ(name.text, "bc");
    EXPECT_EQ(name.hash, HashText("bc"));

    name.Set(nullptr);
    EXPECT_EQ(name.text, nullptr);
    EXPECT_EQ(name.hash, 0u);
}

struct LookupRow {
    const char* name;
    const char* expected;  // null: nothing found
};

const char* Show(const char* text)
{
    return text != nullptr ? text : "(null)";
}

TEST(DataNode, GetValue)
{
    // Catches a lookup that trusts the hash alone, matches a nameless pair, or finds a
    // later duplicate, and pairs that keep the caller's texts instead of copies.
    char id[] = "id";
    char value[] = "node-1";
    DataNode node;
    node.AddValue(id, value);
    id[0] = 'X';
    value[0] = 'X';
    node.AddValue(nullptr, "nameless");
    node.AddValue("", "empty-name");
    node.AddValue("name", "first");
    node.AddValue("name", "second");
    node.AddValue("novalue", nullptr);
    node.AddValue(kCollideA, "collide");
    ASSERT_EQ(node.values.count, 7);

    const LookupRow rows[] = {
        {"id", "node-1"},       {"", "empty-name"},   {"name", "first"},
        {"Name", nullptr},      {"novalue", nullptr}, {"missing", nullptr},
        {kCollideA, "collide"}, {kCollideB, nullptr}, {nullptr, nullptr},
    };
    for (const LookupRow& row : rows) {
        SCOPED_TRACE(Show(row.name));
        const char* value = node.GetValue(row.name);
        if (row.expected == nullptr) {
            EXPECT_EQ(value, nullptr);
        } else {
            ASSERT_NE(value, nullptr);
            EXPECT_STREQ(value, row.expected);
        }
    }
}

TEST(DataArray, FindNode)
{
    // Catches a null id taken as the empty one (both hash to 0), a hash-only match,
    // and a lookup that fails on a missing array or on one without nodes.
    Database database;
    DataArray* array = database.AddArray();
    DataNode* noId = array->AddNode();
    DataNode* emptyId = array->AddNode();
    emptyId->SetId("");
    DataNode* x1 = array->AddNode();
    x1->SetId("x");
    DataNode* x2 = array->AddNode();
    x2->SetId("x");
    DataNode* collide = array->AddNode();
    collide->SetId(kCollideA);
    array->nodes.Add(nullptr);  // a hole is skipped, here and at destruction

    struct Row {
        const char* id;
        const DataNode* expected;
    };
    const Row rows[] = {
        {"", emptyId},        {"x", x1},          {"X", nullptr}, {kCollideA, collide}, {kCollideB, nullptr},
        {"missing", nullptr}, {nullptr, nullptr},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(Show(row.id));
        EXPECT_EQ(array->FindNode(row.id), row.expected);
    }
    EXPECT_NE(x2, x1);
    EXPECT_EQ(noId->array, array);
    EXPECT_EQ(array->database, &database);
    // The static form takes a missing array, as FindArray gives it.
    EXPECT_EQ(DataArray::FindNode(array, "x"), x1);
    EXPECT_EQ(DataArray::FindNode(nullptr, "x"), nullptr);
    EXPECT_EQ(DataArray().FindNode(""), nullptr);
}

TEST(DataArray, SetValue)
{
    // Catches "id" stored as a pair, a null value that erases, a repeat that
    // appends, and a replaced value freed to the wrong place (heap or arena, ASan).
    Database database;
    DataArray onHeap;
    for (DataArray* each : {&onHeap, database.AddArray()}) {
        SCOPED_TRACE(each == &onHeap ? "heap" : "arena");
        DataArray& array = *each;
        array.SetValue("id", "first");
        array.SetValue("kind", "a");
        array.SetValue("id", "board");
        array.SetValue("kind", "b");
        array.SetValue("kind", nullptr);
        array.SetValue("empty", nullptr);
        array.SetValue(nullptr, "ignored");
        array.SetValue("Kind", "c");

        EXPECT_STREQ(array.name.text, "board");
        EXPECT_EQ(array.name.hash, HashText("board"));
        ASSERT_EQ(array.values.count, 3);
        EXPECT_STREQ(array.values[0].name.text, "kind");
        EXPECT_STREQ(array.values[0].value, "b");
        EXPECT_STREQ(array.values[1].name.text, "empty");
        EXPECT_EQ(array.values[1].value, nullptr);
        EXPECT_STREQ(array.values[2].name.text, "Kind");

        array.SetValue("empty", "now");
        EXPECT_STREQ(array.values[1].value, "now");
        array.SetValue("id", nullptr);
        EXPECT_EQ(array.name.text, nullptr);
    }
}

TEST(Database, FindArray)
{
    // Catches a nameless array matched by the empty text, or a later duplicate returned.
    Database database;
    DataArray* nameless = database.AddArray();
    DataArray* empty = database.AddArray();
    empty->SetName("");
    DataArray* a1 = database.AddArray();
    a1->SetName("A");
    DataArray* b = database.AddArray();
    b->SetName("B");
    DataArray* a2 = database.AddArray();
    a2->SetName("A");

    struct Row {
        const char* name;
        const DataArray* expected;
    };
    const Row rows[] = {{"A", a1}, {"B", b}, {"", empty}, {"a", nullptr}, {"C", nullptr}, {nullptr, nullptr}};
    for (const Row& row : rows) {
        SCOPED_TRACE(Show(row.name));
        EXPECT_EQ(database.FindArray(row.name), row.expected);
    }
    EXPECT_NE(nameless, a2);
}

TEST(Database, ClearGivesTheTreeBackAndKeepsPathAndBlock)
{
    // Catches a Clear that frees the array block or the path, keeps (or loses track
    // of) the arena's chunks, or leaves arrays findable, and a rebuilt tree that
    // reads stale memory (under ASan).
    Database database;
    database.SetPath("boards.xml");
    for (int round = 0; round < 2; ++round) {
        SCOPED_TRACE(round);
        DataArray* array = database.AddArray();
        array->SetName("boards");
        for (int n = 0; n < 500; ++n) {
            const std::string id = "board_" + std::to_string(n);
            DataNode* node = array->AddNode();
            node->SetId(id.c_str());
            node->AddValue("sort", n % 2 ? "ascending" : "descending");
        }
        // Pairs that outgrow their block move within the arena, never through the heap.
        DataNode* grown = array->nodes[1];
        for (int k = 0; k < 10; ++k)
            grown->AddValue(("k" + std::to_string(k)).c_str(), "v");
        EXPECT_STREQ(grown->GetValue("k9"), "v");
        // An id set from its own text must not read a released copy.
        array->nodes[0]->SetId(array->nodes[0]->id.text + 2);
        EXPECT_STREQ(array->nodes[0]->id.text, "ard_0");
        EXPECT_EQ(array->nodes[0]->id.hash, HashText("ard_0"));
        ASSERT_EQ(DataArray::FindNode(database.FindArray("boards"), "board_499"), array->nodes[499]);
        EXPECT_STREQ(array->nodes[499]->GetValue("sort"), "ascending");
        EXPECT_GT(database.arena.ChunkCount(), 0);

        DataArray** block = database.arrays.data;
        database.Clear();
        EXPECT_EQ(database.arena.ChunkCount(), 0);
        EXPECT_EQ(database.arrays.count, 0);
        EXPECT_EQ(database.arrays.data, block);
        EXPECT_STREQ(database.path.text, "boards.xml");
        for (const char* name : {"boards", ""})
            EXPECT_EQ(database.FindArray(name), nullptr) << name;
    }
}

TEST(Database, RefusedTextsAreNullAndSkipped)
{
    // Catches a copy that is hashed or read although the heap refused it, and a
    // lookup that dereferences such a name.
    Database database;
    DataArray* array = database.AddArray();
    DataNode* node = array->AddNode();
    {
        RefusingTextHeap heap;
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

}  // namespace
