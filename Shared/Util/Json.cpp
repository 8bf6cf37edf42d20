#include "Shared/Util/Json.h"

#include "Shared/Util/Hex.h"
#include "Shared/Util/Text.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <new>
#include <simdjson.h>
#include <type_traits>

namespace ZorvaTouch::Util {
namespace {

namespace dom = simdjson::dom;

constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
constexpr char kHexDigits[] = "0123456789abcdef";

/// The library's element and iterators are a pointer and an index; they travel in our handles bit for bit.
template <typename Element, typename Handle> Element fromHandle(const Handle &handle) {
    static_assert(std::is_trivially_copyable_v<Element> && sizeof(Element) == sizeof(Handle));
    return std::bit_cast<Element>(handle);
}

template <typename Handle, typename Element> Handle toHandle(const Element &element) {
    static_assert(std::is_trivially_copyable_v<Element> && sizeof(Element) == sizeof(Handle));
    return std::bit_cast<Handle>(element);
}

void appendEscaped(std::string &text, char c) {
    const auto code = static_cast<unsigned char>(c);
    switch (c) {
    case '"':
        text.append("\\\"");
        break;
    case '\\':
        text.append("\\\\");
        break;
    case '\b':
        text.append("\\b");
        break;
    case '\f':
        text.append("\\f");
        break;
    case '\n':
        text.append("\\n");
        break;
    case '\r':
        text.append("\\r");
        break;
    case '\t':
        text.append("\\t");
        break;
    default:
        if (code < 0x20) {
            text.append("\\u00");
            text.push_back(kHexDigits[code >> 4]);
            text.push_back(kHexDigits[code & 0xF]);
        } else {
            text.push_back(c);
        }
    }
}

void appendArray(std::string &text, const PropertyValue::Array &array, std::size_t depth) {
    const char *separator = "[";
    for (const PropertyValue &element : array) {
        text.append(separator);
        appendJson(text, element, depth + 1);
        separator = ",";
    }
    text.append(array.empty() ? "[]" : "]");
}

void appendDictionary(std::string &text, const PropertyValue::Dictionary &dictionary, std::size_t depth) {
    const char *separator = "{";
    for (const auto &[key, value] : dictionary) {
        text.append(separator);
        appendJsonString(text, key);
        text.push_back(':');
        appendJson(text, value, depth + 1);
        separator = ",";
    }
    text.append(dictionary.empty() ? "{}" : "}");
}

void appendNumber(std::string &text, double value) {
    if (std::isfinite(value))
        appendShortest(text, value);
    else
        text.append("null");
}

PropertyValue arrayFrom(JsonValue value) {
    PropertyValue::Array array;
    JsonArrayReader reader(value);
    JsonValue element;
    while (reader.next(element))
        array.push_back(element.toPropertyValue());
    return array;
}

PropertyValue dictionaryFrom(JsonValue value) {
    PropertyValue::Dictionary dictionary;
    JsonObjectReader reader(value);
    std::string_view key;
    JsonValue member;
    while (reader.next(key, member))
        dictionary.insert_or_assign(std::string(key), member.toPropertyValue());
    return dictionary;
}

/// Whether arrays and objects nest deeper than `levels`. Recursion ends there.
bool nestsDeeperThan(std::size_t levels, dom::element element) {
    const auto anyDeeper = [levels](const auto &container, const auto &valueOf) {
        return levels == 0 || std::any_of(container.begin(), container.end(), [&](const auto &child) {
                   return nestsDeeperThan(levels - 1, valueOf(child));
               });
    };
    if (element.is_array())
        return anyDeeper(element.get_array().value_unsafe(), [](dom::element child) { return child; });
    if (element.is_object())
        return anyDeeper(element.get_object().value_unsafe(),
                         [](const dom::key_value_pair &child) { return child.value; });
    return false;
}

simdjson::error_code parseWithin(std::size_t depth, dom::parser &parser, std::string_view text,
                                 dom::element &root) {
    const std::size_t capacity = std::max(parser.capacity(), text.size()); // it never shrinks
    if (const auto code = parser.allocate(capacity, depth); code != simdjson::SUCCESS)
        return code;
    return parser.parse(text.data(), text.size()).get(root);
}

/// The library's limit is one level off for containers that are not empty: within N levels it takes N if the
/// innermost container is empty and N - 1 otherwise. So what it refuses for depth gets a second look with one
/// more.
simdjson::error_code parseText(std::size_t levels, dom::parser &parser, std::string_view text,
                               dom::element &root) {
    const auto code = parseWithin(levels, parser, text, root);
    if (code != simdjson::DEPTH_ERROR)
        return code;
    const auto second = parseWithin(levels + 1, parser, text, root);
    if (second == simdjson::SUCCESS && nestsDeeperThan(levels, root))
        return simdjson::DEPTH_ERROR;
    return second;
}

/// What is wrong, in a few words.
std::string_view reasonFor(simdjson::error_code code) {
    switch (code) {
    case simdjson::CAPACITY:
        return "4 GiB or more";
    case simdjson::DEPTH_ERROR:
        return "more than 64 levels of nesting";
    case simdjson::UTF8_ERROR:
        return "malformed UTF-8";
    case simdjson::NUMBER_ERROR:
        return "malformed number, or number out of range";
    case simdjson::STRING_ERROR:
    case simdjson::UNCLOSED_STRING:
    case simdjson::UNESCAPED_CHARS:
        return "malformed string";
    default:
        return "not JSON";
    }
}

} // namespace

JsonValue::Kind JsonValue::kind() const noexcept {
    switch (fromHandle<dom::element>(_handle).type()) {
    case dom::element_type::ARRAY:
        return Kind::Array;
    case dom::element_type::OBJECT:
        return Kind::Object;
    case dom::element_type::INT64:
    case dom::element_type::UINT64:
    case dom::element_type::DOUBLE:
        return Kind::Number;
    case dom::element_type::STRING:
        return Kind::String;
    case dom::element_type::BOOL:
        return Kind::Boolean;
    case dom::element_type::NULL_VALUE:
        break;
    }
    return Kind::Null;
}

std::optional<std::string_view> JsonValue::asString() const noexcept {
    std::string_view text;
    if (fromHandle<dom::element>(_handle).get_string().get(text) != simdjson::SUCCESS)
        return std::nullopt;
    return text;
}

std::optional<std::uint64_t> JsonValue::asUnsigned() const noexcept {
    if (kind() != Kind::Number)
        return std::nullopt;
    std::uint64_t number = 0;
    if (fromHandle<dom::element>(_handle).get_uint64().get(number) == simdjson::SUCCESS)
        return number;
    return toPropertyValue().toUnsigned();
}

PropertyValue JsonValue::toPropertyValue() const {
    const auto element = fromHandle<dom::element>(_handle);
    switch (kind()) {
    case Kind::Array:
        return arrayFrom(*this);
    case Kind::Object:
        return dictionaryFrom(*this);
    case Kind::String:
        return *asString();
    case Kind::Boolean:
        return element.get_bool().value_unsafe();
    case Kind::Number: {
        std::uint64_t number = 0;
        if (element.get_uint64().get(number) == simdjson::SUCCESS)
            return number;
        return element.get_double().value_unsafe(); // also takes negative integers
    }
    case Kind::Null:
        break;
    }
    return {};
}

JsonArrayReader::JsonArrayReader(JsonValue array) noexcept {
    const dom::array elements = fromHandle<dom::element>(array._handle).get_array().value_unsafe();
    _at = toHandle<JsonValue::Handle>(elements.begin());
    _end = toHandle<JsonValue::Handle>(elements.end());
}

bool JsonArrayReader::next(JsonValue &element) noexcept {
    if (_at == _end)
        return false;
    auto at = fromHandle<dom::array::iterator>(_at);
    element._handle = toHandle<JsonValue::Handle>(*at);
    _at = toHandle<JsonValue::Handle>(++at);
    return true;
}

JsonObjectReader::JsonObjectReader(JsonValue object) noexcept {
    const dom::object members = fromHandle<dom::element>(object._handle).get_object().value_unsafe();
    _at = toHandle<JsonValue::Handle>(members.begin());
    _end = toHandle<JsonValue::Handle>(members.end());
}

bool JsonObjectReader::next(std::string_view &key, JsonValue &value) noexcept {
    if (_at == _end)
        return false;
    auto at = fromHandle<dom::object::iterator>(_at);
    key = at.key();
    value._handle = toHandle<JsonValue::Handle>(at.value());
    _at = toHandle<JsonValue::Handle>(++at);
    return true;
}

struct JsonParser::Tape {
    dom::parser parser;
};

JsonParser::JsonParser() : _tape(std::make_unique<Tape>()) {}
JsonParser::JsonParser(JsonParser &&) noexcept = default;
JsonParser &JsonParser::operator=(JsonParser &&) noexcept = default;
JsonParser::~JsonParser() = default;

std::optional<JsonValue> JsonParser::parse(std::string_view text, std::string *error, std::size_t levels) {
    const auto refuse = [error](std::string_view reason) -> std::optional<JsonValue> {
        if (error)
            *error = reason;
        return std::nullopt;
    };
    if (text.empty())
        return refuse("the text is empty");
    if (text.starts_with(kByteOrderMark))
        return refuse("the text begins with a byte-order mark");
    dom::element root;
    const auto code = parseText(levels, _tape->parser, text, root);
    if (code == simdjson::MEMALLOC)
        throw std::bad_alloc();
    if (code != simdjson::SUCCESS)
        return refuse(reasonFor(code));
    JsonValue value;
    value._handle = toHandle<JsonValue::Handle>(root);
    return value;
}

std::optional<JsonDocument> JsonDocument::parse(std::string_view text, std::string *error) {
    JsonParser parser;
    const auto root = parser.parse(text, error);
    return root ? std::optional(JsonDocument(std::move(parser), *root)) : std::nullopt;
}

std::optional<PropertyValue> parseJson(std::string_view text) {
    const auto document = JsonDocument::parse(text);
    return document ? std::optional(document->root().toPropertyValue()) : std::nullopt;
}

void appendJsonString(std::string &text, std::string_view value) {
    if (!isValidUtf8(value))
        return appendJsonString(text, repairUtf8(value));
    text.push_back('"');
    for (const char c : value)
        appendEscaped(text, c);
    text.push_back('"');
}

void appendJson(std::string &text, const PropertyValue &value, std::size_t depth) {
    const bool isContainer = value.asArray() || value.asDictionary();
    if (isContainer && depth > kJsonMaxDepth) {
        text.append("null");
        return;
    }
    switch (value.kind()) {
    case PropertyValue::Kind::Null:
        text.append("null");
        break;
    case PropertyValue::Kind::Boolean:
        text.append(*value.asBool() ? "true" : "false");
        break;
    case PropertyValue::Kind::Unsigned:
        appendUnsigned(text, *value.asUnsigned());
        break;
    case PropertyValue::Kind::Double:
        appendNumber(text, *value.asDouble());
        break;
    case PropertyValue::Kind::String:
        appendJsonString(text, *value.asString());
        break;
    case PropertyValue::Kind::Bytes:
        appendJsonString(text, hexStringFromBytes(*value.asBytes()));
        break;
    case PropertyValue::Kind::Array:
        appendArray(text, *value.asArray(), depth);
        break;
    case PropertyValue::Kind::Dictionary:
        appendDictionary(text, *value.asDictionary(), depth);
        break;
    }
}

std::string jsonText(const PropertyValue &value) {
    std::string text;
    appendJson(text, value);
    return text;
}

} // namespace ZorvaTouch::Util
