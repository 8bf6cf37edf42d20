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

/// Holds a value to the limits of the boundary, in either direction.
class PartCount {
public:
    /// Counts a part at that depth, 0 for the value itself.
    /// @throws std::length_error  It is beyond a limit.
    void add(std::size_t depth) {
        if (depth >= ZORVA_VALUE_MAX_LEVELS)
            throw std::length_error("a value has more than 64 levels");
        if (_parts == ZORVA_VALUE_MAX_PARTS)
            throwTooMany();
        ++_parts;
    }

    /// Refuses a count of parts before any of them is read: what is claimed may be endless.
    /// @throws std::length_error  So many more are beyond the limit.
    void requireRoom(std::size_t count) const {
        if (count > ZORVA_VALUE_MAX_PARTS - _parts)
            throwTooMany();
    }

private:
    [[noreturn]] static void throwTooMany() {
        throw std::length_error("a value has more than 1000000 parts");
    }

    std::size_t _parts = 0;
};

/// One of our values as the other side sees it. The parts of an array or a dictionary are objects of their
/// own, made with it, since the other side borrows and may keep them.
class ValueObject final : public BoundaryObject<ValueObject, ZorvaValue> {
public:
    /// @param depth  0 for the value itself, one more for each level below it.
    static Ref<const ZorvaValue> make(const PropertyValue &value, PartCount &parts, std::size_t depth = 0) {
        parts.add(depth);
        return Ref<const ZorvaValue>::adopt(new ValueObject(value, parts, depth));
    }

private:
    static const ZorvaValueTable kTable;

    ValueObject(const PropertyValue &value, PartCount &parts, std::size_t depth)
        : BoundaryObject(&kTable), _value(value) {
        if (const PropertyValue::Array *const array = _value.asArray())
            for (const PropertyValue &element : *array)
                _children.push_back(make(element, parts, depth + 1));
        if (const PropertyValue::Dictionary *const dictionary = _value.asDictionary())
            for (const auto &[key, element] : *dictionary) {
                _keys.push_back(key);
                _children.push_back(make(element, parts, depth + 1));
            }
    }

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

/// Reads one value of the other side, which may answer anything: counts without end, itself as a part.
class Reader {
public:
    [[nodiscard]] PropertyValue readPart(const ZorvaValue *value, std::size_t depth = 0) {
        _parts.add(depth); // also for a part that is missing: a table may claim any number of those
        if (!isComplete(value))
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

private:
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
        _parts.requireRoom(count);
        for (std::size_t index = 0; index < count; ++index)
            array.push_back(readPart(value->table->element(value, index), depth + 1));
        return array;
    }

    PropertyValue readDictionary(const ZorvaValue *value, std::size_t depth) {
        PropertyValue::Dictionary dictionary;
        const std::size_t count = value->table->count(value);
        _parts.requireRoom(count);
        for (std::size_t index = 0; index < count; ++index) {
            std::size_t length = 0;
            const char *const key = value->table->key(value, index, &length);
            if (key)
                dictionary.insert_or_assign(std::string(key, checkedLength(length)),
                                            readPart(value->table->element(value, index), depth + 1));
            else
                _parts.add(depth + 1); // a table without keys may claim any number of entries
        }
        return dictionary;
    }

    PartCount _parts;
};

} // namespace

Ref<const ZorvaValue> makeValue(const PropertyValue &value) {
    PartCount parts;
    return ValueObject::make(value, parts);
}

PropertyValue readValue(const ZorvaValue *value) { return Reader().readPart(value); }

} // namespace ZorvaTouch
