#pragma once

#include "Shared/Pixel.h"
#include "Synth/Electrodes.h"
#include "Synth/Parameters.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ZorvaTouch::Synth {

/// Times of a contact, microseconds. True time, which no clock of the device or the host shows.
using Microseconds = std::uint64_t;

[[nodiscard]] constexpr Microseconds microseconds(double seconds) noexcept {
    return static_cast<Microseconds>(seconds * 1e6);
}

enum class ContactKind {
    Tap,
    DoubleTap, ///< each of the two
    Hold,
    Palm,
    Broad,
    Thumb,
    Graze,
    Water,
    Remainder, ///< what is left of a contact after the device has reset
};

/// In labels, "DoubleTap".
[[nodiscard]] std::string_view nameOf(ContactKind kind) noexcept;

/// Where a contact rests from one time to another; between two stops it moves, fastest in the middle.
struct Stop {
    Microseconds arrival, departure; ///< since the contact's start
    Point place;
    PixelRegion region; ///< that is meant; none for what happens by accident
};

/// What a contact is on the sensor at one moment: a round hill of signal.
struct Blob {
    Point centre;
    double width;  ///< mm, full width at half maximum
    double height; ///< of the signal at full pressure

    /// What is left of the height at some place: (1 - q)^3 of it, where q = 1 is 1.1 widths from the centre;
    /// nothing beyond.
    [[nodiscard]] double at(Point place) const noexcept;
};

/// One body's touch from beginning to end.
struct Contact {
    static constexpr std::size_t kMaxStops = 4;

    ContactKind kind = ContactKind::Tap;
    double width = 0;       ///< of the blob at full pressure, mm
    double pressure = 0;    ///< largest, 0 to 1
    double sag = 0;         ///< part of the pressure that is lost from beginning to end, 0 to 1
    Microseconds start = 0; ///< since the episode's beginning, later since the stream's
    Microseconds attack = 0, duration = 0, release = 0; ///< attack and release are within the duration
    std::array<Stop, kMaxStops> stops{};
    std::size_t stopCount = 0;

    [[nodiscard]] Microseconds end() const noexcept { return start + duration; }

    /// Adds a place. The first stop's arrival is the contact's start; the last one is never left.
    void stopAt(Point place, Microseconds arrival, Microseconds departure,
                PixelRegion region = kPixelRegionNone) noexcept;

    // At a time since the contact's start.
    [[nodiscard]] Point centreAt(Microseconds time) const noexcept;
    /// 0 before and after the contact.
    [[nodiscard]] double pressureAt(Microseconds time, const Parameters &parameters) const noexcept;
    [[nodiscard]] Blob blobAt(Microseconds time, const Parameters &parameters) const noexcept;
};

} // namespace ZorvaTouch::Synth
