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
    // If the heap is exhausted the string ends with no text (text null, length 0),
    // as after Assign(nullptr): holders already treat null as an absent value,
    // whereas keeping the old text would hand on a stale one.
    void Assign(const char* source);
    // Adds a copy of `source` at the end (may be null, must not alias). Always
    // makes a new heap block of the exact size. On heap exhaustion it ends with
    // no text, like Assign.
    void Append(const char* source);

    const char* Text() const { return text; }
    int32_t Length() const { return length; }

private:
    void DropText();

public:
    // Layout shared with code that reads the fields directly; only `text`,
    // `capacity` and `length` start initialised.
    char* text = nullptr;
    char inlineBuffer[16];
    int32_t capacity = 0;
    int32_t length = 0;
};
