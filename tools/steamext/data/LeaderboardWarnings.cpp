// What the leaderboard service would quietly take as a default or never reach in
// "leaderboards/leaderboards.xml". The service reads the first array "CATEGORIES" and,
// of each node, the id (the last "id" attribute), "sort" and "display_type" (the first of
// each), comparing the words exactly.
#include <cstring>
#include <map>
#include <string>

#include "data/DataWarnings.h"

namespace datatool {

namespace {

// The longest category name the service's clients keep; a longer one can't be reached.
constexpr std::size_t kCategoryNameMax = 31;

const char* const kSortWords[] = {"ASCENDING", "LOWEST_SCORE_FIRST", "DESCENDING"};
const char* const kDisplayWords[] = {"NUMERIC", "SECONDS", "MILLISECONDS"};

template <std::size_t N> bool OneOf(const char* value, const char* const (&words)[N])
{
    for (const char* word : words)
        if (std::strcmp(value, word) == 0)
            return true;
    return false;
}

template <std::size_t N> std::string WordList(const char* const (&words)[N])
{
    std::string list;
    for (const char* word : words)
        list += std::string(list.empty() ? "" : ", ") + word;
    return list;
}

std::string Quoted(const std::string& text)
{
    return "\"" + text + "\"";
}

class CategoryScan {
public:
    std::vector<DataWarning> warnings;

    // Mirrors how the loader ends a node: its text and the block behind the text, or a
    // bare "</node>", belong to it; anything else behind it stands on its own.
    void Visit(const XmlBlock& block, int line)
    {
        const NodeTail tail = afterNode;
        afterNode = NodeTail::None;
        if (tail == NodeTail::TextSeen)
            return;
        if (tail == NodeTail::Open) {
            if (block.name == nullptr) {
                afterNode = NodeTail::TextSeen;
                return;
            }
            if (std::strcmp(block.name, "node") == 0 && block.closing && block.count == 0)
                return;
        }
        if (block.name == nullptr)
            return;
        const std::string name = block.name;
        if (name == "root" && !block.closing && rootLine == 0) {
            rootLine = line;
        } else if (name == "array") {
            VisitArray(block, line);
        } else if (name == "node") {
            afterNode = NodeTail::Open;
            if (inCategories) {
                ++nodesInCategories;
                VisitNode(block, line);
            }
        }
    }

    void Finish()
    {
        if (categoriesLine == 0)
            Warn(rootLine > 0 ? rootLine : 1, "no array \"CATEGORIES\": the game will have no leaderboards");
        else if (nodesInCategories == 0)
            Warn(categoriesLine, "the array \"CATEGORIES\" has no nodes: the game will have no leaderboards");
    }

private:
    enum class NodeTail {
        None,
        Open,     // a node was just read
        TextSeen  // and its text: the next block is dropped unseen
    };
    NodeTail afterNode = NodeTail::None;
    int rootLine = 0;
    int categoriesLine = 0;  // of the first array "CATEGORIES", the one the service reads
    bool inCategories = false;
    int nodesInCategories = 0;
    std::map<std::string, int> firstLineOfId;

    void Warn(int line, std::string text) { warnings.push_back({line, std::move(text)}); }

    void VisitArray(const XmlBlock& block, int line)
    {
        if (block.closing) {  // an array's end, or a self-closing array, which holds nothing
            inCategories = false;
            return;
        }
        const char* id = AttributeValue(block, "id", true);
        if (id == nullptr || std::strcmp(id, "CATEGORIES") != 0)
            return;
        if (categoriesLine != 0) {
            Warn(line, "a second array \"CATEGORIES\" (the first is on line " +
                           std::to_string(categoriesLine) + "): its categories are never read");
            return;
        }
        categoriesLine = line;
        inCategories = true;
    }

    void VisitNode(const XmlBlock& block, int line)
    {
        const char* id = AttributeValue(block, "id", true);
        if (id == nullptr) {
            Warn(line, "a category without \"id\": it has no name and can't be reached");
        } else {
            const std::string category = id;
            if (category.size() > kCategoryNameMax)
                Warn(line, "category id " + Quoted(category) + " is " + std::to_string(category.size()) +
                               " characters long: only the first 31 are kept, so the game can't reach it by "
                               "its name");
            auto first = firstLineOfId.emplace(category, line);
            if (!first.second)
                Warn(line, "category id " + Quoted(category) + " repeats the one on line " +
                               std::to_string(first.first->second) + ": requests only ever reach the first");
        }
        if (const char* sort = AttributeValue(block, "sort"); sort != nullptr && !OneOf(sort, kSortWords))
            Warn(line, "sort " + Quoted(sort) + " is none of " + WordList(kSortWords) +
                           " (compared exactly, case included): the board is sorted DESCENDING");
        if (const char* display = AttributeValue(block, "display_type");
            display != nullptr && !OneOf(display, kDisplayWords))
            Warn(line, "display_type " + Quoted(display) + " is none of " + WordList(kDisplayWords) +
                           " (compared exactly, case included): the board shows NUMERIC");
    }
};

}  // namespace

std::vector<DataWarning> WarnLeaderboards(const std::string& path, const std::string& bytes,
                                          const LoadOutcome& /*outcome*/)
{
    CategoryScan scan;
    if (!WalkXmlBlocks(path, bytes, [&scan](const XmlBlock& block, int line) { scan.Visit(block, line); }))
        return {};
    scan.Finish();
    return scan.warnings;
}

}  // namespace datatool
