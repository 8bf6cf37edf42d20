#pragma once

#include "Host/Linux/IioText.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace ZorvaTouch::Linux {

/// A channel that may be part of a scan.
struct ScanElement {
    std::string name; ///< "in_accel_x"
    unsigned index = 0;
    ScanType type;
};

/// Names of the elements that are read.
inline constexpr std::array<const char *, 3> kAccelElements{"in_accel_x", "in_accel_y", "in_accel_z"};
inline constexpr const char *kTimestampElement = "in_timestamp";

/// How a raw value becomes m/s^2: (raw + offset) * scale.
struct AxisConversion {
    double offset = 0;
    double scale = 1;
};

/// What one scan says.
struct AccelSample {
    std::array<float, 3> g{};                ///< x, y, z
    std::optional<std::int64_t> nanoseconds; ///< by the device's clock; nothing without a time stamp

    friend bool operator==(const AccelSample &, const AccelSample &) = default;
};

/// Where things are in the scans of a device. Each element begins at a multiple of its own size, in the order
/// of the indices, and a scan at a multiple of its largest element's.
///
/// Threads: any, as a value.
class IioScan {
public:
    using Conversions = std::array<AxisConversion, 3>; ///< of x, y, z

    /// @param elements  Those that are part of a scan, in any order.
    /// @return Nothing if an axis is missing or comes in a row of several, or two elements have one index.
    /// @throws std::bad_alloc
    [[nodiscard]] static std::optional<IioScan> create(std::vector<ScanElement> elements,
                                                       const Conversions &conversions);

    /// Bytes.
    [[nodiscard]] std::size_t size() const noexcept { return _size; }
    [[nodiscard]] bool hasTimestamp() const noexcept { return _timestamp.has_value(); }
    /// @param scan  Of at least that size.
    [[nodiscard]] AccelSample decode(std::span<const std::uint8_t> scan) const noexcept;

private:
    struct Field {
        std::size_t begin; ///< byte
        ScanType type;
    };

    IioScan() noexcept = default;
    void place(const ScanElement &element, std::size_t begin);
    [[nodiscard]] bool isComplete() const noexcept;

    std::size_t _size = 0;
    std::array<std::optional<Field>, 3> _axes;
    std::optional<Field> _timestamp;
    Conversions _conversions;
};

/// A value as it lies in a scan.
/// @param bytes  As many as the type's storage takes.
[[nodiscard]] double decodeRaw(const ScanType &type, std::span<const std::uint8_t> bytes) noexcept;

} // namespace ZorvaTouch::Linux
