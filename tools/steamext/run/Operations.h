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
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "run/RecordLayout.h"

class ExtensionModule;
class BaseImplementation;
struct HostServices;

namespace steamext::run {

enum class ArgType {
    Int,     // a JSON integer in the signed 32-bit range
    Bool,    // true or false
    Text,    // a string, or null for a null pointer
    Bytes,   // a string (its UTF-8 bytes) or {"base64": "..."}
    Record,  // an object of named fields, built into a record by ArgSpec::layout
};

struct ArgSpec {
    std::string name;
    ArgType type;
    // Given when the argument may be left out; for Int a number, for Text a string or null.
    std::optional<nlohmann::json> defaultValue = std::nullopt;
    // For Int: when left out, take the byte count of this Bytes argument instead.
    int sizeOfArg = -1;
    const RecordLayout* layout = nullptr;  // Record
};

struct ArgValue {
    int32_t number = 0;
    bool flag = false;
    std::optional<std::string> text;  // Text: nullopt is a null pointer
    std::string bytes;
    std::shared_ptr<RecordBuffer> record;  // Record: lives as long as the step
};

enum class ResultType {
    None,  // returns nothing
    Bool,
    Int,
    Text,     // a text or null
    Buffer,   // a buffer of the engine's, or null
    Service,  // a service object, or null
    Record,   // a record of Operation::layout that the module keeps, or null
};

// What a call gave: `value` for expectations and the JSON journal; `bytes`
// holds a buffer's content; `record` the address of a record the module keeps
// (the runner decodes it into `value`, and a later step may read it again).
struct CallResult {
    nlohmann::json value;
    std::optional<std::string> bytes;
    const void* record = nullptr;
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
    const RecordLayout* layout = nullptr;  // ResultType::Record
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

// The service `number` as its class; throws CallFailure when the module
// offers none. The engine knows the class by the number; so does the runner.
template <class T> T* ServiceAs(const CallTarget& target, int32_t number, const char* serviceName)
{
    return static_cast<T*>(target.Service(number, serviceName));
}

// A Text argument as the module takes it: null, or the text.
const char* TextArg(const ArgValue& value);
// A Record argument's bytes, to pass as a pointer to the service's struct.
template <class T> T* RecordArg(const ArgValue& value)
{
    return static_cast<T*>(value.record->Data());
}

// Result helpers for the invokers.
CallResult NoResult();
CallResult BoolResult(bool value);
CallResult IntResult(int32_t value);
CallResult TextResult(const char* text);
// The address of a record the module keeps, or null; the runner decodes it.
CallResult RecordResult(const void* record);

// One per file in operations/.
void RegisterModuleOperations(OperationTable& table);
void RegisterAchievementOperations(OperationTable& table);
void RegisterCloudOperations(OperationTable& table);
void RegisterStoreOperations(OperationTable& table);
void RegisterLeaderboardOperations(OperationTable& table);
void RegisterWorkshopOperations(OperationTable& table);

}  // namespace steamext::run
