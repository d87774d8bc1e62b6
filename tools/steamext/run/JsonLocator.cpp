#include "run/JsonLocator.h"

#include <cctype>

namespace steamext::run {

TextPosition PositionOf(const std::string& text, std::size_t offset)
{
    TextPosition position{1, 1};
    for (std::size_t i = 0; i < offset && i < text.size(); ++i) {
        if (text[i] == '\n') {
            ++position.line;
            position.column = 1;
        } else {
            ++position.column;
        }
    }
    return position;
}

namespace {

// A walk over text that is known to be valid JSON: it only needs to find where
// each value starts, so it skips strings and scalars without checking them.
class Walker {
public:
    Walker(const std::string& text, std::map<std::string, TextPosition>& out) : text_(text), out_(out) {}

    void Run()
    {
        SkipSpace();
        Value("");
    }

private:
    void Value(const std::string& pointer)
    {
        SkipSpace();
        out_[pointer] = Here();
        if (at_ >= text_.size())
            return;
        char c = text_[at_];
        if (c == '{')
            Object(pointer);
        else if (c == '[')
            Array(pointer);
        else if (c == '"')
            String();
        else
            Scalar();
    }

    void Object(const std::string& pointer)
    {
        ++at_;  // {
        for (;;) {
            SkipSpace();
            if (at_ >= text_.size() || text_[at_] == '}') {
                ++at_;
                return;
            }
            if (text_[at_] == ',') {
                ++at_;
                continue;
            }
            std::string key = String();
            SkipSpace();
            ++at_;  // :
            Value(pointer + "/" + EscapePointerToken(key));
        }
    }

    void Array(const std::string& pointer)
    {
        ++at_;  // [
        int index = 0;
        for (;;) {
            SkipSpace();
            if (at_ >= text_.size() || text_[at_] == ']') {
                ++at_;
                return;
            }
            if (text_[at_] == ',') {
                ++at_;
                continue;
            }
            Value(pointer + "/" + std::to_string(index++));
        }
    }

    // Returns the raw key text; escapes other than \" and \\ stay as written,
    // which is enough to find keys, and keys in scenarios are plain words.
    std::string String()
    {
        std::string result;
        ++at_;  // opening quote
        while (at_ < text_.size() && text_[at_] != '"') {
            if (text_[at_] == '\\' && at_ + 1 < text_.size()) {
                ++at_;
                if (text_[at_] != '"' && text_[at_] != '\\')
                    result += '\\';
            }
            result += text_[at_++];
        }
        ++at_;  // closing quote
        return result;
    }

    void Scalar()
    {
        while (at_ < text_.size() && text_[at_] != ',' && text_[at_] != '}' && text_[at_] != ']' &&
               !std::isspace(static_cast<unsigned char>(text_[at_])))
            ++at_;
    }

    void SkipSpace()
    {
        while (at_ < text_.size() && std::isspace(static_cast<unsigned char>(text_[at_])))
            ++at_;
    }

    TextPosition Here()
    {
        // Positions are asked for in increasing order: count lines incrementally.
        while (counted_ < at_ && counted_ < text_.size()) {
            if (text_[counted_] == '\n') {
                ++line_;
                column_ = 1;
            } else {
                ++column_;
            }
            ++counted_;
        }
        return TextPosition{line_, column_};
    }

    static std::string EscapePointerToken(const std::string& key)
    {
        std::string escaped;
        for (char c : key) {
            if (c == '~')
                escaped += "~0";
            else if (c == '/')
                escaped += "~1";
            else
                escaped += c;
        }
        return escaped;
    }

    const std::string& text_;
    std::map<std::string, TextPosition>& out_;
    std::size_t at_ = 0;
    std::size_t counted_ = 0;
    int line_ = 1;
    int column_ = 1;
};

}  // namespace

JsonLocator::JsonLocator(const std::string& text)
{
    Walker(text, positions_).Run();
}

TextPosition JsonLocator::Find(const std::string& pointer) const
{
    std::string path = pointer;
    for (;;) {
        auto found = positions_.find(path);
        if (found != positions_.end())
            return found->second;
        if (path.empty())
            return TextPosition{};
        path.erase(path.rfind('/'));
    }
}

std::string ReadablePath(const std::string& pointer)
{
    std::string result;
    std::size_t at = 0;
    while (at < pointer.size()) {
        std::size_t next = pointer.find('/', at + 1);
        std::string token =
            pointer.substr(at + 1, next == std::string::npos ? std::string::npos : next - at - 1);
        bool index = !token.empty() && token.find_first_not_of("0123456789") == std::string::npos;
        if (index)
            result += "[" + token + "]";
        else
            result += (result.empty() ? "" : ".") + token;
        at = next == std::string::npos ? pointer.size() : next;
    }
    return result.empty() ? "(top level)" : result;
}

}  // namespace steamext::run
