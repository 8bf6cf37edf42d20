#pragma once

#include "Shared/Util/Json.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace ZorvaTouch::Util {

/// Supplies a text piece by piece: fills up to `size` bytes at `to` and returns how many; 0 at the end. What
/// it throws passes through to the reader.
using TextPieces = std::function<std::size_t(char *to, std::size_t size)>;

/// The pieces of a text that is in memory. Borrowed while it is read.
[[nodiscard]] TextPieces piecesOf(std::string_view text);

/// Text that is not JSON. `what()` is a short reason.
class JsonError : public std::runtime_error {
public:
    JsonError(const std::string &reason, std::uint64_t where) : std::runtime_error(reason), offset(where) {}
    std::uint64_t offset; ///< bytes before the mistake, or before the value that has it
};

/// Reads a JSON text value by value while it arrives, so that a long text is never in memory as a whole: the
/// caller enters arrays and objects and takes their elements and members one after the other.
///
/// Accepts and refuses what `JsonParser` does, except that only each single value is limited to 4 GiB.
/// Memory: a piece of the text and the largest single value.
class JsonStream {
public:
    explicit JsonStream(TextPieces pieces);

    /// Whether an array or object comes next. Only where a value may stand.
    [[nodiscard]] bool isAtArray() { return peek() == '['; }
    [[nodiscard]] bool isAtObject() { return peek() == '{'; }
    /// Enters the array or object that comes next: the outer 63 levels; a deeper one is taken as a value. Its
    /// end is reported by `nextElement` or `nextMember`.
    void enter();
    /// Moves to the next element of the array that was entered last; false at its end, which leaves it.
    [[nodiscard]] bool nextElement();
    /// The same for an object; then `key` is the member's and its value comes next.
    [[nodiscard]] bool nextMember(std::string &key);

    /// Takes the whole value that comes next. Valid until the stream is next used.
    [[nodiscard]] JsonValue value();
    /// The text of the value that was taken last, as it is written. Valid as long as that value.
    [[nodiscard]] std::string_view lastText() const noexcept {
        return std::string_view(_buffer).substr(_begin - _lastLength, _lastLength);
    }

    /// Requires that nothing but white space is left.
    void finish();

    // All of them throw JsonError.

private:
    static constexpr int kEnd = -1;

    [[nodiscard]] bool more();
    [[nodiscard]] bool has(std::size_t index);
    [[nodiscard]] char at(std::size_t index) const { return _buffer[_begin + index]; }
    [[nodiscard]] int peek();
    void require(bool condition, const char *reason) const;
    void expect(char c, const char *reason);
    [[nodiscard]] bool nextItem(char closing);
    [[nodiscard]] std::size_t lengthOfValue();
    [[nodiscard]] std::size_t endOfString(std::size_t start);
    [[nodiscard]] std::size_t endOfNested();
    [[nodiscard]] std::size_t endOfScalar();

    TextPieces _pieces;
    std::string _buffer;
    std::size_t _begin = 0;      ///< of what is not yet taken, in the buffer
    std::size_t _end = 0;        ///< of what has arrived
    std::size_t _lastLength = 0; ///< of the value that was taken last, right before `_begin`
    std::uint64_t _dropped = 0;  ///< bytes of the text before the buffer
    std::size_t _levels = 0;     ///< entered and not left
    bool _isFirst = true;        ///< in the array or object that was entered last
    JsonParser _parser;
};

} // namespace ZorvaTouch::Util
