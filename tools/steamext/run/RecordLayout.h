// Records of a fixed layout that cross between a scenario and the module:
//   - records the module fills and the engine polls (e.g. 64 bytes: an id, a
//     title as a text pointer, a progress): decoded into a JSON object by
//     their field table, and read again by a later step;
//   - records a scenario hands over as an argument (e.g. a 332-byte score
//     with a fixed text and a details block): built from named fields.
// A service describes its record with a field table and checks it at compile
// time against its size:
//
//   constexpr RecordField kItemFields[] = {
//       {"id", 0, FieldKind::UInt64}, {"title", 8, FieldKind::TextPointer},
//       {"progress", 16, FieldKind::Float}};
//   static_assert(FieldsFit(kItemFields, 64));
//   constexpr RecordLayout kItem = MakeLayout("item", 64, kItemFields);
#pragma once

#include <cstddef>
#include <cstdint>
#include <list>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

namespace steamext::run {

class ScenarioFile;

enum class FieldKind {
    TextPointer,  // const char*, null or a text
    FixedText,    // `count` bytes holding a text and its terminator
    Int32,
    UInt32,
    UInt64,  // in JSON an integer, or decimal text for ids
    Float,
    Bool8,       // one byte, 0 or 1
    Int32Array,  // `count` int32 values; a scenario may give fewer (the rest are 0)
};

struct RecordField {
    const char* name;
    std::size_t offset;
    FieldKind kind;
    std::size_t count = 1;  // bytes of a FixedText, elements of an Int32Array
};

constexpr std::size_t FieldSize(const RecordField& field)
{
    switch (field.kind) {
    case FieldKind::TextPointer:
        return sizeof(const char*);
    case FieldKind::FixedText:
        return field.count;
    case FieldKind::Int32:
    case FieldKind::UInt32:
    case FieldKind::Float:
        return 4;
    case FieldKind::UInt64:
        return 8;
    case FieldKind::Bool8:
        return 1;
    case FieldKind::Int32Array:
        return 4 * field.count;
    }
    return 0;
}

// Every field lies inside `size` bytes, aligned to its own size (texts and
// bytes excepted), and no two fields overlap.
template <std::size_t N> constexpr bool FieldsFit(const RecordField (&fields)[N], std::size_t size)
{
    for (std::size_t i = 0; i < N; ++i) {
        const std::size_t end = fields[i].offset + FieldSize(fields[i]);
        if (FieldSize(fields[i]) == 0 || end > size)
            return false;
        const std::size_t align = fields[i].kind == FieldKind::FixedText || fields[i].kind == FieldKind::Bool8
                                      ? 1
                                  : fields[i].kind == FieldKind::Int32Array ? 4
                                                                            : FieldSize(fields[i]);
        if (fields[i].offset % align != 0)
            return false;
        for (std::size_t j = 0; j < i; ++j)
            if (fields[i].offset < fields[j].offset + FieldSize(fields[j]) && fields[j].offset < end)
                return false;
    }
    return true;
}

struct RecordLayout {
    const char* name;
    std::size_t size;
    const RecordField* fields;
    std::size_t fieldCount;
};

template <std::size_t N>
constexpr RecordLayout MakeLayout(const char* name, std::size_t size, const RecordField (&fields)[N])
{
    return RecordLayout{name, size, fields, N};
}

// A record built for a call: its bytes, and the texts its pointers point to.
// Shared, never copied, so that those pointers stay valid.
class RecordBuffer {
public:
    explicit RecordBuffer(std::size_t size) : bytes_(size, 0) {}
    RecordBuffer(const RecordBuffer&) = delete;
    RecordBuffer& operator=(const RecordBuffer&) = delete;

    void* Data() { return bytes_.data(); }
    const void* Data() const { return bytes_.data(); }
    std::size_t Size() const { return bytes_.size(); }
    const char* Keep(std::string text) { return texts_.insert(texts_.end(), std::move(text))->c_str(); }

private:
    std::vector<unsigned char> bytes_;
    std::list<std::string> texts_;
};

// The record at `record` as {"field": value, ...}, every field of the layout.
nlohmann::json DecodeRecord(const RecordLayout& layout, const void* record);

// A record from named fields (those not named are zero); refuses, naming the
// place, an unknown field or a value out of the field's range.
std::shared_ptr<RecordBuffer> EncodeRecord(const RecordLayout& layout, const nlohmann::json& fields,
                                           const ScenarioFile& file, const std::string& pointer);

// Checks an expected record (some of its fields) the same way, giving it back
// with each value as DecodeRecord would show it.
nlohmann::json CheckRecordPattern(const RecordLayout& layout, const nlohmann::json& fields,
                                  const ScenarioFile& file, const std::string& pointer);

// Records the module keeps, by the name a scenario gave them ("keep_as"):
// each read decodes the record where it lives, so that a later step sees
// what the module or its threads wrote since.
class KeptRecords {
public:
    void Keep(const std::string& name, const RecordLayout& layout, const void* record);
    // The record's fields, or null when the call gave null or nothing was kept.
    nlohmann::json Read(const std::string& name) const;

private:
    struct Kept {
        const RecordLayout* layout;
        const void* record;
    };
    std::map<std::string, Kept> kept_;
};

}  // namespace steamext::run
