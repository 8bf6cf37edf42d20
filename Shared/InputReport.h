#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>

namespace ZorvaTouch {

/// Sensing electrodes, lettered A to O; index 0 = electrode A ... 14 = electrode O.
inline constexpr std::size_t kElectrodeCount = 15;

/// The device's input reports. A report is the bytes as the host delivers them, report ID first,
/// little-endian.
namespace InputReport {

/// One sensor image: report ID 1.
struct Image {
    static constexpr std::uint8_t kReportId = 1;
    static constexpr std::size_t kReportLength = 73; ///< bytes, report ID included

    std::uint32_t
        frameNumber;      ///< the sensor's frame counter; the next image has the next number, modulo 2^32
    std::uint32_t timeMs; ///< the sensor's millisecond clock, wraps at 2^32
    std::array<std::uint8_t, 4> flags; ///< device status, carried and never interpreted
    std::array<std::uint16_t, kElectrodeCount>
        rawCounts; ///< raw measurements in sensor counts, for the picture only
    std::array<std::int16_t, kElectrodeCount> signals; ///< touch signals in sensor counts; may be negative

    /// Parses one image report.
    ///
    /// @param data    Report bytes, report ID first. Borrowed for the call; not read when `length` is too
    /// small.
    /// @param length  Bytes at `data`. 73 or more; anything beyond 73 is ignored.
    /// @return The record, or nothing if the report is short or its ID is not 1.
    ///
    /// Errors:   nothing thrown, allocated or logged.
    /// Threads:  any; no shared state.
    /// Realtime: yes.
    [[nodiscard]] static std::optional<Image> parse(const std::uint8_t *data, std::size_t length) noexcept;

    /// The report that parses to this record: for those who play the device.
    [[nodiscard]] std::array<std::uint8_t, kReportLength> toReport() const noexcept;
};
static_assert(sizeof(Image) == 72, "wire format: image record");

/// A note from the firmware: report ID 2.
struct FirmwareEvent {
    static constexpr std::uint8_t kReportId = 2;
    static constexpr std::size_t kReportLength = 10; ///< bytes, report ID included
    static constexpr std::uint8_t kDeviceReset = 0;  ///< `eventCode`: the device has reset

    std::uint8_t eventCode;
    std::array<std::uint8_t, 8> payload; ///< opaque

    /// Parses one firmware event of 10 bytes or more with ID 2; as `Image::parse` in all else.
    [[nodiscard]] static std::optional<FirmwareEvent> parse(const std::uint8_t *data,
                                                            std::size_t length) noexcept;
};
static_assert(sizeof(FirmwareEvent) == 9, "wire format: firmware event record");

} // namespace InputReport

/// The device's feature reports.
namespace FeatureReport {

/// Answer to feature report 31: how long the device's factory-reset gesture must be held.
struct FactoryResetHoldDuration {
    static constexpr std::uint8_t kReportId = 31;
    static constexpr std::size_t kReportLength = 5; ///< bytes, report ID included

    std::uint32_t duration; ///< in the device's own unit, passed on unchanged

    /// Parses an answer of 5 bytes or more with ID 31; as `InputReport::Image::parse` in all else.
    [[nodiscard]] static std::optional<FactoryResetHoldDuration> parse(const std::uint8_t *data,
                                                                       std::size_t length) noexcept;
};

} // namespace FeatureReport
} // namespace ZorvaTouch
