// Every operation a scenario can call, by name, with typed arguments.
//
// The module's own operations have plain names ("Initialize", "Command"); a
// service's operations carry the service's name ("achievements.SetStatistic").
// Services are reached through GetImplementation, as the engine reaches them.
// Each service registers its operations in one small file of its own under
// operations/; RegisterAllOperations lists those files' entry points.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

class ExtensionModule;
class BaseImplementation;
struct HostServices;

namespace steamext::run {

enum class ArgType {
    Int,    // a JSON integer in the signed 32-bit range
    Bool,   // true or false
    Text,   // a string, or null for a null pointer
    Bytes,  // a string (its UTF-8 bytes) or {"base64": "..."}
};

struct ArgSpec {
    std::string name;
    ArgType type;
    // Given when the argument may be left out; for Int a number, for Text a string or null.
    std::optional<nlohmann::json> defaultValue = std::nullopt;
    // For Int: when left out, take the byte count of this Bytes argument instead.
    int sizeOfArg = -1;
};

struct ArgValue {
    int32_t number = 0;
    bool flag = false;
    std::optional<std::string> text;  // Text: nullopt is a null pointer
    std::string bytes;
};

enum class ResultType {
    None,  // returns nothing
    Bool,
    Int,
    Text,     // a text or null
    Buffer,   // a buffer of the engine's, or null
    Service,  // a service object, or null
};

// What a call gave: `value` for expectations and the JSON journal; `bytes`
// holds a buffer's content.
struct CallResult {
    nlohmann::json value;
    std::optional<std::string> bytes;
};

// A call that could not be made, e.g. a service the module does not offer.
class CallFailure : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// What an operation is called on.
struct CallTarget {
    ExtensionModule* module = nullptr;
    HostServices* host = nullptr;

    // GetImplementation(number), as the engine asks for it; throws CallFailure
    // when the module gives null, so that a scenario never calls through null.
    BaseImplementation* Service(int32_t number, const char* serviceName) const;
};

using Invoker = std::function<CallResult(const CallTarget&, const std::vector<ArgValue>&)>;

struct Operation {
    std::string name;
    std::vector<ArgSpec> args;
    ResultType result = ResultType::None;
    Invoker invoke;
};

class OperationTable {
public:
    void Add(Operation operation);
    const Operation* Find(const std::string& name) const;
    std::vector<std::string> Names() const;
    // Names that resemble `name`, for "did you mean" hints.
    std::vector<std::string> Similar(const std::string& name) const;

private:
    std::map<std::string, Operation> operations_;
};

// The table with every service's operations, built on first use.
const OperationTable& Operations();

// Adds GetServiceType, GetPlatformName, Initialize, Shutdown, Update and
// IsAvailable under "<service>.".
void AddBaseOperations(OperationTable& table, const std::string& service, int32_t number);

// Result helpers for the invokers.
CallResult NoResult();
CallResult BoolResult(bool value);
CallResult IntResult(int32_t value);
CallResult TextResult(const char* text);

// One per file in operations/.
void RegisterModuleOperations(OperationTable& table);
void RegisterAchievementOperations(OperationTable& table);
void RegisterCloudOperations(OperationTable& table);

}  // namespace steamext::run
