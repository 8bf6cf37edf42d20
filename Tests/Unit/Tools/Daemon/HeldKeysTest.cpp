#include "Tools/Daemon/HeldKeys.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;

constexpr KeyChange kDown{115, true};
constexpr KeyChange kUp{115, false};

TEST(HeldKeys, PassesOnWhatOneSurfaceDoes) {
    HeldKeys keys;
    EXPECT_TRUE(keys.take(kDown));
    EXPECT_TRUE(keys.isDown(115));
    EXPECT_TRUE(keys.take(kUp));
    EXPECT_FALSE(keys.isDown(115));
}

TEST(HeldKeys, TwoSurfacesOnOneKeyAreOnePressAndOneRelease) {
    HeldKeys keys;
    EXPECT_TRUE(keys.take(kDown));
    EXPECT_FALSE(keys.take(kDown));
    EXPECT_FALSE(keys.take(kUp));
    EXPECT_TRUE(keys.isDown(115));
    EXPECT_TRUE(keys.take(kUp));
}

TEST(HeldKeys, KeysAreCountedEachByItself) {
    HeldKeys keys;
    EXPECT_TRUE(keys.take(kDown));
    EXPECT_TRUE(keys.take({114, true}));
    EXPECT_TRUE(keys.take(kUp));
    EXPECT_TRUE(keys.isDown(114));
}

TEST(HeldKeys, AReleaseOfWhatIsUpChangesNothing) {
    HeldKeys keys;
    EXPECT_FALSE(keys.take(kUp));
    EXPECT_TRUE(keys.take(kDown)); // nothing was owed
}

TEST(HeldKeys, CodesThatTheKernelHasNotChangeNothing) {
    HeldKeys keys;
    for (const KeyCode code : {KeyCode{0}, KeyCode{768}, KeyCode{0xFFFF}}) {
        EXPECT_FALSE(keys.take({code, true}));
        EXPECT_FALSE(keys.isDown(code));
        EXPECT_FALSE(keys.take({code, false}));
    }
    EXPECT_TRUE(keys.take({767, true}));
    EXPECT_TRUE(keys.take({1, true}));
}

TEST(HeldKeys, ReleasesEverythingOnceWhoeverPressedIt) {
    HeldKeys keys;
    for (const KeyChange press : {KeyChange{582, true}, kDown, kDown})
        static_cast<void>(keys.take(press));
    EXPECT_THAT(keys.releaseAll(), ElementsAre(kUp, KeyChange{582, false}));
    EXPECT_FALSE(keys.isDown(115));
    EXPECT_FALSE(keys.take(kUp));
    EXPECT_TRUE(keys.releaseAll().empty());
}

} // namespace
} // namespace ZorvaTouch::Tools
