#include "Shared/SVM.h"

#include <algorithm>
#include <functional>
#include <limits>

namespace ZorvaTouch {
namespace {

struct Rank {
    float mean, scale; ///< what the feature is standardized by, scaled sensor counts
    float weight;      ///< of the standardized feature, unitless
};

/// The model, strongest channel first.
constexpr std::array<Rank, kChannelCount> kModel{{
    {559.2485f, 319.631f, 2.0791f},   {458.1396f, 264.2479f, 0.577f},   {409.6764f, 238.355f, -0.0003f},
    {376.5288f, 222.3886f, 1.7971f},  {339.7854f, 211.1872f, 0.8896f},  {302.5308f, 206.0873f, -0.194f},
    {281.1469f, 198.0056f, -1.7877f}, {258.9062f, 189.2092f, 1.9933f},  {234.2004f, 182.5528f, 0.5968f},
    {215.7817f, 177.034f, -0.6801f},  {199.7768f, 170.0103f, -0.1372f}, {184.8617f, 163.5788f, -0.4558f},
    {172.0251f, 157.3571f, 0.3444f},  {160.0365f, 151.1289f, 0.1195f},  {148.0888f, 144.6578f, 0.2427f},
    {135.208f, 138.2757f, 0.2738f},   {124.4527f, 131.4855f, -0.7458f}, {114.4343f, 124.7151f, -0.2226f},
    {104.0568f, 116.673f, -0.95f},    {93.4508f, 107.0524f, -0.238f},   {83.6343f, 98.8414f, 0.0785f},
    {74.3161f, 91.5114f, -1.6108f},   {65.3713f, 84.5376f, -0.4774f},   {57.6177f, 78.8144f, 0.3914f},
    {50.8842f, 72.6408f, -0.0379f},   {43.4918f, 64.3881f, -0.5014f},   {37.2454f, 58.6809f, 0.2391f},
    {31.5491f, 51.8691f, 0.5287f},    {26.5578f, 45.1187f, -0.3405f},   {22.2556f, 39.4927f, 0.2821f},
    {18.6728f, 35.9957f, 0.8225f},    {15.4697f, 32.8257f, -0.5142f},   {12.7815f, 29.4461f, -1.1009f},
    {10.1925f, 25.6704f, 0.3262f},    {7.6475f, 20.1275f, -1.7422f},    {5.3422f, 15.8161f, 0.4487f},
    {3.7211f, 11.7617f, 0.0877f},     {2.1581f, 10.0508f, -0.2101f},
}};
constexpr float kModelBias = 2.0083f;

/// The channels' values; the classifier looks at them from strongest to weakest. Only values are sorted:
/// equal ones cannot be told apart.
using Profile = std::array<std::int32_t, kChannelCount>;

Profile gatherValues(const Pixels &pixels, const VirtualPixels &virtualPixels) noexcept {
    Profile profile;
    const auto valueOf = [](const Pixel &pixel) { return pixel.value; };
    const auto middle = std::transform(pixels.begin(), pixels.end(), profile.begin(), valueOf);
    std::transform(virtualPixels.begin(), virtualPixels.end(), middle, valueOf);
    return profile;
}

/// Whether there is anything to classify. Needs no order: the second strongest is above the floor if two are.
bool opensGate(const Profile &profile, float activationThreshold) noexcept {
    const std::int32_t strongest = *std::max_element(profile.begin(), profile.end());
    const auto isAboveFloor = [](std::int32_t value) { return value > kNoiseFloor; };
    return static_cast<float>(strongest) > activationThreshold ||
           std::count_if(profile.begin(), profile.end(), isAboveFloor) >= 2;
}

/// Bits of a key below the value: they hold the channel, so that no two keys are equal.
constexpr int kChannelBits = 6;
static_assert(kChannelCount <= 1u << kChannelBits);

bool fitsKey(std::int32_t value) noexcept {
    constexpr std::int32_t kLimit = std::numeric_limits<std::int32_t>::max() >> kChannelBits;
    return value > -kLimit && value < kLimit;
}

/// Strongest first. A value's rank is the number of stronger ones: the counting has no branches and both
/// loops are vector code, which beats every sort for so few values. Only a virtual pixel with an absurd
/// factor has values that leave no room for the channel's bits.
void sortStrongestFirst(Profile &profile) noexcept {
    if (!std::all_of(profile.begin(), profile.end(), fitsKey)) {
        std::sort(profile.begin(), profile.end(), std::greater<>());
        return;
    }
    Profile keys;
    for (std::size_t i = 0; i < kChannelCount; ++i)
        keys[i] = profile[i] * (1 << kChannelBits) + static_cast<std::int32_t>(i);
    std::array<std::int32_t, kChannelCount> ranks{};
    for (const std::int32_t other : keys)
        for (std::size_t i = 0; i < kChannelCount; ++i)
            ranks[i] += other > keys[i];
    Profile sorted;
    for (std::size_t i = 0; i < kChannelCount; ++i)
        sorted[static_cast<std::size_t>(ranks[i])] = profile[i];
    profile = sorted;
}

} // namespace

SVM::SVM() noexcept : bias(kModelBias) {
    for (std::size_t i = 0; i < kChannelCount; ++i) {
        means[i] = kModel[i].mean;
        scales[i] = kModel[i].scale;
        weights[i] = kModel[i].weight;
    }
}

void SVM::updateSVMScore(const Pixels &pixels, const VirtualPixels &virtualPixels, float activationThreshold,
                         std::uint32_t /*now*/) noexcept {
    score = 0;
    Profile profile = gatherValues(pixels, virtualPixels);
    if (!opensGate(profile, activationThreshold))
        return;
    sortStrongestFirst(profile);
    std::array<float, kChannelCount>
        terms; // apart from their sum, so that they are computed several at a time
    for (std::size_t i = 0; i < kChannelCount; ++i)
        terms[i] = (static_cast<float>(profile[i]) - means[i]) / scales[i] * weights[i];
    // In rank order, every operation rounded to single precision: the score must be the same on every
    // machine.
    for (const float term : terms)
        score += term;
    score += bias;
}

} // namespace ZorvaTouch
