#pragma once

#include "Shared/FrameList.h"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// Recordings read and written with RapidJSON, into and from the same frames and with the same hex text as
/// the real roads.
namespace ZorvaTouch::Bench {

/// How much RapidJSON is asked to look at.
enum class RapidJsonChecks {
    Same,    ///< as much as the real road: malformed UTF-8, and the last bit of every number
    Default, ///< neither: what the library does unless told
};

/// Reads a container of the current version with the library's event parser.
/// @return Nothing for a text that is no such container.
[[nodiscard]] std::optional<FrameList> readWithRapidJson(const std::string &text, RapidJsonChecks checks);

/// A container written with the library's `Writer`. The text stays in the library's own buffer.
class RapidJsonText {
public:
    /// @param expectedLength  Room made beforehand, as the real road makes it.
    RapidJsonText(const FrameList &frames, std::size_t expectedLength);
    ~RapidJsonText();
    RapidJsonText(const RapidJsonText &) = delete;
    RapidJsonText &operator=(const RapidJsonText &) = delete;

    [[nodiscard]] std::string_view text() const;

private:
    struct Buffer;
    std::unique_ptr<Buffer> _buffer;
};

} // namespace ZorvaTouch::Bench
