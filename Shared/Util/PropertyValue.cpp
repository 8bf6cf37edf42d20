#include "Shared/Util/PropertyValue.h"

#include "Shared/Util/Numeric.h"

#include <limits>
#include <utility>

namespace ZorvaTouch {

static_assert(std::numeric_limits<float>::is_iec559,
              "narrowing to float rounds to nearest or to an infinity");

PropertyValue::PropertyValue(std::string value)
    : _value(std::make_shared<const std::string>(std::move(value))) {}
PropertyValue::PropertyValue(Bytes value) : _value(std::make_shared<const Bytes>(std::move(value))) {}
PropertyValue::PropertyValue(Array value) : _value(std::make_shared<const Array>(std::move(value))) {}
PropertyValue::PropertyValue(Dictionary value)
    : _value(std::make_shared<const Dictionary>(std::move(value))) {}

PropertyValue::PropertyValue(PropertyValue &&other) noexcept : _value(std::exchange(other._value, {})) {}

PropertyValue &PropertyValue::operator=(PropertyValue &&other) noexcept {
    if (this != &other)
        _value = std::exchange(other._value, {});
    return *this;
}

const PropertyValue *PropertyValue::find(std::string_view key) const noexcept {
    const Dictionary *dictionary = asDictionary();
    if (!dictionary)
        return nullptr;
    const auto entry = dictionary->find(key);
    return entry == dictionary->end() ? nullptr : &entry->second;
}

bool PropertyValue::toBool() const noexcept {
    if (const bool *value = asBool())
        return *value;
    if (const std::uint64_t *value = asUnsigned())
        return *value != 0;
    if (const double *value = asDouble())
        return *value != 0.0;
    return false;
}

float PropertyValue::toFloat() const noexcept {
    if (const bool *value = asBool())
        return *value ? 1.0f : 0.0f;
    if (const std::uint64_t *value = asUnsigned())
        return static_cast<float>(*value); // straight from the integer: through double it would round twice
    if (const double *value = asDouble())
        return static_cast<float>(*value);
    return 0.0f;
}

std::uint64_t PropertyValue::toUnsigned() const noexcept {
    if (const bool *value = asBool())
        return *value ? 1 : 0;
    if (const std::uint64_t *value = asUnsigned())
        return *value;
    if (const double *value = asDouble())
        return Util::truncateToUint64(*value);
    return 0;
}

bool operator==(const PropertyValue &left, const PropertyValue &right) {
    if (left.kind() != right.kind())
        return false;
    switch (left.kind()) {
    case PropertyValue::Kind::String:
        return *left.asString() == *right.asString();
    case PropertyValue::Kind::Bytes:
        return *left.asBytes() == *right.asBytes();
    case PropertyValue::Kind::Array:
        return *left.asArray() == *right.asArray();
    case PropertyValue::Kind::Dictionary:
        return *left.asDictionary() == *right.asDictionary();
    default:
        return left._value == right._value;
    }
}

} // namespace ZorvaTouch
