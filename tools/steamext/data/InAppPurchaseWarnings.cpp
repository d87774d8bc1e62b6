// Warnings for the store's configuration, "in-app-purchases/in-app-purchases.xml": what
// the module reads without a word but can never sell or never report.
#include "data/DataWarnings.h"

#include <cctype>
#include <cstring>
#include <map>
#include <vector>

#include "data/Database.h"
#include "foundation/DecimalText.h"

namespace datatool {

namespace {

// The line of each node tag of the first array "ITEMS", in file order, as the
// loader makes its nodes; empty when the text does not read.
std::vector<int> ItemLines(const std::string& path, const std::string& bytes)
{
    std::vector<int> lines;
    bool inItems = false;
    bool itemsSeen = false;
    WalkXmlBlocks(path, bytes, [&](const XmlBlock& block, int line) {
        if (block.name == nullptr)
            return;
        if (std::strcmp(block.name, "array") == 0) {
            const char* id = AttributeValue(block, "id", true);
            inItems = !block.closing && id != nullptr && std::strcmp(id, "ITEMS") == 0 && !itemsSeen;
            itemsSeen = itemsSeen || inItems;
        } else if (inItems && std::strcmp(block.name, "node") == 0 && !(block.closing && block.count == 0)) {
            lines.push_back(line);
        }
    });
    return lines;
}

// What the text holds beside the digits the platform gets.
bool HasTextAfterDigits(const char* text)
{
    const char* at = text;
    while (std::isspace(static_cast<unsigned char>(*at)) != 0)
        ++at;
    if (*at == '+' || *at == '-')
        ++at;
    const char* digits = at;
    while (std::isdigit(static_cast<unsigned char>(*at)) != 0)
        ++at;
    return at != digits && *at != '\0';
}

bool IsPlainDigits(const char* text)
{
    if (*text == '\0')
        return false;
    for (const char* at = text; *at != '\0'; ++at) {
        if (std::isdigit(static_cast<unsigned char>(*at)) == 0)
            return false;
    }
    return true;
}

class Reporter {
public:
    void Warn(int line, const std::string& text) { warnings.push_back({line, text}); }

    std::vector<DataWarning> warnings;
};

void CheckValue(Reporter& report, int line, const std::string& item, const char* text)
{
    const std::string shown = std::string("\"steam_id\" \"") + text + "\"";
    const int32_t number = DecimalToInt32(text);
    if (number == 0) {
        report.Warn(line, item + ": " + shown + " reads as 0: the item is not sold");
        return;
    }
    if (HasTextAfterDigits(text))
        report.Warn(line, item + ": " + shown +
                              " has characters after its digits: the platform is asked about " +
                              std::to_string(number) + ", the store address gets the whole text");
    else if (!IsPlainDigits(text))
        report.Warn(line, item + ": " + shown + " is not plain decimal digits: the platform is asked about " +
                              std::to_string(number) + ", the store address gets the whole text");
}

}  // namespace

std::vector<DataWarning> WarnInAppPurchases(const std::string& path, const std::string& bytes,
                                            const LoadOutcome& outcome)
{
    if (!outcome.loaded)
        return {};
    Reporter report;
    const DataArray* items = outcome.database->FindArray("ITEMS");
    if (items == nullptr) {
        report.Warn(0, "no array \"ITEMS\": nothing is sold");
        return report.warnings;
    }
    std::vector<int> lines = ItemLines(path, bytes);
    if (lines.size() != static_cast<size_t>(items->nodes.count))
        lines.assign(static_cast<size_t>(items->nodes.count), 0);  // the shape is odd: no lines then

    std::map<std::string, int> firstLine;
    for (int32_t index = 0; index < items->nodes.count; ++index) {
        const DataNode* node = items->nodes[index];
        const int line = lines[static_cast<size_t>(index)];
        if (node->id.text == nullptr) {
            report.Warn(line, "an item without an id: nothing can ask for it");
            continue;
        }
        const std::string id = node->id.text;
        const std::string item = "item \"" + id + "\"";
        if (!firstLine.emplace(id, line).second) {
            report.Warn(line, item + " repeats an id (first at line " + std::to_string(firstLine[id]) +
                                  "): only the first is read");
            continue;
        }
        const char* value = node->GetValue("steam_id");
        if (value == nullptr) {
            report.Warn(line, item + " has no \"steam_id\": the item is not sold");
            continue;
        }
        CheckValue(report, line, item, value);
        const int32_t number = DecimalToInt32(value);
        if (number != 0 && id != std::to_string(number))
            report.Warn(line, item + " is product " + std::to_string(number) + " but its id is not \"" +
                                  std::to_string(number) + "\": a purchase of it is never reported");
    }
    return report.warnings;
}

}  // namespace datatool
