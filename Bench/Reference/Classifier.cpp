#include "Bench/Reference/Classifier.h"

#include <algorithm>
#include <array>

namespace ZorvaTouch::Reference {
namespace {

constexpr std::int32_t kLowestAboveFloor = 76; // scaled sensor counts
constexpr float kBias = 2.0083f;

/// What a feature is held against; means and scales in scaled sensor counts.
struct Rank {
    float mean;
    float scale;
    float weight;
};
constexpr std::array<Rank, 38> kRanks{{
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

} // namespace

void Classifier::updateScore(const std::vector<Pixel> &pixels, const std::vector<VirtualPixel> &virtualPixels,
                             float activationThreshold) {
    _score = 0;

    std::vector<Pixel> ranked;
    ranked.reserve(kRanks.size());
    ranked.insert(ranked.end(), pixels.begin(), pixels.end());
    ranked.insert(ranked.end(), virtualPixels.begin(), virtualPixels.end());
    std::sort(ranked.begin(), ranked.end(),
              [](const Pixel &left, const Pixel &right) { return left.value > right.value; });

    const bool isStrong = static_cast<float>(ranked[0].value) > activationThreshold;
    if (!isStrong && ranked[1].value < kLowestAboveFloor)
        return;
    for (std::size_t i = 0; i < kRanks.size(); ++i) {
        const Rank &rank = kRanks[i];
        _score += (static_cast<float>(ranked[i].value) - rank.mean) / rank.scale * rank.weight;
    }
    _score += kBias;
}

} // namespace ZorvaTouch::Reference
