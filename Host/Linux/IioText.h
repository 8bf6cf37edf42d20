#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace ZorvaTouch::Linux {

/// How one value lies in a scan.
struct ScanType {
    bool isBigEndian = false;
    bool isSigned = false;
    unsigned bits = 0;        ///< that count, 1 to 64
    unsigned storageBits = 0; ///< that it takes: 8, 16, 32 or 64
    unsigned repeat = 1;      ///< such values in a row: 1, 2, 4, 8 or 16
    unsigned shift = 0;       ///< bits below those that count

    /// Bytes of all of them. They begin at a multiple of it.
    [[nodiscard]] std::size_t size() const noexcept { return storageBits / 8 * std::size_t{repeat}; }

    friend bool operator==(const ScanType &, const ScanType &) = default;
};

// Texts of the kernel's IIO attributes, as they are without the end of the line.
//
// Threads: any.

/// "le:s12/16>>4": little or big endian, signed or not, bits that count, bits in all, shift. "X3" after the
/// bits in all is a repetition; without a shift there is none.
/// @return Nothing if it is of another form, or says what cannot be.
[[nodiscard]] std::optional<ScanType> parseScanType(std::string_view text) noexcept;

/// A whole number without a sign.
[[nodiscard]] std::optional<unsigned> parseIioCount(std::string_view text) noexcept;

/// A decimal number, perhaps negative, with a fraction or an exponent; not an infinite one.
[[nodiscard]] std::optional<double> parseIioNumber(std::string_view text) noexcept;

/// Of the frequencies that a device says it has, separated by blanks: the lowest that is not below the wish,
/// or else the highest. What is no number is passed over.
/// @return Nothing if there is none. "[least step most]" is none: such a device takes what is in between.
/// @throws std::bad_alloc
[[nodiscard]] std::optional<std::string> closestFrequency(std::string_view available, double wanted);

} // namespace ZorvaTouch::Linux
