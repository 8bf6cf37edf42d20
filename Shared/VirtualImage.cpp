#include "Shared/VirtualImage.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch {
namespace {

struct Group {
    std::string_view name; ///< letters of the members
    float factor;          ///< default normalization factor, unitless
};

/// The groups; their order is the channel number used everywhere.
constexpr std::array<Group, kVirtualPixelCount> kGroups{{
    {"ABE", 0.6667f},  {"ABF", 0.4444f}, {"ADEF", 0.6667f}, {"AEGJ", 0.5714f}, {"BCEF", 0.6667f},
    {"BFHJ", 0.5714f}, {"CDE", 0.6667f}, {"CDF", 0.4651f},  {"CELN", 0.6667f}, {"DFLO", 0.6667f},
    {"EFK", 0.4f},     {"EJK", 0.4f},    {"EKL", 0.4f},     {"FJK", 0.4f},     {"FKL", 0.4f},
    {"GHI", 0.5714f},  {"GIJ", 0.4f},    {"HIJ", 0.4f},     {"IJK", 0.4f},     {"KLM", 0.4f},
    {"LMN", 0.4444f},  {"LMO", 0.5714f}, {"MNO", 0.6667f},
}};

constexpr bool hasKnownMembers(const Group &group) {
    return !group.name.empty() && std::all_of(group.name.begin(), group.name.end(), [](char c) {
        return c >= 'A' && c < static_cast<char>('A' + kElectrodeCount);
    });
}
static_assert(std::all_of(kGroups.begin(), kGroups.end(), hasKnownMembers));
static_assert(kGroups[kVirtualPixelIJK].name == "IJK" && kGroups[kVirtualPixelKLM].name == "KLM");

constexpr std::int32_t electrodeOf(char letter) { return letter - 'A'; }

} // namespace

VirtualImage::VirtualImage() noexcept {
    for (std::size_t i = 0; i < kVirtualPixelCount; ++i) {
        names[i] = kGroups[i].name;
        dominantIndices[i] = electrodeOf(kGroups[i].name.front());
        normalizationFactors[i] = kGroups[i].factor;
    }
}

void VirtualImage::updateValues(const Pixels &pixels) noexcept {
    values.fill(0);
    const auto contributes = [](const Pixel &pixel) { return pixel.value > kNoiseFloor; };
    if (std::none_of(pixels.begin(), pixels.end(), contributes)) // the sensor at rest
        return;
    for (std::size_t i = 0; i < kVirtualPixelCount; ++i)
        updateGroup(i, pixels);
}

void VirtualImage::updateGroup(std::size_t group, const Pixels &pixels) noexcept {
    const auto valueOf = [&pixels](std::int32_t electrode) {
        return pixels[static_cast<std::size_t>(electrode)].value;
    };
    std::uint32_t sum = 0; // unsigned: saturated members wrap instead of overflowing
    std::int32_t dominant = dominantIndices[group];
    for (const char letter : kGroups[group].name) {
        const std::int32_t member = electrodeOf(letter);
        const std::int32_t value = valueOf(member);
        if (value <= kNoiseFloor)
            continue;
        sum += static_cast<std::uint32_t>(value);
        if (value > valueOf(dominant))
            dominant = member;
    }
    values[group] = static_cast<std::int32_t>(sum);
    dominantIndices[group] = dominant;
}

VirtualPixels makeVirtualPixels(const VirtualImage &image) noexcept {
    return [&image]<std::size_t... I>(std::index_sequence<I...>) {
        return VirtualPixels{VirtualPixel(image.names[I], image.normalizationFactors[I])...};
    }
    (std::make_index_sequence<kVirtualPixelCount>());
}

} // namespace ZorvaTouch
