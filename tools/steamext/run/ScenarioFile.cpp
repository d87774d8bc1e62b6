#include "run/ScenarioFile.h"

#include <cmath>
#include <sstream>

#include "run/Scenario.h"

namespace steamext::run {

using nlohmann::json;

ScenarioFile::ScenarioFile(const std::string& text, std::string displayName)
    : text_(text), displayName_(std::move(displayName)), locator_(text_)
{
}

std::string ScenarioFile::Place(const std::string& pointer) const
{
    TextPosition position = locator_.Find(pointer);
    std::ostringstream out;
    out << displayName_;
    if (position.line > 0)
        out << ":" << position.line << ":" << position.column;
    out << ": " << ReadablePath(pointer);
    return out.str();
}

void ScenarioFile::Fail(const std::string& pointer, const std::string& message) const
{
    throw ScenarioError(Place(pointer) + ": " + message);
}

std::string ScenarioFile::Describe(const json& value)
{
    std::string shown = value.dump(-1, ' ', false, json::error_handler_t::replace);
    if (shown.size() > 40)
        shown = shown.substr(0, 37) + "...";
    switch (value.type()) {
    case json::value_t::null:
        return "null";
    case json::value_t::boolean:
        return "a boolean (" + shown + ")";
    case json::value_t::number_integer:
    case json::value_t::number_unsigned:
        return "an integer (" + shown + ")";
    case json::value_t::number_float:
        return "a number with a fraction (" + shown + ")";
    case json::value_t::string:
        return "a string (" + shown + ")";
    case json::value_t::array:
        return "a list";
    case json::value_t::object:
        return "an object";
    default:
        return "a value of another kind";
    }
}

int32_t ScenarioFile::Int(const json& value, const std::string& pointer, int64_t low, int64_t high) const
{
    if (!value.is_number_integer())
        Fail(pointer, "expected an integer, got " + Describe(value));
    // Unsigned values beyond the signed range are out of range either way.
    if (value.is_number_unsigned() && value.get<uint64_t>() > static_cast<uint64_t>(INT64_MAX))
        Fail(pointer, "the integer " + value.dump() + " is out of range " + std::to_string(low) + ".." +
                          std::to_string(high));
    int64_t number = value.get<int64_t>();
    if (number < low || number > high)
        Fail(pointer, "the integer " + std::to_string(number) + " is out of range " + std::to_string(low) +
                          ".." + std::to_string(high));
    return static_cast<int32_t>(number);
}

uint64_t ScenarioFile::UInt64(const json& value, const std::string& pointer) const
{
    if (value.is_number_unsigned())
        return value.get<uint64_t>();
    if (value.is_number_integer())
        Fail(pointer, "expected a non-negative integer, got " + Describe(value));
    if (value.is_string()) {
        // 64-bit ids are often written as text, since JSON readers round big numbers.
        const std::string& text = value.get_ref<const std::string&>();
        if (!text.empty() && text.size() <= 20 && text.find_first_not_of("0123456789") == std::string::npos) {
            try {
                return std::stoull(text);
            } catch (const std::out_of_range&) {
            }
        }
        Fail(pointer, "expected a 64-bit id in decimal, got " + Describe(value));
    }
    Fail(pointer, "expected a 64-bit id (an integer or decimal text), got " + Describe(value));
}

double ScenarioFile::Number(const json& value, const std::string& pointer) const
{
    if (!value.is_number() || !std::isfinite(value.get<double>()))
        Fail(pointer, "expected a number, got " + Describe(value));
    return value.get<double>();
}

bool ScenarioFile::Bool(const json& value, const std::string& pointer) const
{
    if (!value.is_boolean())
        Fail(pointer, "expected true or false, got " + Describe(value));
    return value.get<bool>();
}

std::string ScenarioFile::String(const json& value, const std::string& pointer) const
{
    if (!value.is_string())
        Fail(pointer, "expected a string, got " + Describe(value));
    return value.get<std::string>();
}

std::optional<std::string> ScenarioFile::StringOrNull(const json& value, const std::string& pointer) const
{
    if (value.is_null())
        return std::nullopt;
    if (!value.is_string())
        Fail(pointer, "expected a string or null, got " + Describe(value));
    return value.get<std::string>();
}

std::string ScenarioFile::Bytes(const json& value, const std::string& pointer) const
{
    if (value.is_string())
        return value.get<std::string>();
    if (value.is_object() && value.size() == 1 && value.contains("base64")) {
        const std::string inner = Child(pointer, "base64");
        bool ok = false;
        std::string bytes = DecodeBase64(String(value["base64"], inner), ok);
        if (!ok)
            Fail(inner, "this is not valid base64");
        return bytes;
    }
    Fail(pointer, "expected bytes: a string, or {\"base64\": \"...\"}; got " + Describe(value));
}

const json& ScenarioFile::Object(const json& value, const std::string& pointer) const
{
    if (!value.is_object())
        Fail(pointer, "expected an object {...}, got " + Describe(value));
    return value;
}

const json& ScenarioFile::Array(const json& value, const std::string& pointer) const
{
    if (!value.is_array())
        Fail(pointer, "expected a list [...], got " + Describe(value));
    return value;
}

void ScenarioFile::OnlyKeys(const json& object, const std::string& pointer,
                            const std::vector<std::string>& allowed) const
{
    for (const auto& item : object.items()) {
        bool known = false;
        for (const auto& key : allowed)
            known = known || item.key() == key;
        if (!known) {
            std::string list;
            for (const auto& key : allowed)
                list += (list.empty() ? "" : ", ") + key;
            Fail(Child(pointer, item.key()), "unknown key \"" + item.key() + "\"; expected one of: " + list);
        }
    }
}

std::string ScenarioFile::Child(const std::string& pointer, const std::string& key)
{
    std::string escaped;
    for (char c : key)
        escaped += c == '~' ? std::string("~0") : c == '/' ? std::string("~1") : std::string(1, c);
    return pointer + "/" + escaped;
}

std::string ScenarioFile::Child(const std::string& pointer, std::size_t index)
{
    return pointer + "/" + std::to_string(index);
}

}  // namespace steamext::run
