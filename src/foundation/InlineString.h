// The module's one owning string: short texts live inside the object.
#pragma once

#include <cstdint>

class InlineString {
public:
    InlineString() = default;
    ~InlineString();

    // Holds a pointer into itself: never copied or moved bytewise.
    InlineString(const InlineString& other);
    InlineString& operator=(const InlineString& other);

    // Replaces the content by a copy of `source` (may be null, may alias).
    void Assign(const char* source);
    // Adds a copy of `source` at the end (may be null, must not alias).
    void Append(const char* source);

    const char* Text() const { return text; }
    int32_t Length() const { return length; }

    char* text = nullptr;
    char inlineBuffer[16];
    int32_t capacity = 0;
    int32_t length = 0;
};
