#include "run/RecordLayout.h"

#include <cfloat>
#include <cmath>
#include <cstring>

#include "run/ScenarioFile.h"

namespace steamext::run {

using nlohmann::json;

namespace {

template <class T> T Load(const unsigned char* at)
{
    T value;
    std::memcpy(&value, at, sizeof(T));
    return value;
}

template <class T> void Store(unsigned char* at, T value)
{
    std::memcpy(at, &value, sizeof(T));
}

const RecordField* FindField(const RecordLayout& layout, const std::string& name)
{
    for (std::size_t i = 0; i < layout.fieldCount; ++i)
        if (name == layout.fields[i].name)
            return &layout.fields[i];
    return nullptr;
}

void EncodeField(const RecordField& field, const json& value, RecordBuffer& record, const ScenarioFile& file,
                 const std::string& at)
{
    unsigned char* place = static_cast<unsigned char*>(record.Data()) + field.offset;
    switch (field.kind) {
    case FieldKind::TextPointer: {
        std::optional<std::string> text = file.StringOrNull(value, at);
        Store<const char*>(place, text ? record.Keep(*text) : nullptr);
        break;
    }
    case FieldKind::FixedText: {
        std::string text = file.String(value, at);
        if (text.size() >= field.count || text.find('\0') != std::string::npos)
            file.Fail(at, "the text is " + std::to_string(text.size()) + " bytes; the field holds at most " +
                              std::to_string(field.count - 1) + ", without zero bytes");
        std::memcpy(place, text.c_str(), text.size() + 1);  // with its terminating zero
        break;
    }
    case FieldKind::Int32:
        Store<int32_t>(place, file.Int(value, at));
        break;
    case FieldKind::UInt32: {
        uint64_t number = file.UInt64(value, at);
        if (number > UINT32_MAX)
            file.Fail(at, "the integer " + std::to_string(number) + " is out of range 0..4294967295");
        Store<uint32_t>(place, static_cast<uint32_t>(number));
        break;
    }
    case FieldKind::UInt64:
        Store<uint64_t>(place, file.UInt64(value, at));
        break;
    case FieldKind::Float: {
        double number = file.Number(value, at);
        if (std::fabs(number) > FLT_MAX)
            file.Fail(at, "the number " + value.dump() + " is out of the range of a float");
        Store<float>(place, static_cast<float>(number));
        break;
    }
    case FieldKind::Bool8:
        Store<uint8_t>(place, file.Bool(value, at) ? 1 : 0);
        break;
    case FieldKind::Int32Array: {
        const json& list = file.Array(value, at);
        if (list.size() > field.count)
            file.Fail(at, "the field holds " + std::to_string(field.count) + " integers, " +
                              std::to_string(list.size()) + " are given");
        for (std::size_t i = 0; i < list.size(); ++i)
            Store<int32_t>(place + 4 * i, file.Int(list[i], ScenarioFile::Child(at, i)));
        break;
    }
    }
}

json DecodeField(const RecordField& field, const unsigned char* place)
{
    switch (field.kind) {
    case FieldKind::TextPointer: {
        const char* text = Load<const char*>(place);
        return text != nullptr ? json(std::string(text)) : json(nullptr);
    }
    case FieldKind::FixedText:
        return std::string(reinterpret_cast<const char*>(place),
                           strnlen(reinterpret_cast<const char*>(place), field.count));
    case FieldKind::Int32:
        return Load<int32_t>(place);
    case FieldKind::UInt32:
        return Load<uint32_t>(place);
    case FieldKind::UInt64:
        return Load<uint64_t>(place);
    case FieldKind::Float:
        return static_cast<double>(Load<float>(place));
    case FieldKind::Bool8:
        return Load<uint8_t>(place) != 0;
    case FieldKind::Int32Array: {
        json list = json::array();
        for (std::size_t i = 0; i < field.count; ++i)
            list.push_back(Load<int32_t>(place + 4 * i));
        return list;
    }
    }
    return nullptr;
}

}  // namespace

json DecodeRecord(const RecordLayout& layout, const void* record)
{
    json fields = json::object();
    for (std::size_t i = 0; i < layout.fieldCount; ++i) {
        const RecordField& field = layout.fields[i];
        fields[field.name] = DecodeField(field, static_cast<const unsigned char*>(record) + field.offset);
    }
    return fields;
}

std::shared_ptr<RecordBuffer> EncodeRecord(const RecordLayout& layout, const json& fields,
                                           const ScenarioFile& file, const std::string& pointer)
{
    file.Object(fields, pointer);
    auto record = std::make_shared<RecordBuffer>(layout.size);
    for (const auto& item : fields.items()) {
        const std::string at = ScenarioFile::Child(pointer, item.key());
        const RecordField* field = FindField(layout, item.key());
        if (field == nullptr) {
            std::string names;
            for (std::size_t i = 0; i < layout.fieldCount; ++i)
                names += (i > 0 ? ", " : "") + std::string(layout.fields[i].name);
            file.Fail(at, "the " + std::string(layout.name) + " record has no field \"" + item.key() +
                              "\"; its fields: " + names);
        }
        EncodeField(*field, item.value(), *record, file, at);
    }
    return record;
}

json CheckRecordPattern(const RecordLayout& layout, const json& fields, const ScenarioFile& file,
                        const std::string& pointer)
{
    // A float written as 0.1 is compared as the float the module would hold.
    std::shared_ptr<RecordBuffer> record = EncodeRecord(layout, fields, file, pointer);
    json all = DecodeRecord(layout, record->Data());
    json pattern = json::object();
    for (const auto& item : fields.items())
        pattern[item.key()] = all[item.key()];
    return pattern;
}

void KeptRecords::Keep(const std::string& name, const RecordLayout& layout, const void* record)
{
    kept_[name] = Kept{&layout, record};
}

json KeptRecords::Read(const std::string& name) const
{
    auto found = kept_.find(name);
    if (found == kept_.end() || found->second.record == nullptr)
        return nullptr;
    return DecodeRecord(*found->second.layout, found->second.record);
}

}  // namespace steamext::run
