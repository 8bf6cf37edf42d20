#include "Tools/Daemon/EventLines.h"

#include "Host/Runtime/Files.h"
#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"

#include <gtest/gtest.h>

#include <limits>
#include <string>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::string_view kSurface = "SER0001";

SurfaceNews surfaceNews(SurfaceState state, std::string_view reason, std::uint64_t timeNs) {
    return {.state = state,
            .surface = kSurface,
            .node = "/dev/hidraw0",
            .name = "Touch Surface",
            .reason = reason,
            .timeNs = timeNs};
}

TEST(EventLines, TellOfSurfaces) {
    EXPECT_EQ(lineOf(surfaceNews(SurfaceState::Added, {}, 1)),
              R"({"type":"surface","state":"added","surface":"SER0001","node":"/dev/hidraw0",)"
              R"("name":"Touch Surface","timeNs":1})"
              "\n");
    EXPECT_EQ(lineOf(surfaceNews(SurfaceState::Failed, "open: Permission denied", 2)),
              R"({"type":"surface","state":"failed","surface":"SER0001","node":"/dev/hidraw0",)"
              R"("name":"Touch Surface","reason":"open: Permission denied","timeNs":2})"
              "\n");
}

TEST(EventLines, OnlyFailuresAndLossesHaveAReason) {
    const auto hasReason = [](SurfaceState state, std::string_view reason) {
        return lineOf(surfaceNews(state, reason, 1)).find("\"reason\"") != std::string::npos;
    };
    EXPECT_TRUE(hasReason(SurfaceState::Failed, ""));
    EXPECT_TRUE(hasReason(SurfaceState::Lost, ""));
    EXPECT_FALSE(hasReason(SurfaceState::Added, "x"));
    EXPECT_FALSE(hasReason(SurfaceState::Opened, "x"));
    EXPECT_FALSE(hasReason(SurfaceState::Removed, "x"));
}

TEST(EventLines, TellOfGestures) {
    EXPECT_EQ(lineOf(GestureNews{"a", Gesture::Tap, kPixelRegionVolumeUp, 3}),
              R"({"type":"gesture","surface":"a","gesture":"tap","region":"volume-up","timeNs":3})"
              "\n");
    EXPECT_EQ(lineOf(GestureNews{"a", Gesture::Cancel, kPixelRegionNone, 4}),
              R"({"type":"gesture","surface":"a","gesture":"cancel","region":null,"timeNs":4})"
              "\n");
}

TEST(EventLines, TellOfKeys) {
    EXPECT_EQ(lineOf(KeyNews{{kKeyVolumeUp, true}, true, "a", 5}),
              R"({"type":"key","key":"KEY_VOLUMEUP","code":115,"state":"down","sent":true,)"
              R"("surface":"a","timeNs":5})"
              "\n");
    EXPECT_EQ(lineOf(KeyNews{{kKeyVolumeUp, false}, false, "a", 6}),
              R"({"type":"key","key":"KEY_VOLUMEUP","code":115,"state":"up","sent":false,)"
              R"("surface":"a","timeNs":6})"
              "\n");
}

TEST(EventLines, AKeyWithoutANameHasItsCode) {
    EXPECT_EQ(lineOf(KeyNews{{30, true}, true, "a", 7}),
              R"({"type":"key","key":null,"code":30,"state":"down","sent":true,"surface":"a","timeNs":7})"
              "\n");
}

TEST(EventLines, TellOfTheRest) {
    EXPECT_EQ(lineOf(AccelerometerNews{true, "accel_3d", 8}),
              "{\"type\":\"accelerometer\",\"state\":\"used\",\"name\":\"accel_3d\",\"timeNs\":8}\n");
    EXPECT_EQ(lineOf(AccelerometerNews{false, "accel_3d", 9}),
              "{\"type\":\"accelerometer\",\"state\":\"gone\",\"name\":\"accel_3d\",\"timeNs\":9}\n");
    EXPECT_EQ(lineOf(SleepNews{true, 10}), "{\"type\":\"sleep\",\"state\":\"begins\",\"timeNs\":10}\n");
    EXPECT_EQ(lineOf(SleepNews{false, 11}), "{\"type\":\"sleep\",\"state\":\"ends\",\"timeNs\":11}\n");
    EXPECT_EQ(lineOf(RecordingNews{"touch.json", "a", 400, 12}),
              R"({"type":"recording","file":"touch.json","surface":"a","reports":400,"timeNs":12})"
              "\n");
    EXPECT_EQ(lineOf(DroppedNews{3}), "{\"type\":\"dropped\",\"lines\":3}\n");
}

TEST(EventLines, AreAppended) {
    std::string text = "before\n";
    appendLine(text, DroppedNews{1});
    EXPECT_EQ(text, "before\n{\"type\":\"dropped\",\"lines\":1}\n");
}

TEST(EventLines, TellTheLongestTimes) {
    EXPECT_EQ(lineOf(SleepNews{true, std::numeric_limits<std::uint64_t>::max()}),
              "{\"type\":\"sleep\",\"state\":\"begins\",\"timeNs\":18446744073709551615}\n");
}

TEST(EventLines, WhateverADeviceIsCalledIsOneLineOfJson) {
    for (int byte = 0; byte < 256; ++byte) {
        const std::string odd = std::string("\"\\\n\x80", 4) + static_cast<char>(byte);
        const std::string line = lineOf(SurfaceNews{SurfaceState::Failed, odd, odd, odd, odd, 1});
        EXPECT_EQ(line.find('\n'), line.size() - 1) << byte;
        EXPECT_TRUE(Util::isValidUtf8(line)) << byte;
        EXPECT_TRUE(Util::parseJson(line)) << byte;
    }
    EXPECT_EQ(
        lineOf(AccelerometerNews{true, "a\xFF\"\n", 1}),
        "{\"type\":\"accelerometer\",\"state\":\"used\",\"name\":\"a\xEF\xBF\xBD\\\"\\n\",\"timeNs\":1}\n");
}

/// A line of each kind, in the order of the file that the schema is checked with.
std::string oneOfEach() {
    const SurfaceNews odd{.state = SurfaceState::Lost,
                          .surface = "1-2/input0",
                          .node = "sim:day",
                          .name = "\"\x01\xFF\xC3\xA9",
                          .reason = "read: Input/output error",
                          .timeNs = 5000};
    std::string text;
    appendLine(text, surfaceNews(SurfaceState::Added, {}, 1000));
    appendLine(text, surfaceNews(SurfaceState::Opened, {}, 2000));
    appendLine(text, surfaceNews(SurfaceState::Failed, "open: Permission denied", 3000));
    appendLine(text, surfaceNews(SurfaceState::Removed, {}, 4000));
    appendLine(text, odd);
    for (const Gesture gesture : kGestures)
        appendLine(text, GestureNews{kSurface, gesture, kPixelRegionNone, 6000});
    for (const auto region : {kPixelRegionPlayPause, kPixelRegionVolumeDown, kPixelRegionVolumeUp})
        appendLine(text, GestureNews{kSurface, Gesture::Tap, region, 7000});
    appendLine(text, KeyNews{{kKeyVolumeUp, true}, true, kSurface, 8000});
    appendLine(text, KeyNews{{kKeyVolumeUp, false}, true, kSurface, 9000});
    appendLine(text, KeyNews{{30, false}, false, kSurface, 10000});
    appendLine(text, QuarantineNews{true, kSurface, 1, 10100});
    appendLine(text, QuarantineNews{false, kSurface, 2100, 10200});
    appendLine(text, AccelerometerNews{true, "accel_3d", 11000});
    appendLine(text, AccelerometerNews{false, "accel_3d", 12000});
    appendLine(text, SleepNews{true, 13000});
    appendLine(text, SleepNews{false, 14000});
    appendLine(text,
               RecordingNews{"touch-2.json", kSurface, 8700, std::numeric_limits<std::uint64_t>::max()});
    appendLine(text, DroppedNews{17});
    return text;
}

TEST(EventLines, AreTheOnesThatTheSchemaIsCheckedWith) {
    EXPECT_EQ(oneOfEach(), Host::readFile(ZORVA_TEST_DIR "/Schema/Events.jsonl"));
}

} // namespace
} // namespace ZorvaTouch::Tools
