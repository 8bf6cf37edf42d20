#include "Tools/Daemon/Keyboard.h"

#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <initializer_list>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr KeyChange kLouder{kKeyVolumeUp, true};
constexpr KeyChange kNoLouder{kKeyVolumeUp, false};
constexpr KeyChange kQuieter{kKeyVolumeDown, true};
constexpr KeyChange kNoQuieter{kKeyVolumeDown, false};

class KeyboardTest : public testing::Test {
protected:
    void make() { keyboard.emplace(keys.maker(), told, DaemonLog(logs, "Keys")); }
    void apply(const SurfaceName &surface, std::initializer_list<KeyChange> changes) {
        KeyChanges all;
        for (const KeyChange change : changes)
            all.add(change);
        keyboard->apply(surface, nullptr, all);
    }

    const SurfaceName left{.id = "L", .node = "/dev/hidraw0", .name = ""};
    const SurfaceName right{.id = "R", .node = "/dev/hidraw1", .name = ""};
    Tests::JournalOfLogs logs;
    Tests::ListenerJournal told;
    Tests::FakeKeyboards keys;
    std::optional<Keyboard> keyboard;
};

TEST_F(KeyboardTest, PressesAndReleases) {
    make();
    apply(left, {kLouder, kNoLouder});
    keyboard.reset();
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 unplugged"));
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115", "L -115"));
    EXPECT_THAT(logs.lines().lines(), IsEmpty());
}

TEST_F(KeyboardTest, AKeyThatTwoSurfacesHoldGoesUpWithTheLast) {
    make();
    apply(left, {kLouder});
    apply(right, {kLouder});
    apply(left, {kNoLouder});
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    apply(right, {kNoLouder});
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115", "R -115"));
}

TEST_F(KeyboardTest, TheEndReleasesWhatIsDown) {
    make();
    apply(left, {kLouder});
    apply(right, {kQuieter});
    keyboard.reset();
    EXPECT_THAT(keys.journal.lines(),
                ElementsAre("1 plugged", "1 +115", "1 +114", "1 -114", "1 -115", "1 unplugged"));
}

TEST_F(KeyboardTest, WithoutAMakerKeysAreShown) {
    keyboard.emplace(nullptr, told, DaemonLog(logs, "Keys"));
    EXPECT_FALSE(keyboard->isPlugged());
    apply(left, {kLouder, kNoLouder});
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115 shown", "L -115 shown"));
    EXPECT_THAT(logs.lines().lines(), IsEmpty());
}

TEST_F(KeyboardTest, WhileTheMachineSleepsNothingIsPressed) {
    make();
    apply(left, {kLouder});
    keyboard->sleep(true);
    apply(left, {kNoLouder}); // what was down goes up
    apply(right, {kQuieter, kNoQuieter});
    keyboard->sleep(false);
    apply(right, {kQuieter, kNoQuieter});
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115", "L -115", "R +114", "R -114"));
}

TEST_F(KeyboardTest, AMakerThatThrowsIsOneLineAndKeysAreShown) {
    const std::string refusal = "/dev/uinput: Permission denied";
    keys.makerErrors = {refusal, refusal, refusal}; // it is tried with each key
    make();
    EXPECT_FALSE(keyboard->isPlugged());
    apply(left, {kLouder, kNoLouder});
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115 shown", "L -115 shown"));
    EXPECT_THAT(logs.lines().lines(),
                ElementsAre("Keys error: keys are shown, not pressed: /dev/uinput: Permission denied"));
}

TEST_F(KeyboardTest, CanBePluggedLater) {
    keys.makerErrors = {"no keyboard"};
    make();
    keyboard->plug();
    keyboard->plug(); // it is
    EXPECT_TRUE(keyboard->isPlugged());
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged"));
}

TEST_F(KeyboardTest, AReplacementThatIsNotToBeHadLetsGoOfTheKeysAllTheSameAndIsTriedWithTheNextKey) {
    make();
    apply(left, {kLouder});
    keys.releaseErrors = {ENODEV};
    keys.makerErrors = {"no keyboard"};
    apply(left, {kNoLouder});
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_FALSE(keyboard->isPlugged());
    EXPECT_THAT(logs.lines().lines(), ElementsAre("Keys error: cannot release a key: write: No such device",
                                                  "Keys error: keys are shown, not pressed: no keyboard"));
    apply(right, {kQuieter, kNoQuieter});
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115", "L -115 shown", "R +114", "R -114"));
}

class KeyboardErrors : public KeyboardTest, public testing::WithParamInterface<int> {};

TEST_P(KeyboardErrors, AKeyThatCannotBeReleasedMakesANewKeyboard) {
    make();
    apply(left, {kLouder});
    keys.releaseErrors = {GetParam()};
    apply(left, {kNoLouder});
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_THAT(keys.journal.take(),
                ElementsAre("1 plugged", "1 +115", "1 -115 failed", "1 unplugged", "2 plugged"));
    apply(left, {kLouder, kNoLouder});
    EXPECT_THAT(keys.journal.take(), ElementsAre("2 +115", "2 -115"));
    EXPECT_THAT(told.keys.lines(), ElementsAre("L +115", "L -115", "L +115", "L -115"));
    EXPECT_EQ(logs.lines().count("Keys error: cannot release a key: write: "), 1u);
}

TEST_P(KeyboardErrors, AKeyThatCannotBePressedIsPressedOnANewKeyboard) {
    make();
    keys.pressErrors = {GetParam()};
    apply(left, {kLouder});
    EXPECT_THAT(keys.journal.take(),
                ElementsAre("1 plugged", "1 +115 failed", "1 unplugged", "2 plugged", "2 +115"));
    apply(left, {kNoLouder});
    EXPECT_THAT(keys.down(), IsEmpty());
}

TEST_P(KeyboardErrors, ANewKeyboardHasNothingDownOfWhatAnotherSurfaceHolds) {
    make();
    apply(right, {kQuieter});
    keys.pressErrors = {GetParam()};
    apply(left, {kLouder});
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    apply(right, {kNoQuieter}); // which is up already
    apply(left, {kNoLouder});
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_THAT(told.keys.lines(), ElementsAre("R +114", "L +115", "R -114", "L -115"));
}

TEST_P(KeyboardErrors, FailuresWithoutAnEndLeaveNoKeyDown) {
    make();
    for (int i = 0; i < 100; ++i) {
        keys.pressErrors.push_back(GetParam());
        keys.releaseErrors.push_back(GetParam());
    }
    for (int i = 0; i < 20; ++i) {
        apply(left, {kLouder, kNoLouder});
        EXPECT_THAT(keys.down(), IsEmpty());
    }
    keyboard.reset();
    EXPECT_EQ(keys.journal.count(" plugged"), keys.journal.count(" unplugged"));
}

INSTANTIATE_TEST_SUITE_P(Errno, KeyboardErrors,
                         testing::Values(EAGAIN, EINVAL, EIO, ENODEV, ENOSPC, EBADF, ENOMEM, EACCES));

} // namespace
} // namespace ZorvaTouch::Tools
