#include "Tools/Daemon/Listeners.h"

#include "Host/Simulated/VirtualClock.h"
#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using Tests::gestureEvent;

/// Takes everything.
class Text final : public Host::TextWriter {
public:
    [[nodiscard]] int write(std::string_view text) noexcept override {
        all.append(text);
        return 0;
    }
    void giveUp() noexcept override {}
    std::string all;
};

class ListenersTest : public testing::Test {
protected:
    /// What was put out, once it is all there. No listener may put out any more.
    const std::string &text() {
        stream.finish();
        return output->all;
    }

    const SurfaceName surface{.id = "SN1", .node = "/dev/hidraw1", .name = "Touch"};
    Tests::JournalOfLogs logs;
    Simulated::VirtualClock clock{1000, {125, 3}}; // 41666 ns
    const std::shared_ptr<Text> output = std::make_shared<Text>();
    Host::AsyncWriter stream{"zorva-print", output, [](std::uint64_t) { return std::string(); }, {}};
};

TEST_F(ListenersTest, ProgramsHearOfEverythingAsLinesOfJson) {
    JsonListener json(stream, clock);
    json.onSurface(surface, SurfaceState::Added, {});
    json.onSurface(surface, SurfaceState::Failed, "open: Permission denied");
    json.onEvent(surface, *gestureEvent(Gesture::HoldStart, kPixelRegionVolumeUp, 24));
    json.onKey(surface, nullptr, {kKeyVolumeUp, true}, false);
    json.onQuarantine(surface, true, 1);
    json.onAccelerometer("accel_3d", true);
    json.onSleep(true);
    json.onRecording(surface, "/tmp/a.json", 7);
    EXPECT_EQ(
        text(),
        R"({"type":"surface","state":"added","surface":"SN1","node":"/dev/hidraw1","name":"Touch",)"
        R"("timeNs":41666})"
        "\n"
        R"({"type":"surface","state":"failed","surface":"SN1","node":"/dev/hidraw1","name":"Touch",)"
        R"("reason":"open: Permission denied","timeNs":41666})"
        "\n"
        R"({"type":"gesture","surface":"SN1","gesture":"hold-start","region":"volume-up","timeNs":1000})"
        "\n"
        R"({"type":"key","key":"KEY_VOLUMEUP","code":115,"state":"down","sent":false,"surface":"SN1",)"
        R"("timeNs":41666})"
        "\n"
        R"({"type":"quarantine","state":"begins","surface":"SN1","suppressed":1,"timeNs":41666})"
        "\n"
        R"({"type":"accelerometer","state":"used","name":"accel_3d","timeNs":41666})"
        "\n"
        R"({"type":"sleep","state":"begins","timeNs":41666})"
        "\n"
        R"({"type":"recording","file":"/tmp/a.json","surface":"SN1","reports":7,"timeNs":41666})"
        "\n");
}

TEST_F(ListenersTest, ProgramsHearOfNoEventThatIsNoGesture) {
    JsonListener json(stream, clock);
    json.onEvent(surface, *HostEvent::createAccelerometer(24, {}, 0));
    EXPECT_EQ(text(), "");
}

TEST_F(ListenersTest, PeopleSeeTheKeysThatAreNotPressed) {
    ScreenListener screen(stream, clock, false, false);
    clock.advanceTicks(24'000'000); // a second
    const auto tap = gestureEvent(Gesture::Tap, kPixelRegionPlayPause);
    screen.onKey(surface, tap.get(), {kKeyPlayPause, true}, false);
    screen.onKey(surface, tap.get(), {kKeyPlayPause, false}, true); // this one was
    screen.onKey(surface, nullptr, {kKeyVolumeUp, false}, false);
    EXPECT_EQ(text(), "       time  region       gesture          key                 is\n"
                      "    1.000 s  play/pause   tap              KEY_PLAYPAUSE       down\n"
                      "    1.000 s                                KEY_VOLUMEUP        up\n");
}

TEST_F(ListenersTest, PeopleSeeNothingElse) {
    ScreenListener screen(stream, clock, true, true);
    screen.onSurface(surface, SurfaceState::Failed, "open: Permission denied");
    screen.onEvent(surface, *gestureEvent(Gesture::Tap, kPixelRegionPlayPause));
    screen.onKey(surface, nullptr, {kKeyVolumeUp, true}, true);
    screen.onAccelerometer("a", true);
    screen.onSleep(true);
    screen.onRecording(surface, "a", 1);
    EXPECT_EQ(text(), "");
}

TEST_F(ListenersTest, PeopleSeeWhichSurfaceWhereThereAreSeveral) {
    ScreenListener screen(stream, clock, false, true);
    screen.onKey(surface, nullptr, {kKeyVolumeUp, true}, false);
    EXPECT_EQ(text(), "       time  region       gesture          key                 is\n"
                      "    0.000 s                                KEY_VOLUMEUP        down  SN1\n");
}

TEST_F(ListenersTest, TheLogHearsOfWhatComesAndGoesAndFails) {
    LogListener log(DaemonLog(logs, "Surfaces"));
    log.onSurface(surface, SurfaceState::Added, {});
    log.onSurface(surface, SurfaceState::Opened, {});
    log.onSurface(surface, SurfaceState::Failed, "open: Permission denied");
    log.onSurface(surface, SurfaceState::Removed, {});
    log.onAccelerometer("accel_3d", true);
    log.onAccelerometer("accel_3d", false);
    log.onSleep(true);
    log.onSleep(false);
    log.onRecording(surface, "/tmp/a.json", 7);
    EXPECT_THAT(logs.lines().lines(),
                ElementsAre("Surfaces: /dev/hidraw1: gestures work (SN1)",
                            "Surfaces error: /dev/hidraw1: open: Permission denied",
                            "Surfaces: /dev/hidraw1: removed (SN1)",
                            "Surfaces: the machine goes to sleep: every key is up",
                            "Surfaces: the machine is awake",
                            "Surfaces: /dev/hidraw1: recording saved to /tmp/a.json, 7 reports"));
}

TEST_F(ListenersTest, TheLogHasTheBeginningAndTheEndOfAQuarantine) {
    LogListener log(DaemonLog(logs, "Surfaces"));
    log.onQuarantine(surface, true, 1);
    log.onQuarantine(surface, false, 2100);
    EXPECT_THAT(
        logs.lines().lines(),
        ElementsAre("Surfaces error: /dev/hidraw1: more key presses per second than --key-limit allows; "
                    "its keys are not pressed until it has been quiet for 2 s",
                    "Surfaces: /dev/hidraw1: its keys are pressed again; 2100 presses were suppressed"));
}

TEST_F(ListenersTest, TheLogHearsOfNoGestureAndNoKey) {
    LogListener log(DaemonLog(logs, "Surfaces"));
    log.onEvent(surface, *gestureEvent(Gesture::Tap, kPixelRegionPlayPause));
    log.onKey(surface, nullptr, {kKeyVolumeUp, true}, true);
    EXPECT_THAT(logs.lines().lines(), IsEmpty());
}

TEST_F(ListenersTest, AGroupTellsEach) {
    auto first = std::make_unique<Tests::ListenerJournal>();
    auto second = std::make_unique<Tests::ListenerJournal>();
    Tests::ListenerJournal *const heard[] = {first.get(), second.get()};
    std::vector<std::unique_ptr<DaemonListener>> members;
    members.push_back(std::move(first));
    members.push_back(std::move(second));
    ListenerGroup group(std::move(members));
    const auto tap = gestureEvent(Gesture::Tap, kPixelRegionPlayPause);
    group.onSurface(surface, SurfaceState::Failed, "x");
    group.onEvent(surface, *tap);
    group.onKey(surface, tap.get(), {kKeyPlayPause, true}, true);
    group.onQuarantine(surface, true, 1);
    group.onAccelerometer("a", true);
    group.onSleep(false);
    group.onRecording(surface, "f", 1);
    for (const Tests::ListenerJournal *const each : heard) {
        EXPECT_THAT(each->surfaces.lines(), ElementsAre("failed SN1: x"));
        EXPECT_THAT(each->events.lines(), ElementsAre("SN1 tap play/pause"));
        EXPECT_THAT(each->keys.lines(), ElementsAre("SN1 +164 by tap"));
        EXPECT_THAT(each->others.lines(), ElementsAre("quarantine of SN1 begins 1", "accelerometer a used",
                                                      "awake", "recording SN1 f 1"));
    }
}

TEST_F(ListenersTest, TheLogHasAFailureOnceUntilItChanges) {
    LogListener log{DaemonLog(logs, "Surfaces")};
    const SurfaceName other{.id = "SN2", .node = "/dev/hidraw2", .name = "Touch"};
    const std::string denied = "Surfaces error: /dev/hidraw1: open: Permission denied";
    for (int i = 0; i < 3; ++i)
        log.onSurface(surface, SurfaceState::Failed, "open: Permission denied");
    EXPECT_EQ(logs.lines().count(denied), 1u);
    log.onSurface(other, SurfaceState::Failed, "open: Permission denied");
    EXPECT_EQ(logs.lines().count("Surfaces error: /dev/hidraw2: open: Permission denied"), 1u);
    log.onSurface(surface, SurfaceState::Failed, "open: No such file or directory");
    EXPECT_EQ(logs.lines().count("Surfaces error: /dev/hidraw1: open: No such file or directory"), 1u);
    log.onSurface(surface, SurfaceState::Opened, {});
    log.onSurface(surface, SurfaceState::Failed, "open: Permission denied");
    EXPECT_EQ(logs.lines().count(denied), 2u);
    log.onSurface(surface, SurfaceState::Removed, {});
    log.onSurface(surface, SurfaceState::Failed, "open: Permission denied");
    EXPECT_EQ(logs.lines().count(denied), 3u);
}

} // namespace
} // namespace ZorvaTouch::Tools
