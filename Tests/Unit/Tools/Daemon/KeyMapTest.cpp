#include "Tools/Daemon/KeyMap.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <linux/input-event-codes.h>
#include <string>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;

/// What is said about a text; empty if it was taken.
std::string problemWith(const std::string &text) {
    KeyMap map;
    try {
        map.assign(text);
    } catch (const KeyMapError &error) {
        EXPECT_EQ(map, KeyMap());
        return error.what();
    }
    return {};
}

TEST(KeyMap, PressesWhatEachGestureIsFor) {
    const KeyMap map;
    EXPECT_EQ(map.tapKey(kPixelRegionPlayPause), 164);
    EXPECT_EQ(map.tapKey(kPixelRegionVolumeDown), 114);
    EXPECT_EQ(map.tapKey(kPixelRegionVolumeUp), 115);
    EXPECT_EQ(map.holdKey(kPixelRegionPlayPause), 582);
    EXPECT_EQ(map.holdKey(kPixelRegionVolumeDown), 114);
    EXPECT_EQ(map.holdKey(kPixelRegionVolumeUp), 115);
}

TEST(KeyMap, PressesNothingOutsideOfTheRegions) {
    const KeyMap map;
    EXPECT_EQ(map.tapKey(kPixelRegionNone), kNoKey);
    EXPECT_EQ(map.holdKey(kPixelRegionNone), kNoKey);
    EXPECT_EQ(map.tapKey(static_cast<PixelRegion>(4)), kNoKey);
    EXPECT_EQ(map.holdKey(static_cast<PixelRegion>(0xFFFFFFFF)), kNoKey);
}

TEST(KeyMap, AssignChangesOneKey) {
    KeyMap map;
    map.assign("hold:play-pause=KEY_MICMUTE");
    EXPECT_THAT(map.texts(), ElementsAre("tap:play-pause=KEY_PLAYPAUSE", "tap:volume-down=KEY_VOLUMEDOWN",
                                         "tap:volume-up=KEY_VOLUMEUP", "hold:play-pause=KEY_MICMUTE",
                                         "hold:volume-down=KEY_VOLUMEDOWN", "hold:volume-up=KEY_VOLUMEUP"));
}

TEST(KeyMap, AssignTakesAKeyAway) {
    KeyMap map;
    map.assign("tap:volume-up=none");
    EXPECT_EQ(map.tapKey(kPixelRegionVolumeUp), kNoKey);
    EXPECT_EQ(map.holdKey(kPixelRegionVolumeUp), 115);
}

TEST(KeyMap, TheLastAssignmentCounts) {
    KeyMap map;
    map.assign("tap:volume-down=KEY_F13");
    map.assign("tap:volume-down=KEY_PREVIOUSSONG");
    EXPECT_EQ(map.tapKey(kPixelRegionVolumeDown), 165);
}

TEST(KeyMap, TellsEachKeyThatItNeedsOnce) {
    EXPECT_THAT(KeyMap().codes(), ElementsAre(114, 115, 164, 582));
    KeyMap map;
    for (const char *text : {"tap:play-pause=none", "hold:play-pause=none",
                             "tap:volume-down=KEY_PREVIOUSSONG", "tap:volume-up=KEY_NEXTSONG"})
        map.assign(text);
    EXPECT_THAT(map.codes(), ElementsAre(114, 115, 163, 165));
}

TEST(KeyMap, NeedsNoKeyWhenEveryOneIsTakenAway) {
    KeyMap map;
    for (const std::string &text : KeyMap().texts())
        map.assign(text.substr(0, text.find('=')) + "=none");
    EXPECT_TRUE(map.codes().empty());
}

TEST(KeyMap, NamesTheGesturesItKnows) {
    EXPECT_EQ(problemWith("swipe:volume-up=KEY_MUTE"), "'swipe' is not a gesture; gestures are tap, hold");
    EXPECT_EQ(problemWith(":volume-up=KEY_MUTE"), "'' is not a gesture; gestures are tap, hold");
    EXPECT_EQ(problemWith("Tap:volume-up=KEY_MUTE"), "'Tap' is not a gesture; did you mean 'tap'?");
}

TEST(KeyMap, NamesTheRegionsItKnows) {
    EXPECT_EQ(problemWith("tap:left=KEY_MUTE"),
              "'left' is not a region; regions are play-pause, volume-down, volume-up");
    EXPECT_EQ(problemWith("tap:=KEY_MUTE"),
              "'' is not a region; regions are play-pause, volume-down, volume-up");
    EXPECT_EQ(problemWith("tap:none=KEY_MUTE"),
              "'none' is not a region; regions are play-pause, volume-down, volume-up");
}

TEST(KeyMap, SuggestsTheKeyThatWasMeant) {
    const auto problem = [](const std::string &key) { return problemWith("tap:volume-up=" + key); };
    EXPECT_EQ(problem("KEY_MUTT"), "'KEY_MUTT' is not a key that can be pressed; did you mean 'KEY_MUTE'?");
    EXPECT_EQ(problem("key_mute"), "'key_mute' is not a key that can be pressed; did you mean 'KEY_MUTE'?");
    EXPECT_EQ(problem("KEY_MUTE "), "'KEY_MUTE ' is not a key that can be pressed; did you mean 'KEY_MUTE'?");
    EXPECT_EQ(problem("KEY_NETXSONG"),
              "'KEY_NETXSONG' is not a key that can be pressed; did you mean 'KEY_NEXTSONG'?");
    EXPECT_EQ(problem("None"), "'None' is not a key that can be pressed; did you mean 'none'?");
    for (const std::string key : {"", "113", "KEY_POWER"})
        EXPECT_EQ(problem(key),
                  "'" + key + "' is not a key that can be pressed; Docs/Keys.md lists the keys");
}

TEST(KeyMap, SaysHowAnAssignmentIsWritten) {
    const std::string form = " is not GESTURE:REGION=KEY, which is written as tap:volume-up=KEY_NEXTSONG";
    EXPECT_EQ(problemWith(""), "''" + form);
    EXPECT_EQ(problemWith("KEY_MUTE"), "'KEY_MUTE'" + form);
    EXPECT_EQ(problemWith("tap:volume-up"), "'tap:volume-up'" + form);
    EXPECT_EQ(problemWith("tap=KEY_MUTE"), "'tap=KEY_MUTE'" + form);
    EXPECT_EQ(problemWith("tap=volume-up:KEY_MUTE"), "'tap=volume-up:KEY_MUTE'" + form);
}

TEST(KeyMap, ComplainsInOneReadableLine) {
    EXPECT_EQ(problemWith("a\nb\x1B[1m\x7F:volume-up=none"),
              "'a\\nb\\x1b[1m\\x7f' is not a gesture; gestures are tap, hold");
    EXPECT_EQ(problemWith("\xFF:volume-up=none"), "'\xEF\xBF\xBD' is not a gesture; gestures are tap, hold");
    std::string longAssignment(1000, 'x');
    longAssignment.append(":volume-up=none");
    EXPECT_EQ(problemWith(longAssignment),
              "'" + std::string(40, 'x') + "...' is not a gesture; gestures are tap, hold");
    EXPECT_EQ(problemWith(std::string("t\0p:volume-up=none", 17)),
              "'t\\x00p' is not a gesture; did you mean 'tap'?");
}

TEST(NamedKeys, HaveTheKernelsNumbers) {
#define ZORVA_KERNEL_KEY(name)                                                                               \
    { #name, name }
    const NamedKey kernel[] = {
        ZORVA_KERNEL_KEY(KEY_MUTE),
        ZORVA_KERNEL_KEY(KEY_VOLUMEDOWN),
        ZORVA_KERNEL_KEY(KEY_VOLUMEUP),
        ZORVA_KERNEL_KEY(KEY_PROG1),
        ZORVA_KERNEL_KEY(KEY_PROG2),
        ZORVA_KERNEL_KEY(KEY_COFFEE),
        ZORVA_KERNEL_KEY(KEY_BACK),
        ZORVA_KERNEL_KEY(KEY_FORWARD),
        ZORVA_KERNEL_KEY(KEY_NEXTSONG),
        ZORVA_KERNEL_KEY(KEY_PLAYPAUSE),
        ZORVA_KERNEL_KEY(KEY_PREVIOUSSONG),
        ZORVA_KERNEL_KEY(KEY_STOPCD),
        ZORVA_KERNEL_KEY(KEY_RECORD),
        ZORVA_KERNEL_KEY(KEY_REWIND),
        ZORVA_KERNEL_KEY(KEY_PHONE),
        ZORVA_KERNEL_KEY(KEY_F13),
        ZORVA_KERNEL_KEY(KEY_F14),
        ZORVA_KERNEL_KEY(KEY_F15),
        ZORVA_KERNEL_KEY(KEY_F16),
        ZORVA_KERNEL_KEY(KEY_F17),
        ZORVA_KERNEL_KEY(KEY_F18),
        ZORVA_KERNEL_KEY(KEY_F19),
        ZORVA_KERNEL_KEY(KEY_F20),
        ZORVA_KERNEL_KEY(KEY_F21),
        ZORVA_KERNEL_KEY(KEY_F22),
        ZORVA_KERNEL_KEY(KEY_F23),
        ZORVA_KERNEL_KEY(KEY_F24),
        ZORVA_KERNEL_KEY(KEY_PLAYCD),
        ZORVA_KERNEL_KEY(KEY_PAUSECD),
        ZORVA_KERNEL_KEY(KEY_PROG3),
        ZORVA_KERNEL_KEY(KEY_PROG4),
        ZORVA_KERNEL_KEY(KEY_PLAY),
        ZORVA_KERNEL_KEY(KEY_FASTFORWARD),
        ZORVA_KERNEL_KEY(KEY_CAMERA),
        ZORVA_KERNEL_KEY(KEY_BRIGHTNESSDOWN),
        ZORVA_KERNEL_KEY(KEY_BRIGHTNESSUP),
        ZORVA_KERNEL_KEY(KEY_MICMUTE),
        ZORVA_KERNEL_KEY(KEY_CHANNELUP),
        ZORVA_KERNEL_KEY(KEY_CHANNELDOWN),
        ZORVA_KERNEL_KEY(KEY_SHUFFLE),
        ZORVA_KERNEL_KEY(KEY_MEDIA_REPEAT),
        ZORVA_KERNEL_KEY(KEY_PICKUP_PHONE),
        ZORVA_KERNEL_KEY(KEY_HANGUP_PHONE),
        ZORVA_KERNEL_KEY(KEY_VOICECOMMAND),
        ZORVA_KERNEL_KEY(KEY_ASSISTANT),
        ZORVA_KERNEL_KEY(KEY_DICTATE),
    };
#undef ZORVA_KERNEL_KEY
    EXPECT_TRUE(std::ranges::equal(namedKeys(), kernel, [](const NamedKey &ours, const NamedKey &theirs) {
        return ours.name == theirs.name && ours.code == theirs.code;
    }));
    EXPECT_EQ(kKeyCodeCount, std::size_t{KEY_CNT});
}

TEST(NamedKeys, AreInTheOrderOfTheirCodes) {
    EXPECT_TRUE(std::ranges::is_sorted(namedKeys(), std::ranges::less_equal(), &NamedKey::code));
}

TEST(NamedKeys, AreFoundByNameAndByCode) {
    EXPECT_EQ(keyNamed("KEY_F24"), 194);
    EXPECT_EQ(keyNamed("none"), kNoKey);
    EXPECT_EQ(keyNamed("KEY_A"), std::nullopt);
    EXPECT_EQ(keyNamed(""), std::nullopt);
    EXPECT_EQ(nameOfKey(194), "KEY_F24");
    EXPECT_EQ(nameOfKey(kNoKey), "none");
    EXPECT_EQ(nameOfKey(KEY_A), "");
    EXPECT_EQ(nameOfKey(0xFFFF), "");
}

} // namespace
} // namespace ZorvaTouch::Tools
