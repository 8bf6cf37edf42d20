#pragma once

#include <concepts>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

namespace ZorvaTouch {

/// A dynamically typed value: state values, property values and the values inside recordings.
///
/// Values are immutable once made, so a copy shares the original's text, bytes, elements or entries: it
/// allocates nothing, cannot fail, and may be read on another thread. Negative integers have no kind of their
/// own and travel as `Double`.
class PropertyValue {
public:
    using Bytes = std::vector<std::uint8_t>;
    using Array = std::vector<PropertyValue>;
    using Dictionary =
        std::map<std::string, PropertyValue, std::less<>>; ///< ordered by key: one text per value

    enum class Kind { Null, Boolean, Unsigned, Double, String, Bytes, Array, Dictionary };

    PropertyValue() noexcept = default; ///< null
    template <std::same_as<bool> T> PropertyValue(T value) : _value(value) {}
    template <std::unsigned_integral T>
    requires(!std::same_as<T, bool>) PropertyValue(T value) : _value(static_cast<std::uint64_t>(value)) {}
    template <std::floating_point T> PropertyValue(T value) : _value(static_cast<double>(value)) {}
    template <std::signed_integral T> PropertyValue(T) = delete; ///< say what is meant: unsigned or double
    PropertyValue(std::string value);
    PropertyValue(std::string_view value) : PropertyValue(std::string(value)) {}
    PropertyValue(const char *value) : PropertyValue(std::string(value)) {}
    PropertyValue(Bytes value);
    PropertyValue(Array value);
    PropertyValue(Dictionary value);

    PropertyValue(const PropertyValue &other) noexcept = default;
    PropertyValue &operator=(const PropertyValue &other) noexcept = default;
    PropertyValue(PropertyValue &&other) noexcept; ///< leaves `other` null
    PropertyValue &operator=(PropertyValue &&other) noexcept;
    ~PropertyValue() = default;

    [[nodiscard]] Kind kind() const noexcept { return static_cast<Kind>(_value.index()); }
    [[nodiscard]] bool isNull() const noexcept { return kind() == Kind::Null; }

    // The value if it is of that kind, else null. Borrowed: valid as long as this value.
    [[nodiscard]] const bool *asBool() const noexcept { return std::get_if<bool>(&_value); }
    [[nodiscard]] const std::uint64_t *asUnsigned() const noexcept {
        return std::get_if<std::uint64_t>(&_value);
    }
    [[nodiscard]] const double *asDouble() const noexcept { return std::get_if<double>(&_value); }
    [[nodiscard]] const std::string *asString() const noexcept { return pointee<std::string>(); }
    [[nodiscard]] const Bytes *asBytes() const noexcept { return pointee<Bytes>(); }
    [[nodiscard]] const Array *asArray() const noexcept { return pointee<Array>(); }
    [[nodiscard]] const Dictionary *asDictionary() const noexcept { return pointee<Dictionary>(); }

    /// The entry of that name, or null if there is none or this is no dictionary.
    [[nodiscard]] const PropertyValue *find(std::string_view key) const noexcept;

    // Conversions of a state write: a boolean counts as the number 0 or 1, anything that is no number as 0.

    /// "Not 0"; NaN is not 0.
    [[nodiscard]] bool toBool() const noexcept;
    /// Rounded once to single precision; out of range gives an infinity.
    [[nodiscard]] float toFloat() const noexcept;
    /// Fractions truncate, negative values and NaN give 0, too large ones 2^64-1.
    [[nodiscard]] std::uint64_t toUnsigned() const noexcept;

    /// Same kind and same content. NaN differs from itself.
    friend bool operator==(const PropertyValue &left, const PropertyValue &right);

private:
    template <typename T> [[nodiscard]] const T *pointee() const noexcept {
        const auto *shared = std::get_if<std::shared_ptr<const T>>(&_value);
        return shared ? shared->get() : nullptr;
    }

    // In the order of Kind. No alternative's copy may throw: libstdc++ 12 mishandles one that does.
    std::variant<std::monostate, bool, std::uint64_t, double, std::shared_ptr<const std::string>,
                 std::shared_ptr<const Bytes>, std::shared_ptr<const Array>,
                 std::shared_ptr<const Dictionary>>
        _value;
};

} // namespace ZorvaTouch
