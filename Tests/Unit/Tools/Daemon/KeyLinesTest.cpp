#include "Tools/Daemon/KeyLines.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Tools {
namespace {

ShownKey tapDown() {
    return {.timeNs = 1'234'567'890,
            .region = kPixelRegionVolumeUp,
            .gesture = Gesture::Tap,
            .change = {kKeyVolumeUp, true},
            .surface = {}};
}

TEST(KeyLines, StandInColumns) {
    ShownKey up = tapDown();
    up.change.isPressed = false;
    const ShownKey hold{.timeNs = 12'001'000'000,
                        .region = kPixelRegionPlayPause,
                        .gesture = Gesture::HoldStart,
                        .change = {kKeyVoiceCommand, true},
                        .surface = {}};
    EXPECT_EQ(keyHeading(false) + keyLine(tapDown(), false) + keyLine(up, false) + keyLine(hold, false),
              "       time  region       gesture          key                 is\n"
              "    1.234 s  volume up    tap              KEY_VOLUMEUP        down\n"
              "    1.234 s  volume up    tap              KEY_VOLUMEUP        up\n"
              "   12.001 s  play/pause   hold             KEY_VOICECOMMAND    down\n");
}

TEST(KeyLines, TellTheSurfaceWhereThereAreSeveral) {
    ShownKey shown = tapDown();
    shown.surface = "SER0001";
    EXPECT_EQ(keyLine(shown, false),
              "    1.234 s  volume up    tap              KEY_VOLUMEUP        down  SER0001\n");
    shown.change.isPressed = false;
    EXPECT_EQ(keyLine(shown, false),
              "    1.234 s  volume up    tap              KEY_VOLUMEUP        up    SER0001\n");
}

TEST(KeyLines, ReleasesWithoutAGestureLeaveItBlank) {
    ShownKey shown{
        .timeNs = 5, .region = kPixelRegionNone, .gesture = {}, .change = {30, false}, .surface = {}};
    EXPECT_EQ(keyLine(shown, false), "    0.000 s                                key 30              up\n");
}

TEST(KeyLines, AreColouredOnlyWhenWanted) {
    EXPECT_EQ(keyLine(tapDown(), true), "    1.234 s  volume up    \x1b[32mtap              \x1b[0m"
                                        "KEY_VOLUMEUP        \x1b[1mdown\x1b[0m\n");
    EXPECT_EQ(keyHeading(true),
              "\x1b[2m       time  region       gesture          key                 is\x1b[0m\n");
}

TEST(KeyLines, WhatADeviceIsCalledDoesNothingToATerminal) {
    ShownKey shown = tapDown();
    shown.surface = "a\x1b[2J\n\x7F\xFF";
    EXPECT_EQ(keyLine(shown, false), "    1.234 s  volume up    tap              KEY_VOLUMEUP        down  "
                                     "a\\x1b[2J\\n\\x7f\xEF\xBF\xBD\n");
}

TEST(KeyLines, CountWhatIsLost) {
    EXPECT_EQ(droppedKeyLine(1), "             (1 line not shown)\n");
    EXPECT_EQ(droppedKeyLine(2), "             (2 lines not shown)\n");
}

} // namespace
} // namespace ZorvaTouch::Tools
