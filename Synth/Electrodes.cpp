#include "Synth/Electrodes.h"

namespace ZorvaTouch::Synth {
namespace {

/// The field of an electrode in the sensor picture.
struct PictureField {
    char letter;
    std::size_t column, row; ///< of its first character, from 0
};

constexpr std::size_t kFieldColumns = 4; ///< characters of every field

constexpr std::array<PictureField, kPadCount> kFields{{
    {'H', 11, 0}, {'G', 21, 0},  {'I', 16, 1},  {'B', 5, 2},   {'A', 27, 2},  {'J', 9, 3},
    {'J', 23, 3}, {'F', 5, 4},   {'E', 27, 4},  {'A', 1, 5},   {'B', 31, 5},  {'K', 16, 6},
    {'D', 1, 7},  {'C', 31, 7},  {'E', 5, 8},   {'F', 27, 8},  {'L', 9, 9},   {'L', 23, 9},
    {'C', 5, 10}, {'D', 27, 10}, {'M', 16, 11}, {'N', 11, 12}, {'O', 21, 12},
}};

constexpr Pad padOf(const PictureField &field) {
    const double column = static_cast<double>(field.column) + kFieldColumns / 2.0;
    const double row = static_cast<double>(field.row) + 0.5;
    return {.electrode = static_cast<std::size_t>(field.letter - 'A'),
            .centre = {.x = column * kColumnMm, .y = row * kRowMm},
            .width = kFieldColumns * kColumnMm,
            .height = kRowMm};
}

constexpr std::array<Pad, kPadCount> makePads() {
    std::array<Pad, kPadCount> made{};
    for (std::size_t i = 0; i < kPadCount; ++i)
        made[i] = padOf(kFields[i]);
    return made;
}

constexpr std::array<Pad, kPadCount> kPads = makePads();

std::array<double, kElectrodeCount> makeSensitivities() noexcept {
    std::array<double, kElectrodeCount> made{};
    const Pixels pixels = makePixels();
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        made[i] = 1.0 / static_cast<double>(pixels[i].gain);
    return made;
}

} // namespace

const std::array<Pad, kPadCount> &pads() noexcept { return kPads; }

const std::array<double, kElectrodeCount> &sensitivities() noexcept {
    static const auto kSensitivities = makeSensitivities();
    return kSensitivities;
}

Point centreOf(PixelRegion region) noexcept {
    Point sum;
    double count = 0;
    for (const Pad &pad : kPads) {
        if (regionOfElectrode(static_cast<std::int32_t>(pad.electrode)) != region)
            continue;
        sum.x += pad.centre.x;
        sum.y += pad.centre.y;
        count += 1;
    }
    return {.x = sum.x / count, .y = sum.y / count};
}

} // namespace ZorvaTouch::Synth
