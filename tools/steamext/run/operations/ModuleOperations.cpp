// The module's own operations, in the order of its table.
#include "frame/ExtensionModule.h"
#include "run/Operations.h"

namespace steamext::run {

void RegisterModuleOperations(OperationTable& table)
{
    using Args = std::vector<ArgValue>;
    table.Add({"GetModuleType", {}, ResultType::Int, [](const CallTarget& t, const Args&) {
                   return IntResult(t.module->GetModuleType());
               }});
    table.Add({"GetInterfaceStamp", {}, ResultType::Int, [](const CallTarget& t, const Args&) {
                   return IntResult(t.module->GetInterfaceStamp());
               }});
    table.Add({"GetName", {}, ResultType::Text, [](const CallTarget& t, const Args&) {
                   return TextResult(t.module->GetName());
               }});
    // The engine hands over its table of functions here; a scenario cannot pass another.
    table.Add({"Initialize", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(t.module->Initialize(t.host));
               }});
    table.Add({"Shutdown", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   t.module->Shutdown();
                   return NoResult();
               }});
    table.Add({"IsOverlayActive", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(t.module->IsOverlayActive());
               }});
    table.Add({"Update", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   t.module->Update();
                   return NoResult();
               }});
    table.Add({"Command",
               {{"name", ArgType::Text}, {"argument", ArgType::Text, nlohmann::json(nullptr)}},
               ResultType::Text,
               [](const CallTarget& t, const Args& a) {
                   return TextResult(t.module->Command(TextArg(a[0]), TextArg(a[1])));
               }});
    table.Add({"GetImplementation",
               {{"number", ArgType::Int}},
               ResultType::Service,
               [](const CallTarget& t, const Args& a) {
                   BaseImplementation* service = t.module->GetImplementation(a[0].number);
                   return CallResult{service == nullptr ? nlohmann::json(nullptr) : nlohmann::json("object"),
                                     std::nullopt};
               }});
}

}  // namespace steamext::run
