// Where a value sits in the text of a JSON document, so that an error can
// name "file:line:column" as well as the path inside the document.
#pragma once

#include <cstddef>
#include <map>
#include <string>

namespace steamext::run {

struct TextPosition {
    int line = 0;    // 1-based; 0 when unknown
    int column = 0;  // 1-based
};

// Line and column of a byte offset in `text`.
TextPosition PositionOf(const std::string& text, std::size_t offset);

// Indexes every value of a document that nlohmann::json has already accepted.
// Paths are JSON pointers ("/steps/3/args/0"); "" is the root.
class JsonLocator {
public:
    explicit JsonLocator(const std::string& text);

    // The position of the value at `pointer`, or of its nearest indexed parent.
    TextPosition Find(const std::string& pointer) const;

private:
    std::map<std::string, TextPosition> positions_;
};

// "/steps/3/args/0" as a reader would write it: "steps[3].args[0]".
std::string ReadablePath(const std::string& pointer);

}  // namespace steamext::run
