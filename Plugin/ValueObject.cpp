#include "Plugin/ValueObject.h"

#include "Plugin/BoundaryObject.h"
#include "Plugin/ObjectCheck.h"

#include <cstdint>
#include <stdexcept>
#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch {
namespace {

using Children = std::vector<Ref<const ZorvaValue>>;

/// One of our values as the other side sees it. The parts of an array or a dictionary are objects of their
/// own, made with it, since the other side borrows and may keep them.
class ValueObject final : public BoundaryObject<ValueObject, ZorvaValue> {
public:
    explicit ValueObject(const PropertyValue &value) : BoundaryObject(&kTable), _value(value) {
        if (const PropertyValue::Array *const array = value.asArray())
            for (const PropertyValue &element : *array)
                _children.push_back(makeValue(element));
        if (const PropertyValue::Dictionary *const dictionary = value.asDictionary())
            for (const auto &[key, element] : *dictionary) {
                _keys.push_back(key);
                _children.push_back(makeValue(element));
            }
    }

private:
    static const ZorvaValueTable kTable;

    static std::uint32_t kind(const ZorvaValue *value) noexcept {
        return static_cast<std::uint32_t>(of(value)._value.kind());
    }
    static ZorvaBoolean booleanValue(const ZorvaValue *value) noexcept {
        const bool *const boolean = of(value)._value.asBool();
        return boolean && *boolean ? 1 : 0;
    }
    static std::uint64_t unsignedValue(const ZorvaValue *value) noexcept {
        const std::uint64_t *const number = of(value)._value.asUnsigned();
        return number ? *number : 0;
    }
    static double doubleValue(const ZorvaValue *value) noexcept {
        const double *const number = of(value)._value.asDouble();
        return number ? *number : 0;
    }
    static const char *stringValue(const ZorvaValue *value, std::size_t *length) noexcept {
        const std::string *const text = of(value)._value.asString();
        *length = text ? text->size() : 0;
        return text ? text->data() : nullptr;
    }
    static const std::uint8_t *bytesValue(const ZorvaValue *value, std::size_t *length) noexcept {
        const PropertyValue::Bytes *const bytes = of(value)._value.asBytes();
        *length = bytes ? bytes->size() : 0;
        return bytes ? bytes->data() : nullptr;
    }
    static std::size_t count(const ZorvaValue *value) noexcept { return of(value)._children.size(); }
    static const ZorvaValue *element(const ZorvaValue *value, std::size_t index) noexcept {
        const Children &children = of(value)._children;
        return index < children.size() ? children[index].get() : nullptr;
    }
    static const char *key(const ZorvaValue *value, std::size_t index, std::size_t *length) noexcept {
        const std::vector<std::string_view> &keys = of(value)._keys;
        *length = index < keys.size() ? keys[index].size() : 0;
        return index < keys.size() ? keys[index].data() : nullptr;
    }

    const PropertyValue _value;
    Children _children;                  ///< of an array or a dictionary
    std::vector<std::string_view> _keys; ///< of a dictionary; point into `_value`
};

const ZorvaValueTable ValueObject::kTable{
    .size = sizeof(ZorvaValueTable),
    .retain = ValueObject::retain<const ZorvaValue>,
    .release = ValueObject::release<const ZorvaValue>,
    .kind = ValueObject::kind,
    .booleanValue = ValueObject::booleanValue,
    .unsignedValue = ValueObject::unsignedValue,
    .doubleValue = ValueObject::doubleValue,
    .stringValue = ValueObject::stringValue,
    .bytesValue = ValueObject::bytesValue,
    .count = ValueObject::count,
    .element = ValueObject::element,
    .key = ValueObject::key,
};

/// Reads one value of the other side. Everything it counts, it was told by somebody it need not trust.
class Reader {
public:
    [[nodiscard]] PropertyValue read(const ZorvaValue *value) {
        PropertyValue result = readPart(value, 0);
        return _budget == 0 ? PropertyValue() : result;
    }

private:
    static constexpr std::size_t kMaxDepth = 64; ///< as the recording's reader
    static constexpr std::size_t kMaxParts = 1'000'000;

    PropertyValue readPart(const ZorvaValue *value, std::size_t depth) {
        if (_budget == 0)
            return {};
        --_budget; // also for a part that is missing or too deep: there may be no end of those
        if (!isComplete(value) || depth == kMaxDepth)
            return {};
        const ZorvaValueTable &table = *value->table;
        switch (table.kind(value)) {
        case kZorvaValueBoolean:
            return table.booleanValue(value) != 0;
        case kZorvaValueUnsigned:
            return table.unsignedValue(value);
        case kZorvaValueDouble:
            return table.doubleValue(value);
        case kZorvaValueString:
            return readString(value);
        case kZorvaValueBytes:
            return readBytes(value);
        case kZorvaValueArray:
            return readArray(value, depth);
        case kZorvaValueDictionary:
            return readDictionary(value, depth);
        default:
            return {};
        }
    }

    /// No text or block of bytes in memory is as long as some tables claim.
    static std::size_t checkedLength(std::size_t length) {
        if (length > PTRDIFF_MAX)
            throw std::length_error("a value has an impossible length");
        return length;
    }

    static PropertyValue readString(const ZorvaValue *value) {
        std::size_t length = 0;
        const char *const text = value->table->stringValue(value, &length);
        return text ? std::string(text, checkedLength(length)) : std::string();
    }

    static PropertyValue readBytes(const ZorvaValue *value) {
        std::size_t length = 0;
        const std::uint8_t *const bytes = value->table->bytesValue(value, &length);
        return bytes ? PropertyValue::Bytes(bytes, bytes + checkedLength(length)) : PropertyValue::Bytes();
    }

    PropertyValue readArray(const ZorvaValue *value, std::size_t depth) {
        PropertyValue::Array array;
        const std::size_t count = value->table->count(value);
        for (std::size_t index = 0; index < count && _budget > 0; ++index)
            array.push_back(readPart(value->table->element(value, index), depth + 1));
        return array;
    }

    PropertyValue readDictionary(const ZorvaValue *value, std::size_t depth) {
        PropertyValue::Dictionary dictionary;
        const std::size_t count = value->table->count(value);
        for (std::size_t index = 0; index < count && _budget > 0; ++index) {
            std::size_t length = 0;
            const char *const key = value->table->key(value, index, &length);
            if (key)
                dictionary.insert_or_assign(std::string(key, checkedLength(length)),
                                            readPart(value->table->element(value, index), depth + 1));
            else
                --_budget; // or a table with no keys and no end would hold us for ever
        }
        return dictionary;
    }

    std::size_t _budget = kMaxParts;
};

} // namespace

Ref<const ZorvaValue> makeValue(const PropertyValue &value) {
    return Ref<const ZorvaValue>::adopt(new ValueObject(value));
}

PropertyValue readValue(const ZorvaValue *value) { return Reader().read(value); }

} // namespace ZorvaTouch
