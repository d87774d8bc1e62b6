#include "services/store/ProductNumber.h"

#include <cstdint>
#include <cstdlib>

#include "data/DataManager.h"

namespace {

const char kConfigurationPath[] = "in-app-purchases/in-app-purchases.xml";

}  // namespace

int32_t ParseProductNumber(const char* text)
{
    // strtoll so the clamp is the same whatever the width of long.
    const long long value = std::strtoll(text, nullptr, 10);
    if (value > INT32_MAX)
        return INT32_MAX;
    if (value < INT32_MIN)
        return INT32_MIN;
    return static_cast<int32_t>(value);
}

int32_t LookUpProductNumber(const char* itemId, InlineString& text)
{
    const Database* database = DataManager::GetDatabase(kConfigurationPath);
    const DataNode* node = DataArray::FindNode(database->FindArray("ITEMS"), itemId);
    text.Assign(node != nullptr ? node->GetValue("steam_id") : nullptr);
    if (text.Text() == nullptr)
        return 0;
    return ParseProductNumber(text.Text());
}
