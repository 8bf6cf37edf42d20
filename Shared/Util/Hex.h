#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Util {

/// Characters that one byte takes as hex text: two lower-case digits and a space.
inline constexpr std::size_t kHexCharactersPerByte = 3;

/// Writes bytes as hex text, "01 ab ff " for 01 AB FF: every byte, the last one too, is followed by a space.
[[nodiscard]] std::string hexStringFromBytes(std::span<const std::uint8_t> bytes);

/// Appends what `hexStringFromBytes` returns.
void appendHexString(std::string &text, std::span<const std::uint8_t> bytes);

/// Reads hex text: whitespace-separated tokens, each an unsigned hexadecimal number of at most 16 bits in
/// either case, "0x" allowed, no sign.
///
/// Reading stops without an error at the first token that is not such a number, so "01 zz 02" is one byte.
/// @throws std::invalid_argument "invalid hex string" for a number from 256 to 65535.
[[nodiscard]] std::vector<std::uint8_t> bytesFromHexString(std::string_view text);

/// As above, into a buffer that is cleared first and keeps its capacity.
void bytesFromHexString(std::string_view text, std::vector<std::uint8_t> &bytes);

} // namespace ZorvaTouch::Util
