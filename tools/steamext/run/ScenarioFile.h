// A scenario file's text, with typed access to its JSON values that names the
// place of every mistake: "tour.json:12:7: steps[3].args[0]: expected an
// integer, got a string". ScenarioParser turns the checked values into a
// Scenario; JsonLocator finds a value's line and column in the text.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "run/Base64.h"
#include "run/JsonLocator.h"

namespace steamext::run {

class ScenarioFile {
public:
    ScenarioFile(const std::string& text, std::string displayName);

    // "file:line:column: path" of the value at `pointer`.
    std::string Place(const std::string& pointer) const;
    [[noreturn]] void Fail(const std::string& pointer, const std::string& message) const;

    // Each takes the value and its JSON pointer, and fails naming the place.
    int32_t Int(const nlohmann::json& value, const std::string& pointer, int64_t low = INT32_MIN,
                int64_t high = INT32_MAX) const;
    uint64_t UInt64(const nlohmann::json& value, const std::string& pointer) const;  // number or decimal text
    double Number(const nlohmann::json& value, const std::string& pointer) const;
    bool Bool(const nlohmann::json& value, const std::string& pointer) const;
    std::string String(const nlohmann::json& value, const std::string& pointer) const;
    std::optional<std::string> StringOrNull(const nlohmann::json& value, const std::string& pointer) const;
    // A string's bytes, or {"base64": "..."}.
    std::string Bytes(const nlohmann::json& value, const std::string& pointer) const;
    const nlohmann::json& Object(const nlohmann::json& value, const std::string& pointer) const;
    const nlohmann::json& Array(const nlohmann::json& value, const std::string& pointer) const;
    // Fails on a key outside `allowed`, listing the allowed ones.
    void OnlyKeys(const nlohmann::json& object, const std::string& pointer,
                  const std::vector<std::string>& allowed) const;

    static std::string Child(const std::string& pointer, const std::string& key);
    static std::string Child(const std::string& pointer, std::size_t index);
    // "a string (\"abc\")", "an integer (3)", ... for messages.
    static std::string Describe(const nlohmann::json& value);

private:
    std::string text_;
    std::string displayName_;
    JsonLocator locator_;
};

}  // namespace steamext::run
