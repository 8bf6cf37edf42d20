#include "Shared/Util/JsonStream.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace ZorvaTouch::Util {
namespace {

constexpr std::size_t kPiece = 64 * 1024; // bytes
constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";

bool isSpace(char c) { return c == ' ' || c == '\n' || c == '\r' || c == '\t'; }

bool endsScalar(char c) {
    return isSpace(c) || std::string_view("{}[],:\"").find(c) != std::string_view::npos;
}

/// Backslashes right before `end`, which is after `begin`.
std::size_t backslashesBefore(const char *end, const char *begin) {
    const char *at = end;
    while (at != begin && at[-1] == '\\')
        --at;
    return static_cast<std::size_t>(end - at);
}

} // namespace

TextPieces piecesOf(std::string_view text) {
    return [text](char *to, std::size_t size) mutable {
        const std::size_t count = text.copy(to, size);
        text.remove_prefix(count);
        return count;
    };
}

JsonStream::JsonStream(TextPieces pieces) : _pieces(std::move(pieces)) {
    require(has(0), "the text is empty");
    static_cast<void>(has(kByteOrderMark.size() - 1));
    require(!std::string_view(_buffer.data(), _end).starts_with(kByteOrderMark),
            "the text begins with a byte-order mark");
}

void JsonStream::enter() {
    static_cast<void>(peek());
    require(_levels + 1 < kJsonMaxDepth, "too many levels of nesting to enter");
    ++_begin;
    ++_levels;
    _isFirst = true;
}

bool JsonStream::nextElement() { return nextItem(']'); }

bool JsonStream::nextMember(std::string &key) {
    if (!nextItem('}'))
        return false;
    require(peek() == '"', "an object's key must be a string");
    key = *value().asString();
    expect(':', "':' is missing after an object's key");
    return true;
}

JsonValue JsonStream::value() {
    const std::size_t length = lengthOfValue();
    require(length > 0, "a value is missing");
    std::string reason;
    const auto value =
        _parser.parse(std::string_view(_buffer).substr(_begin, length), &reason, kJsonMaxDepth - _levels);
    require(value.has_value(), reason.c_str());
    _begin += length;
    _lastLength = length;
    return *value;
}

void JsonStream::finish() { require(peek() == kEnd, "text after the end"); }

/// Has another piece of the text arrive; false at the end. Indices from `_begin` on stay what they are.
bool JsonStream::more() {
    if (_end == _buffer.size()) {
        std::copy(_buffer.begin() + static_cast<std::ptrdiff_t>(_begin), _buffer.end(), _buffer.begin());
        _dropped += _begin;
        _end -= std::exchange(_begin, 0);
        if (_buffer.size() - _end < kPiece / 2)
            _buffer.resize(std::max(2 * _buffer.size(), kPiece));
    }
    const std::size_t count = _pieces(_buffer.data() + _end, _buffer.size() - _end);
    _end += count;
    return count > 0;
}

/// Whether there is a byte at `index` from the begin of what is not yet taken.
bool JsonStream::has(std::size_t index) {
    while (index >= _end - _begin)
        if (!more())
            return false;
    return true;
}

/// The next byte that is not white space, `kEnd` at the end.
int JsonStream::peek() {
    while (has(0) && isSpace(at(0)))
        ++_begin;
    return has(0) ? static_cast<unsigned char>(at(0)) : kEnd;
}

void JsonStream::require(bool condition, const char *reason) const {
    if (!condition)
        throw JsonError(reason, _dropped + _begin);
}

void JsonStream::expect(char c, const char *reason) {
    require(peek() == c, reason);
    ++_begin;
}

bool JsonStream::nextItem(char closing) {
    if (peek() == closing) {
        ++_begin;
        --_levels;
        _isFirst = false; // in the one outside
        return false;
    }
    require(peek() != kEnd, "the text ends early");
    if (!std::exchange(_isFirst, false))
        expect(',', "',' is missing");
    return true;
}

std::size_t JsonStream::lengthOfValue() {
    switch (peek()) {
    case kEnd:
        require(false, "the text ends early");
        return 0;
    case '"':
        return endOfString(0);
    case '{':
    case '[':
        return endOfNested();
    default:
        return endOfScalar();
    }
}

/// @param start  Index of the opening quote.
/// @return The index after the closing one, or the end of the text.
std::size_t JsonStream::endOfString(std::size_t start) {
    std::size_t index = start + 1;
    while (has(index)) {
        const char *const first = _buffer.data() + _begin;
        const char *const from = first + index;
        const auto left = static_cast<std::size_t>(_buffer.data() + _end - from);
        const auto *const quote = static_cast<const char *>(std::memchr(from, '"', left));
        if (!quote) {
            index += left;
            continue;
        }
        index = static_cast<std::size_t>(quote - first) + 1;
        if (backslashesBefore(quote, first + start + 1) % 2 == 0)
            break;
    }
    return index;
}

/// Brackets of either kind are counted alike: the parser sees whether they match.
std::size_t JsonStream::endOfNested() {
    std::size_t levels = 0;
    std::size_t index = 0;
    while (has(index)) {
        const char c = at(index);
        if (c == '"') {
            index = endOfString(index);
            continue;
        }
        ++index;
        if (c == '{' || c == '[')
            ++levels;
        else if ((c == '}' || c == ']') && --levels == 0)
            break;
    }
    return index;
}

std::size_t JsonStream::endOfScalar() {
    std::size_t index = 0;
    while (has(index) && !endsScalar(at(index)))
        ++index;
    return index;
}

} // namespace ZorvaTouch::Util
