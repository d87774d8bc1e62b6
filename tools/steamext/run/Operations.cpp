#include "run/Operations.h"

#include <algorithm>
#include <cctype>

#include "frame/ExtensionModule.h"

namespace steamext::run {

BaseImplementation* CallTarget::Service(int32_t number, const char* serviceName) const
{
    BaseImplementation* service = module->GetImplementation(number);
    if (service == nullptr)
        throw CallFailure("the module offers no " + std::string(serviceName) +
                          " service: GetImplementation(" + std::to_string(number) + ") gave null");
    return service;
}

void OperationTable::Add(Operation operation)
{
    std::string name = operation.name;
    operations_[name] = std::move(operation);
}

const Operation* OperationTable::Find(const std::string& name) const
{
    auto found = operations_.find(name);
    return found == operations_.end() ? nullptr : &found->second;
}

std::vector<std::string> OperationTable::Names() const
{
    std::vector<std::string> names;
    for (const auto& entry : operations_)
        names.push_back(entry.first);
    return names;
}

namespace {

std::string Lower(std::string text)
{
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return std::tolower(c); });
    return text;
}

std::string AfterDot(const std::string& name)
{
    std::size_t dot = name.rfind('.');
    return dot == std::string::npos ? name : name.substr(dot + 1);
}

}  // namespace

std::vector<std::string> OperationTable::Similar(const std::string& name) const
{
    // Same operation under another service, or the same name in other capitals.
    std::vector<std::string> similar;
    std::string wanted = Lower(AfterDot(name));
    for (const auto& entry : operations_) {
        if (Lower(AfterDot(entry.first)) == wanted || Lower(entry.first) == Lower(name))
            similar.push_back(entry.first);
    }
    return similar;
}

void AddBaseOperations(OperationTable& table, const std::string& service, int32_t number)
{
    std::string prefix = service + ".";
    // The service name lives as long as the table: the invokers keep a copy.
    auto get = [service, number](const CallTarget& target) {
        return target.Service(number, service.c_str());
    };
    table.Add({prefix + "GetServiceType",
               {},
               ResultType::Int,
               [get](const CallTarget& t, const std::vector<ArgValue>&) {
                   return IntResult(get(t)->GetServiceType());
               }});
    table.Add({prefix + "GetPlatformName",
               {},
               ResultType::Text,
               [get](const CallTarget& t, const std::vector<ArgValue>&) {
                   return TextResult(get(t)->GetPlatformName());
               }});
    table.Add({prefix + "Initialize",
               {},
               ResultType::Bool,
               [get](const CallTarget& t, const std::vector<ArgValue>&) {
                   return BoolResult(get(t)->Initialize());
               }});
    table.Add(
        {prefix + "Shutdown", {}, ResultType::None, [get](const CallTarget& t, const std::vector<ArgValue>&) {
             get(t)->Shutdown();
             return NoResult();
         }});
    table.Add(
        {prefix + "Update", {}, ResultType::None, [get](const CallTarget& t, const std::vector<ArgValue>&) {
             get(t)->Update();
             return NoResult();
         }});
    table.Add({prefix + "IsAvailable",
               {},
               ResultType::Bool,
               [get](const CallTarget& t, const std::vector<ArgValue>&) {
                   return BoolResult(get(t)->IsAvailable());
               }});
}

CallResult NoResult()
{
    return CallResult{};
}

CallResult BoolResult(bool value)
{
    return CallResult{value, std::nullopt};
}

CallResult IntResult(int32_t value)
{
    return CallResult{value, std::nullopt};
}

CallResult TextResult(const char* text)
{
    // Copied at once: a result may live in a buffer that the next call rewrites.
    return CallResult{text == nullptr ? nlohmann::json(nullptr) : nlohmann::json(std::string(text)),
                      std::nullopt};
}

const char* TextArg(const ArgValue& value)
{
    return value.text ? value.text->c_str() : nullptr;
}

CallResult RecordResult(const void* record)
{
    return CallResult{nullptr, std::nullopt, record};
}

const OperationTable& Operations()
{
    static const OperationTable table = [] {
        OperationTable built;
        RegisterModuleOperations(built);
        RegisterAchievementOperations(built);
        RegisterCloudOperations(built);
        RegisterStoreOperations(built);
        RegisterLeaderboardOperations(built);
        RegisterWorkshopOperations(built);
        return built;
    }();
    return table;
}

}  // namespace steamext::run
