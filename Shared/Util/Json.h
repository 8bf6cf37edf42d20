#pragma once

#include "Shared/Util/PropertyValue.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

/// JSON text in and out. The library behind it is seen in Json.cpp only.
namespace ZorvaTouch::Util {

/// Levels of nesting that JSON text may have; the outermost array or object is level 1.
inline constexpr std::size_t kJsonMaxDepth = 64;

/// One value inside a `JsonDocument`. Borrowed: valid as long as the document.
class JsonValue {
public:
    enum class Kind { Null, Boolean, Number, String, Array, Object };

    [[nodiscard]] Kind kind() const noexcept;
    /// The text of a string, else nothing. Well-formed UTF-8.
    [[nodiscard]] std::optional<std::string_view> asString() const noexcept;
    /// A number as unsigned 64 bits (fractions truncate, negative ones give 0, too large ones saturate), else
    /// nothing.
    [[nodiscard]] std::optional<std::uint64_t> asUnsigned() const noexcept;
    /// A copy as a value tree. Of equal keys in one object the last one holds.
    [[nodiscard]] PropertyValue toPropertyValue() const;

private:
    friend class JsonParser;
    friend class JsonArrayReader;
    friend class JsonObjectReader;
    using Handle = std::array<std::uintptr_t, 2>; ///< the library's own handle, opaque here

    Handle _handle{};
};

/// Steps through an array's elements in order.
class JsonArrayReader {
public:
    /// @param array  Must be of kind `Array`.
    explicit JsonArrayReader(JsonValue array) noexcept;
    /// Moves to the next element; false at the end.
    [[nodiscard]] bool next(JsonValue &element) noexcept;

private:
    JsonValue::Handle _at, _end;
};

/// Steps through an object's members in the order of the text, equal keys included.
class JsonObjectReader {
public:
    /// @param object  Must be of kind `Object`.
    explicit JsonObjectReader(JsonValue object) noexcept;
    /// Moves to the next member; false at the end.
    [[nodiscard]] bool next(std::string_view &key, JsonValue &value) noexcept;

private:
    JsonValue::Handle _at, _end;
};

/// Parses JSON texts one after the other and keeps its memory for the next one.
class JsonParser {
public:
    JsonParser();
    JsonParser(JsonParser &&) noexcept;
    JsonParser &operator=(JsonParser &&) noexcept;
    ~JsonParser();

    /// Parses one whole JSON text.
    ///
    /// Refused are: a byte-order mark, malformed UTF-8, unpaired surrogates, numbers out of the range of a
    /// double or integers above 2^64-1, anything but white space after the value, more than `levels` levels
    /// of nesting, and texts of 4 GiB or more.
    ///
    /// @param text    Borrowed for the call.
    /// @param error   If given, receives a short reason in English when the result is empty.
    /// @param levels  At most `kJsonMaxDepth`.
    /// @return The root, valid until the next call.
    /// @throws std::bad_alloc
    [[nodiscard]] std::optional<JsonValue> parse(std::string_view text, std::string *error = nullptr,
                                                 std::size_t levels = kJsonMaxDepth);

private:
    struct Tape;

    std::unique_ptr<Tape> _tape;
};

/// A parsed JSON text.
///
/// Threads: reading a finished document is safe from several threads.
class JsonDocument {
public:
    /// Parses one whole JSON text as `JsonParser::parse` does.
    [[nodiscard]] static std::optional<JsonDocument> parse(std::string_view text,
                                                           std::string *error = nullptr);

    [[nodiscard]] JsonValue root() const noexcept { return _root; }

private:
    JsonDocument(JsonParser parser, JsonValue root) noexcept : _parser(std::move(parser)), _root(root) {}

    JsonParser _parser; ///< keeps what the root refers to
    JsonValue _root;
};

/// Parses JSON text into a value tree; nothing if it is no JSON.
[[nodiscard]] std::optional<PropertyValue> parseJson(std::string_view text);

/// Appends a value as compact JSON, dictionary keys in order.
///
/// Everything can be written: byte strings become hex text, NaN and infinities null, malformed UTF-8 is
/// replaced, and levels beyond `kJsonMaxDepth` (counting the value as level `depth`) become null, so that
/// what is written can always be read.
void appendJson(std::string &text, const PropertyValue &value, std::size_t depth = 1);

/// Appends a quoted, escaped JSON string.
void appendJsonString(std::string &text, std::string_view value);

/// Returns what `appendJson` appends.
[[nodiscard]] std::string jsonText(const PropertyValue &value);

} // namespace ZorvaTouch::Util
