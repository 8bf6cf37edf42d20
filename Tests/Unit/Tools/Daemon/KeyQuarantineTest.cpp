#include "Tools/Daemon/KeyQuarantine.h"

#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <initializer_list>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using Transition = KeyQuarantine::Transition;

constexpr std::uint64_t kMs = 1'000'000;

class KeyQuarantineTest : public testing::Test {
protected:
    /// What passes, as "+115", with " begins" or " ends" for the quarantine.
    Tests::Lines at(std::uint64_t timeMs, std::initializer_list<KeyChange> changes) {
        KeyChanges given;
        for (const KeyChange change : changes)
            given.add(change);
        const auto result = quarantine.filter(given, timeMs * kMs);
        Tests::Lines lines;
        for (const KeyChange change : result.changes)
            lines.push_back(Tests::textOf(change));
        if (result.transition != Transition::None)
            lines.emplace_back(result.transition == Transition::Begins ? "begins" : "ends");
        return lines;
    }
    Tests::Lines tap(std::uint64_t timeMs) { return at(timeMs, {{115, true}, {115, false}}); }

    KeyQuarantine quarantine{3};
};

TEST_F(KeyQuarantineTest, BeginsWithThePressThatExceedsTheLimitWithinASecond) {
    for (const std::uint64_t timeMs : {100u, 200u, 300u})
        EXPECT_THAT(tap(timeMs), ElementsAre("+115", "-115"));
    EXPECT_THAT(tap(1099), ElementsAre("begins")); // 999 ms after the first
    EXPECT_EQ(quarantine.suppressed(), 1u);
}

TEST_F(KeyQuarantineTest, DoesNotBeginAtTheLimit) {
    for (const std::uint64_t timeMs : {100u, 200u, 300u, 1100u, 1200u, 1300u})
        EXPECT_THAT(tap(timeMs), ElementsAre("+115", "-115"));
    EXPECT_EQ(quarantine.suppressed(), 0u);
}

TEST_F(KeyQuarantineTest, EndsWithTheFirstPressAfterTheQuietPeriod) {
    for (int i = 0; i < 3; ++i)
        static_cast<void>(tap(0));
    EXPECT_THAT(tap(10), ElementsAre("begins"));
    EXPECT_THAT(tap(2009), IsEmpty()); // 1999 ms later: not quiet yet, and the quiet period restarts
    EXPECT_THAT(tap(4008), IsEmpty());
    EXPECT_EQ(quarantine.suppressed(), 3u);
    EXPECT_THAT(tap(6008), ElementsAre("+115", "-115", "ends"));
    EXPECT_EQ(quarantine.suppressed(), 3u);
    EXPECT_THAT(tap(6009), ElementsAre("+115", "-115"));
}

TEST_F(KeyQuarantineTest, AHeldKeyGoesUpWhenItBegins) {
    static_cast<void>(tap(0));
    static_cast<void>(tap(0));
    EXPECT_THAT(at(1, {{114, true}}), ElementsAre("+114"));
    EXPECT_EQ(quarantine.keyDown(), 114);
    EXPECT_THAT(at(2, {{114, false}, {115, true}}), ElementsAre("-114", "begins")); // the hold moves
    EXPECT_EQ(quarantine.keyDown(), kNoKey);
    EXPECT_THAT(at(3, {{115, false}}), IsEmpty()); // its press did not pass
}

TEST_F(KeyQuarantineTest, ATimeThatGoesBackCountsAsTheLatest) {
    static_cast<void>(tap(5000));
    static_cast<void>(tap(0));
    static_cast<void>(tap(0));
    EXPECT_THAT(tap(0), ElementsAre("begins"));
    EXPECT_THAT(tap(0), IsEmpty());
}

TEST_F(KeyQuarantineTest, MayBeEndedWithoutAPress) {
    EXPECT_FALSE(quarantine.end());
    for (int i = 0; i < 4; ++i)
        static_cast<void>(tap(0));
    EXPECT_TRUE(quarantine.end());
    EXPECT_FALSE(quarantine.end());
}

TEST(KeyQuarantine, WithoutALimitEverythingPasses) {
    KeyQuarantine quarantine(0);
    KeyChanges press;
    press.add({115, true});
    for (int i = 0; i < 10'000; ++i)
        ASSERT_EQ(quarantine.filter(press, 0).changes.size(), 1u);
}

} // namespace
} // namespace ZorvaTouch::Tools
