// Service 1: whole named files in the cloud.
#include "host/HostServices.h"
#include "run/Operations.h"
#include "services/cloud/CloudImplementation.h"

namespace steamext::run {

namespace {

CloudImplementation* Cloud(const CallTarget& target)
{
    return ServiceAs<CloudImplementation>(target, kServiceCloud, "cloud");
}

}  // namespace

void RegisterCloudOperations(OperationTable& table)
{
    using Args = std::vector<ArgValue>;
    AddBaseOperations(table, "cloud", kServiceCloud);
    // `size` defaults to the byte count of `data`; give it to write fewer bytes.
    table.Add({"cloud.WriteFile",
               {{"name", ArgType::Text}, {"data", ArgType::Bytes}, {"size", ArgType::Int, std::nullopt, 1}},
               ResultType::Bool,
               [](const CallTarget& t, const Args& a) {
                   return BoolResult(Cloud(t)->WriteFile(TextArg(a[0]), a[1].bytes.data(), a[2].number));
               }});
    table.Add({"cloud.ReadFile",
               {{"name", ArgType::Text}},
               ResultType::Buffer,
               [](const CallTarget& t, const Args& a) {
                   HostBuffer* buffer = Cloud(t)->ReadFile(TextArg(a[0]));
                   if (buffer == nullptr)
                       return CallResult{nullptr, std::nullopt};
                   std::string bytes(static_cast<const char*>(buffer->data), buffer->size);
                   // The engine owns the buffer once it is handed over; it is done with it here.
                   t.host->ReleaseBuffer(buffer);
                   return CallResult{nlohmann::json::object({{"size", bytes.size()}}), bytes};
               }});
    table.Add(
        {"cloud.DeleteFile",
         {{"name", ArgType::Text}},
         ResultType::Bool,
         [](const CallTarget& t, const Args& a) { return BoolResult(Cloud(t)->DeleteFile(TextArg(a[0]))); }});
}

}  // namespace steamext::run
