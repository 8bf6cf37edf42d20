#include "Bench/Reference/Channels.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>

namespace ZorvaTouch::Reference {
namespace {

constexpr std::int32_t kFloor = 75; // scaled sensor counts
constexpr std::int32_t kLowestAboveFloor = 76;
constexpr float kHysteresis = 0.6f;

constexpr std::array<float, kElectrodeCount> kElectrodeGains{1.9219f, 1.8833f, 1.9281f, 1.8837f, 1.9163f,
                                                             1.8105f, 1.0081f, 1.0f,    1.4851f, 1.5033f,
                                                             2.4154f, 1.5378f, 1.5431f, 1.04f,   1.0493f};

struct Group {
    const char *name;
    float factor;
};
constexpr std::array<Group, 23> kGroups{{
    {"ABE", 0.6667f},  {"ABF", 0.4444f}, {"ADEF", 0.6667f}, {"AEGJ", 0.5714f}, {"BCEF", 0.6667f},
    {"BFHJ", 0.5714f}, {"CDE", 0.6667f}, {"CDF", 0.4651f},  {"CELN", 0.6667f}, {"DFLO", 0.6667f},
    {"EFK", 0.4f},     {"EJK", 0.4f},    {"EKL", 0.4f},     {"FJK", 0.4f},     {"FKL", 0.4f},
    {"GHI", 0.5714f},  {"GIJ", 0.4f},    {"HIJ", 0.4f},     {"IJK", 0.4f},     {"KLM", 0.4f},
    {"LMN", 0.4444f},  {"LMO", 0.5714f}, {"MNO", 0.6667f},
}};

/// Toward zero; what is out of range ends at the range's ends, and NaN is 0.
std::int32_t truncated(float number) {
    if (std::isnan(number))
        return 0;
    const auto wide = static_cast<double>(number); // holds both ends of the range, which a float does not
    if (wide >= std::numeric_limits<std::int32_t>::max())
        return std::numeric_limits<std::int32_t>::max();
    if (wide <= std::numeric_limits<std::int32_t>::min())
        return std::numeric_limits<std::int32_t>::min();
    return static_cast<std::int32_t>(number);
}

std::int32_t electrodeOf(char letter) { return letter - 'A'; }

} // namespace

Region regionOf(std::int32_t electrodeIndex) {
    const std::uint32_t bit = 1u << (static_cast<std::uint32_t>(electrodeIndex) & 31u);
    if (bit & 0x3C0u) // G to J
        return kRegionVolumeUp;
    if (bit & 0x7800u) // L to O
        return kRegionVolumeDown;
    if (bit & 0x43Fu) // A to F, K
        return kRegionPlayPause;
    return kRegionNone;
}

Pixel::Pixel(std::int32_t electrodeIndex, float channelGain) : gain(channelGain), index(electrodeIndex) {}

void Pixel::update(std::int32_t raw, float activationThreshold) {
    value = truncated(gain * static_cast<float>(raw));

    float threshold = 0;
    if (isTouched)
        threshold = peakValue * kHysteresis;
    else
        threshold = static_cast<float>(std::max(static_cast<double>(valleyValue / kHysteresis), 1.0));

    normalizedValue = static_cast<float>(value) / activationThreshold;
    isTouched = normalizedValue > threshold;
    if (isTouched) {
        if (normalizedValue > peakValue)
            peakValue = normalizedValue;
        valleyValue = normalizedValue;
        wasTouched = true;
    } else {
        peakValue = normalizedValue;
        if (normalizedValue < valleyValue)
            valleyValue = normalizedValue;
    }

    isAboveFloor = value > kFloor;
    if (value >= kLowestAboveFloor) {
        wasAboveFloor = true;
        if (normalizedValue > maxNormalizedValue)
            maxNormalizedValue = normalizedValue;
    }
}

void Pixel::resetStatistics() {
    wasAboveFloor = false;
    wasTouched = false;
    maxNormalizedValue = 0;
}

VirtualPixel::VirtualPixel(const std::string &letters, float channelGain)
    : Pixel(letters.front(), channelGain), name(letters) {}

std::vector<Pixel> makePixels() {
    std::vector<Pixel> pixels;
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        pixels.emplace_back(static_cast<std::int32_t>(i), kElectrodeGains[i]);
    return pixels;
}

VirtualImage::VirtualImage() {
    for (const Group &group : kGroups) {
        names.emplace_back(group.name);
        values.push_back(0);
        dominantIndices.push_back(electrodeOf(names.back().front()));
        normalizationFactors.push_back(group.factor);
    }
}

void VirtualImage::updateValues(const std::vector<Pixel> &pixels) {
    std::fill(values.begin(), values.end(), 0);
    for (std::size_t i = 0; i < names.size(); ++i) {
        for (const char letter : names[i]) {
            const std::int32_t member = electrodeOf(letter);
            const std::int32_t value = pixels[static_cast<std::size_t>(member)].value;
            if (value < kLowestAboveFloor)
                continue;
            values[i] += value;
            if (value > pixels[static_cast<std::size_t>(dominantIndices[i])].value)
                dominantIndices[i] = member;
        }
    }
}

std::vector<VirtualPixel> makeVirtualPixels(const VirtualImage &image) {
    std::vector<VirtualPixel> pixels;
    pixels.reserve(image.names.size());
    for (std::size_t i = 0; i < image.names.size(); ++i)
        pixels.emplace_back(image.names[i], image.normalizationFactors[i]);
    return pixels;
}

} // namespace ZorvaTouch::Reference
