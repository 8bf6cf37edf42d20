#include "Shared/VirtualImage.h"

#include "Tests/Support/Channels.h"

#include <limits>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Testing::Channels;

// Group numbers used below; the order of the table is the channel number used everywhere.
constexpr std::size_t kABE = 0;
constexpr std::size_t kGHI = 15;

/// Electrodes A, B and E, the members of the first group, at these values and all others at 0.
Pixels frameOfABE(std::int32_t a, std::int32_t b, std::int32_t e) {
    Channels channels;
    channels.electrode('A').value = a;
    channels.electrode('B').value = b;
    channels.electrode('E').value = e;
    return channels.pixels;
}

struct GroupRow {
    const char *name;
    float factor;
    std::int32_t firstMember;
    std::int32_t sum;        ///< when each electrode has a power of two of its own
    std::int32_t lastMember; ///< the strongest then
};

// Electrode i at 128 * 2^i: A 128, B 256, C 512, D 1024, E 2048, F 4096, G 8192, H 16384, I 32768, J 65536, K
// 131072, L 262144, M 524288, N 1048576, O 2097152. A sum then tells its members.
const std::vector<GroupRow> kGroups{
    {"ABE", 0.6667f, 0, 128 + 256 + 2048, 4},
    {"ABF", 0.4444f, 0, 128 + 256 + 4096, 5},
    {"ADEF", 0.6667f, 0, 128 + 1024 + 2048 + 4096, 5},
    {"AEGJ", 0.5714f, 0, 128 + 2048 + 8192 + 65536, 9},
    {"BCEF", 0.6667f, 1, 256 + 512 + 2048 + 4096, 5},
    {"BFHJ", 0.5714f, 1, 256 + 4096 + 16384 + 65536, 9},
    {"CDE", 0.6667f, 2, 512 + 1024 + 2048, 4},
    {"CDF", 0.4651f, 2, 512 + 1024 + 4096, 5},
    {"CELN", 0.6667f, 2, 512 + 2048 + 262144 + 1048576, 13},
    {"DFLO", 0.6667f, 3, 1024 + 4096 + 262144 + 2097152, 14},
    {"EFK", 0.4f, 4, 2048 + 4096 + 131072, 10},
    {"EJK", 0.4f, 4, 2048 + 65536 + 131072, 10},
    {"EKL", 0.4f, 4, 2048 + 131072 + 262144, 11},
    {"FJK", 0.4f, 5, 4096 + 65536 + 131072, 10},
    {"FKL", 0.4f, 5, 4096 + 131072 + 262144, 11},
    {"GHI", 0.5714f, 6, 8192 + 16384 + 32768, 8},
    {"GIJ", 0.4f, 6, 8192 + 32768 + 65536, 9},
    {"HIJ", 0.4f, 7, 16384 + 32768 + 65536, 9},
    {"IJK", 0.4f, 8, 32768 + 65536 + 131072, 10},
    {"KLM", 0.4f, 10, 131072 + 262144 + 524288, 12},
    {"LMN", 0.4444f, 11, 262144 + 524288 + 1048576, 13},
    {"LMO", 0.5714f, 11, 262144 + 524288 + 2097152, 14},
    {"MNO", 0.6667f, 12, 524288 + 1048576 + 2097152, 14},
};

TEST(VirtualImage, StartsWithItsGroups) {
    const VirtualImage image;
    ASSERT_EQ(image.names.size(), kGroups.size());
    for (std::size_t i = 0; i < kGroups.size(); ++i) {
        SCOPED_TRACE(kGroups[i].name);
        EXPECT_EQ(image.names[i], kGroups[i].name);
        EXPECT_EQ(image.values[i], 0);
        EXPECT_EQ(image.dominantIndices[i], kGroups[i].firstMember);
        EXPECT_EQ(image.normalizationFactors[i], kGroups[i].factor);
    }
}

TEST(VirtualImage, SumsTheMembersOfEachGroupWithoutTheFactor) {
    Channels channels;
    for (std::size_t i = 0; i < channels.pixels.size(); ++i)
        channels.pixels[i].value = 128 << i;
    VirtualImage image;
    image.updateValues(channels.pixels);
    for (std::size_t i = 0; i < kGroups.size(); ++i) {
        SCOPED_TRACE(kGroups[i].name);
        EXPECT_EQ(image.values[i], kGroups[i].sum);
        EXPECT_EQ(image.dominantIndices[i], kGroups[i].lastMember);
    }
}

TEST(VirtualImage, GroupsAroundKHaveTheirNumbers) {
    EXPECT_EQ(kVirtualPixelIJK, 18u);
    EXPECT_EQ(kVirtualPixelKLM, 19u);
}

TEST(VirtualImage, AMemberAtTheFloorAddsNothing) {
    VirtualImage image;
    image.updateValues(frameOfABE(75, 76, 75));
    EXPECT_EQ(image.values[kABE], 76);
    image.updateValues(frameOfABE(76, 76, 76));
    EXPECT_EQ(image.values[kABE], 228);
    image.updateValues(frameOfABE(100, 150, 60));
    EXPECT_EQ(image.values[kABE], 250);
    image.updateValues(frameOfABE(-100, 150, -1));
    EXPECT_EQ(image.values[kABE], 150);
}

TEST(VirtualImage, SumsAreOfThisFrameOnly) {
    VirtualImage image;
    image.updateValues(frameOfABE(100, 150, 200));
    image.updateValues(frameOfABE(100, 0, 0));
    EXPECT_EQ(image.values[kABE], 100);
    image.updateValues(frameOfABE(0, 0, 0));
    EXPECT_EQ(image.values[kABE], 0);
}

TEST(VirtualImage, UsesValuesAndNothingElseOfTheChannels) {
    Channels channels;
    channels.electrode('A').normalizedValue = 5.0f;
    channels.electrode('A').isAboveFloor = true;
    channels.electrode('B').value = 100; // above the floor, whatever the flag says
    VirtualImage image;
    image.updateValues(channels.pixels);
    EXPECT_EQ(image.values[kABE], 100);
}

TEST(VirtualImage, NoMemberAboveTheFloorKeepsTheDominantElectrode) {
    VirtualImage image;
    image.updateValues(frameOfABE(100, 150, 60));
    EXPECT_EQ(image.dominantIndices[kABE], 1);
    image.updateValues(frameOfABE(0, 0, 0));
    EXPECT_EQ(image.values[kABE], 0);
    EXPECT_EQ(image.dominantIndices[kABE], 1);
    image.updateValues(frameOfABE(75, 70, 74)); // E and A are stronger than B, but at the floor
    EXPECT_EQ(image.dominantIndices[kABE], 1);
}

TEST(VirtualImage, AFrameAtTheFloorGivesZerosAndChangesNoDominantElectrode) {
    Channels channels;
    for (Pixel &pixel : channels.pixels)
        pixel.value = 75;
    VirtualImage image;
    image.updateValues(frameOfABE(0, 0, 100));
    const auto before = image.dominantIndices;
    image.updateValues(channels.pixels);
    EXPECT_EQ(image.values, (std::array<std::int32_t, 23>{}));
    EXPECT_EQ(image.dominantIndices, before);
    EXPECT_EQ(image.dominantIndices[kABE], 4);
}

struct DominanceRow {
    std::int32_t a, b, e;
    std::int32_t dominant;
};

TEST(VirtualImage, DominantElectrodeIsTheOneThatIsStrongerNow) {
    VirtualImage image;
    const std::vector<DominanceRow> rows{
        {100, 100, 100, 0}, // all equal: the first of the name was recorded to begin with
        {100, 101, 100, 1}, // stronger than the recorded one
        {101, 101, 90, 1},  // equal: the recorded one stays
        {102, 101, 90, 0},  // A again
        {90, 100, 110, 4},  // B first, then E stronger still
        {110, 110, 100, 0}, // A is stronger than E; B is then not stronger than A
        {74, 76, 0, 1},     // B above the floor and stronger than the recorded A
        {0, 60, 80, 4},     // against the recorded one's value now, which is below the floor
        {76, 0, -5, 0},     //
        {80, 0, 0, 0},      // falls and rises of the recorded one alone change nothing
    };
    for (std::size_t i = 0; i < rows.size(); ++i) {
        image.updateValues(frameOfABE(rows[i].a, rows[i].b, rows[i].e));
        EXPECT_EQ(image.dominantIndices[kABE], rows[i].dominant) << "frame " << i;
    }
}

TEST(VirtualImage, ARecordedElectrodeBelowTheFloorStaysAgainstOthersBelowIt) {
    VirtualImage image;
    image.updateValues(frameOfABE(10, 75, 0)); // B is stronger than A, but not above the floor
    EXPECT_EQ(image.dominantIndices[kABE], 0);
}

TEST(VirtualImage, DominanceOfOneGroupIsNoneOfAnothers) {
    VirtualImage image;
    image.updateValues(frameOfABE(0, 100, 0));
    EXPECT_EQ(image.dominantIndices[kABE], 1);
    EXPECT_EQ(image.dominantIndices[2], 0);    // ADEF has no B
    EXPECT_EQ(image.dominantIndices[kGHI], 6); // nor has GHI
}

TEST(VirtualImage, SumsAreThirtyTwoBitsWide) {
    VirtualImage image;
    image.updateValues(frameOfABE(30000, 30000, 30000));
    EXPECT_EQ(image.values[kABE], 90000); // no narrowing here
    image.updateValues(frameOfABE(1000000000, 1000000000, 100000000));
    EXPECT_EQ(image.values[kABE], 2100000000);
}

TEST(VirtualImage, OverflowingSumsWrap) {
    constexpr std::int32_t kLargest = std::numeric_limits<std::int32_t>::max();
    VirtualImage image;
    image.updateValues(frameOfABE(kLargest, 76, 0)); // only gains far out of proportion lead here
    EXPECT_EQ(image.values[kABE], -2147483573);      // 2^31 - 1 + 76 - 2^32
}

TEST(VirtualImage, VirtualPixelsTakeNameAndFactorOfTheirGroup) {
    VirtualImage image;
    image.normalizationFactors[kGHI] = 0.25f;
    const VirtualPixels pixels = makeVirtualPixels(image);
    ASSERT_EQ(pixels.size(), 23u);
    EXPECT_EQ(pixels[kABE].name, "ABE");
    EXPECT_EQ(pixels[kABE].gain, 0.6667f);
    EXPECT_EQ(pixels[kABE].index, 65); // the code of 'A'; no electrode until the first frame
    EXPECT_EQ(pixels[kGHI].name, "GHI");
    EXPECT_EQ(pixels[kGHI].gain, 0.25f);
    EXPECT_EQ(pixels[kGHI].index, 71);
    for (std::size_t i = 0; i < pixels.size(); ++i)
        EXPECT_EQ(pixels[i].name, kGroups[i].name);
}

} // namespace
} // namespace ZorvaTouch
