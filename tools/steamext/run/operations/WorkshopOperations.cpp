// Service 6: workshop items, subscriptions and publishing. GetItem and
// PublishItem give the service's own record, which the engine polls: a step
// keeps it ("keep_as") and later "read" steps follow its id and progress.
#include "run/Operations.h"
#include "services/workshop/UGCImplementation.h"
#include "services/workshop/UGCItem.h"

namespace steamext::run {

namespace {

constexpr RecordField kItemFields[] = {
    {"id", offsetof(UGCItem, id), FieldKind::TextPointer},
    {"title", offsetof(UGCItem, title), FieldKind::TextPointer},
    {"description", offsetof(UGCItem, description), FieldKind::TextPointer},
    {"tags", offsetof(UGCItem, tags), FieldKind::TextPointer},
    {"installPath", offsetof(UGCItem, installPath), FieldKind::TextPointer},
    {"contentPath", offsetof(UGCItem, contentPath), FieldKind::TextPointer},
    {"visibility", offsetof(UGCItem, visibility), FieldKind::Int32},
    {"subscribeAfterPublish", offsetof(UGCItem, subscribeAfterPublish), FieldKind::Bool8},
    {"progress", offsetof(UGCItem, progress), FieldKind::Int32},
};
static_assert(FieldsFit(kItemFields, sizeof(UGCItem)), "the item's fields lie inside its 64 bytes");
constexpr RecordLayout kItemLayout = MakeLayout("workshop item", sizeof(UGCItem), kItemFields);

UGCImplementation* Workshop(const CallTarget& target)
{
    return ServiceAs<UGCImplementation>(target, kServiceWorkshop, "workshop");
}

}  // namespace

void RegisterWorkshopOperations(OperationTable& table)
{
    using Args = std::vector<ArgValue>;
    AddBaseOperations(table, "workshop", kServiceWorkshop);
    table.Add({"workshop.RefreshItems", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Workshop(t)->RefreshItems();
                   return NoResult();
               }});
    table.Add({"workshop.IsItemListReady", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(Workshop(t)->IsItemListReady());
               }});
    table.Add({"workshop.GetItemCount", {}, ResultType::Int, [](const CallTarget& t, const Args&) {
                   return IntResult(Workshop(t)->GetItemCount());
               }});
    table.Add(
        {"workshop.GetItem",
         {{"index", ArgType::Int}},
         ResultType::Record,
         [](const CallTarget& t, const Args& a) { return RecordResult(Workshop(t)->GetItem(a[0].number)); },
         &kItemLayout});
    table.Add({"workshop.SubscribeItem",
               {{"id", ArgType::Text}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Workshop(t)->SubscribeItem(TextArg(a[0]));
                   return NoResult();
               }});
    table.Add({"workshop.UnsubscribeItem",
               {{"id", ArgType::Text}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Workshop(t)->UnsubscribeItem(TextArg(a[0]));
                   return NoResult();
               }});
    // The record is the engine's and lives only for the call; the result is the service's copy.
    table.Add({"workshop.PublishItem",
               {{"item", ArgType::Record, std::nullopt, -1, &kItemLayout}},
               ResultType::Record,
               [](const CallTarget& t, const Args& a) {
                   return RecordResult(Workshop(t)->PublishItem(RecordArg<UGCItem>(a[0])));
               },
               &kItemLayout});
    table.Add({"workshop.OpenWorkshopBrowser", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Workshop(t)->OpenWorkshopBrowser();
                   return NoResult();
               }});
}

}  // namespace steamext::run
