// Loading an XML database: root, then arrays, then nodes, tested as the blocks
// come in. At the first violation the whole load is thrown away, so a database
// is either complete or empty, and the user is asked whether to try again.
//
//   LoadXmlWithRetry ── LoadXml ── XmlReader::Open ── ReadXmlBlocks
//          └─ "ShowPopup" after every failure; "TRY_AGAIN" reads the file anew
#include <cstring>

#include "data/Database.h"
#include "data/XmlReader.h"
#include "foundation/TextFormat.h"
#include "host/HostReport.h"

namespace {

const char* OrNull(const char* text)
{
    return text != nullptr ? text : "null";
}

bool Named(const XmlBlock* block, const char* keyword)
{
    return block->name != nullptr && std::strcmp(block->name, keyword) == 0;
}

// The keyword "id", tested once per attribute.
bool IsId(const char* name)
{
    return name[0] == 'i' && name[1] == 'd' && name[2] == '\0';
}

}  // namespace

bool Database::LoadXmlWithRetry(const char* newPath)
{
    for (;;) {
        if (LoadXml(newPath))
            return true;
        const InlineString text =
            FormatString("CANCEL_TRY_CONTINUE,Failed to load XML file '%s'.", OrNull(newPath));
        const char* answer = HostCommandIfPresent("ShowPopup", text.Text());
        // Only the exact word tries again; any other answer, or none (no engine to
        // ask), gives up.
        if (answer == nullptr || std::strcmp(answer, "TRY_AGAIN") != 0)
            return false;
    }
}

bool Database::LoadXml(const char* newPath)
{
    XmlReader reader;
    return reader.Open(newPath) && ReadXmlBlocks(reader);
}

bool Database::ReadXmlBlocks(XmlReader& reader)
{
    const char* file = OrNull(reader.Path());
    int32_t nodeCount = 0;
    const auto fail = [this](auto... args) {
        HostReportError(1, args...);
        Clear();
        return false;
    };
    const auto atEnd = [&reader] { return reader.cursor >= static_cast<int32_t>(reader.size); };

    // [1] The root: a plain open tag named "root".
    const XmlBlock* block = reader.ReadBlock();
    if (block == nullptr || block->closing || !Named(block, "root"))
        return fail(
            "DataManager: XML database needs to be contained within 'root' block (not expecting '%s'). "
            "'%s' is invalid.",
            OrNull(block != nullptr ? block->name : nullptr), file);
    if (atEnd())
        return fail("DataManager: XML database needs to end with root block closing. '%s' is invalid.", file);

    for (;;) {
        // [2] Top level: arrays until </root>, then nothing more.
        block = reader.ReadBlock();
        if (block == nullptr)
            return fail("DataManager: XML database needs to end with root block closing. '%s' is invalid.",
                        file);
        if (block->closing && Named(block, "root")) {
            if (reader.ReadBlock() == nullptr)
                return true;
            return fail("DataManager: No blocks can exist after </root>. '%s' is invalid.", file);
        }
        if (!Named(block, "array"))
            return fail(
                "DataManager: root/array/node structure violated. '%s' is not 'array'. '%s' is invalid.",
                OrNull(block->name), file);
        if (block->closing) {
            // "</array>" or "<array .../>" here creates nothing.
            if (atEnd())
                return fail(
                    "DataManager: XML database needs to end with root block closing. '%s' is invalid.", file);
            continue;
        }

        // [3] A new array: "id" names it, the other attributes are its pairs.
        DataArray* array = AddArray();
        for (int32_t i = 0; i < block->count; ++i) {
            if (IsId(block->attributeNames[i]))
                array->SetName(block->attributeValues[i]);
            else
                array->SetValue(block->attributeNames[i], block->attributeValues[i]);
        }

        // [4] Array level: nodes until </array>. A block read behind a node may
        // stay pending, to be judged here.
        const XmlBlock* pending = nullptr;
        for (;;) {
            if (pending != nullptr) {
                block = pending;
                pending = nullptr;
            } else {
                block = reader.ReadBlock();
                if (block == nullptr)
                    return fail("DataManager: File '%s' ends unexpectedly. Not loaded.", file);
            }
            const bool isArray = Named(block, "array");
            if (isArray && !block->closing)
                return fail("DataManager: File '%s' has enclosing arrays which is not supported. Not loaded.",
                            file);
            if (!isArray && !Named(block, "node"))
                return fail(
                    "DataManager: in '%s' is expecting to find two types of elements inside root: 'array' "
                    "and 'node'. '%s' is not one of them.",
                    file, OrNull(block->name));
            if (isArray)
                break;

            // [5] A node: all its attributes, "id" too, are its pairs; the last
            // "id" is its id.
            const bool nodeClosing = block->closing;
            const char* id = nullptr;
            for (int32_t i = 0; i < block->count; ++i) {
                if (IsId(block->attributeNames[i]))
                    id = block->attributeValues[i];
            }
            DataNode* node = array->AddNode();
            node->SetId(id);
            ++nodeCount;
            node->ReserveValues(block->count + 1);
            for (int32_t i = 0; i < block->count; ++i)
                node->AddValue(block->attributeNames[i], block->attributeValues[i]);

            // The block's texts are gone after this read: messages use the node's copy.
            const XmlBlock* next = reader.ReadBlock();
            if (next == nullptr)
                return fail("DataManager: error parsing file '%s' after node #%d with id '%s'.", file,
                            nodeCount, OrNull(node->id.text));
            if (next->name == nullptr) {
                // Its text, then one more block, dropped unseen.
                node->AddValue(next->attributeNames[0], next->attributeValues[0]);
                reader.ReadBlock();
            } else {
                if (!nodeClosing && !(next->closing && Named(next, "node")))
                    return fail("DataManager: error parsing file '%s' after node #%d with id '%s'. Basic "
                                "root/array/node structure violated.",
                                file, nodeCount, OrNull(node->id.text));
                // "</node>" is used up; anything else is judged at the array level.
                if (!(next->closing && Named(next, "node") && next->count == 0))
                    pending = next;
            }
            if (atEnd())
                return fail(
                    "DataManager: XML database needs to end with root block closing. '%s' is invalid.", file);
        }

        if (atEnd())
            return fail("DataManager: XML database needs to end with root block closing. '%s' is invalid.",
                        file);
    }
}
