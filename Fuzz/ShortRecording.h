#pragma once

#include "Shared/Frame.h"
#include "Shared/FrameList.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

/// Recordings in few bytes, for the fuzzer: any bytes are a recording, a touch takes a few dozen, and a
/// change of one byte changes one thing. It is not a file format; it may change with each version.
namespace ZorvaTouch::Fuzzing {

/// Reads frames one after the other.
///
/// The first byte has the bound of a recording (bits 0 to 3) and whether the sensor's clock begins 300 ms
/// before it wraps (bit 7). Each frame then begins with a byte: its kind in bits 0 and 1 (0 image, 1 report,
/// 2 state write, 3 metadata) and in the others the time to the next frame in units of 8 ms. Numbers are
/// little-endian.
///
/// * image: milliseconds of the sensor's clock since the last image (16 bits), a mask of the electrodes that
/// have a
///   signal (16 bits; bit 15: the image before this one is lost), and 16 bits for each of these.
/// * report: length (8 bits) and its bytes, report ID first.
/// * state write, metadata: key and value. A key below 128 is one of a table; from 128 on, a text of bits 0
/// to 4
///   bytes follows, after "Algs." if bit 6 is set. A value begins with its kind (8 bits).
///
/// What is missing at the end reads as zeros.
class ShortRecordingReader {
public:
    /// @param input  Borrowed while the reader is used.
    explicit ShortRecordingReader(std::span<const std::uint8_t> input) noexcept;

    /// The bound that a recording of the frames gets; 0 to 15.
    [[nodiscard]] std::uint64_t bound() const noexcept { return _bound; }
    /// The next frame, or nothing at the end. The first has the time stamp `kStartTicks`.
    [[nodiscard]] std::optional<Frame> next();

private:
    [[nodiscard]] std::uint64_t takeNumber(std::size_t bytes) noexcept;
    [[nodiscard]] std::span<const std::uint8_t> takeBytes(std::size_t count) noexcept;
    [[nodiscard]] std::string takeText(std::size_t length);
    [[nodiscard]] std::vector<std::uint8_t> takeImage();
    [[nodiscard]] std::string takeKey();
    [[nodiscard]] PropertyValue takeValue();

    std::span<const std::uint8_t> _input;
    std::uint64_t _bound = 0;
    std::uint64_t _timestampNs;
    std::uint32_t _timeMs = 0;
    std::uint32_t _frameNumber = 0;
};

/// The bytes that a reader makes these frames of, as far as it can: times in units of 8 ms, images without
/// flags and raw counts, texts of up to 31 bytes. For seeds.
[[nodiscard]] std::string shortRecording(const FrameList &frames);

} // namespace ZorvaTouch::Fuzzing
