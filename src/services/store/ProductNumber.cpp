#include "services/store/ProductNumber.h"

#include "data/DataManager.h"
#include "foundation/DecimalText.h"

namespace {

const char kConfigurationPath[] = "in-app-purchases/in-app-purchases.xml";

}  // namespace

int32_t LookUpProductNumber(const char* itemId, InlineString& text)
{
    const Database* database = DataManager::GetDatabase(kConfigurationPath);
    const DataNode* node = DataArray::FindNode(database->FindArray("ITEMS"), itemId);
    text.Assign(node != nullptr ? node->GetValue("steam_id") : nullptr);
    if (text.Text() == nullptr)
        return 0;
    return DecimalToInt32(text.Text());
}
