// Service 4: the store. Its answers are events 32, 33 and 34, decoded in the timeline.
#include "run/Operations.h"
#include "services/store/InAppPurchaseImplementation.h"

namespace steamext::run {

namespace {

InAppPurchaseImplementation* Store(const CallTarget& target)
{
    return ServiceAs<InAppPurchaseImplementation>(target, kServiceStore, "store");
}

}  // namespace

void RegisterStoreOperations(OperationTable& table)
{
    using Args = std::vector<ArgValue>;
    AddBaseOperations(table, "store", kServiceStore);
    table.Add({"store.QueryItems",
               {{"list", ArgType::Text}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Store(t)->QueryItems(TextArg(a[0]));
                   return NoResult();
               }});
    table.Add({"store.PurchaseItem",
               {{"itemId", ArgType::Text}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Store(t)->PurchaseItem(TextArg(a[0]));
                   return NoResult();
               }});
    table.Add({"store.ListItems", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Store(t)->ListItems();
                   return NoResult();
               }});
    table.Add({"store.IsStoreOpen", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(Store(t)->IsStoreOpen());
               }});
}

}  // namespace steamext::run
