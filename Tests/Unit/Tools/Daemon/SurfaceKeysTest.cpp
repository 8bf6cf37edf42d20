#include "Tools/Daemon/SurfaceKeys.h"

#include "Plugin/EventObject.h"
#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using Tests::gestureEvent;

class SurfaceKeysTest : public testing::Test {
protected:
    /// An event comes from the plug-in.
    void receive(std::shared_ptr<HostEvent> event) {
        const auto object = makeEvent(std::move(event));
        SurfaceKeys::receive(&surface, nullptr, nullptr, object.get(), 0);
    }
    void receive(Gesture gesture, PixelRegion region = kPixelRegionVolumeUp) {
        receive(gestureEvent(gesture, region));
    }

    Tests::JournalOfLogs logs;
    Tests::ListenerJournal told;
    Tests::FakeKeyboards keys;
    Keyboard keyboard{keys.maker(), told, DaemonLog(logs, "Keys")};
    SurfaceKeys surface{{.id = "SN1", .node = "/dev/hidraw0", .name = ""}, KeyMap(), keyboard, told};
};

TEST_F(SurfaceKeysTest, ATapIsToldBeforeTheKeyThatItPresses) {
    receive(Gesture::MayBegin);
    receive(Gesture::Tap);
    EXPECT_THAT(told.events.lines(), ElementsAre("SN1 may-begin volume-up", "SN1 tap volume-up"));
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +115 by tap", "SN1 -115 by tap"));
}

TEST_F(SurfaceKeysTest, AHoldKeepsItsKeyDownAndMovesIt) {
    receive(Gesture::MayBegin);
    receive(Gesture::HoldStart);
    receive(Gesture::HoldChange, kPixelRegionPlayPause);
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVoiceCommand));
    receive(Gesture::HoldEnd, kPixelRegionPlayPause);
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 +582", "1 -582"));
}

TEST_F(SurfaceKeysTest, IsIdleWhileNoTouchMayDoAnything) {
    EXPECT_TRUE(surface.isIdle());
    receive(Gesture::MayBegin);
    EXPECT_FALSE(surface.isIdle());
    receive(Gesture::HoldStart);
    EXPECT_FALSE(surface.isIdle());
    receive(Gesture::HoldEnd);
    EXPECT_TRUE(surface.isIdle());
    receive(Gesture::MayBegin);
    receive(Gesture::Cancel, kPixelRegionNone);
    EXPECT_TRUE(surface.isIdle());
}

TEST_F(SurfaceKeysTest, AnEndReleasesWithoutAnEvent) {
    receive(Gesture::MayBegin);
    receive(Gesture::HoldStart);
    surface.end(SurfaceEnd::DeviceGone);
    EXPECT_TRUE(surface.isIdle());
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +115 by hold-start", "SN1 -115"));
}

TEST_F(SurfaceKeysTest, NothingComesOfWhatArrivesAfterAnEndForGood) {
    receive(Gesture::MayBegin);
    surface.end(SurfaceEnd::Unscheduled);
    receive(Gesture::HoldStart);
    receive(Gesture::MayBegin);
    receive(Gesture::Tap);
    surface.end(SurfaceEnd::Stopped);
    EXPECT_THAT(told.keys.lines(), IsEmpty());
    EXPECT_TRUE(surface.isIdle());
}

TEST_F(SurfaceKeysTest, AfterSleepTheNextTouchCounts) {
    receive(Gesture::MayBegin);
    surface.end(SurfaceEnd::Suspended);
    receive(Gesture::Tap);
    EXPECT_THAT(told.keys.lines(), IsEmpty());
    receive(Gesture::MayBegin);
    receive(Gesture::Tap);
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +115 by tap", "SN1 -115 by tap"));
}

TEST_F(SurfaceKeysTest, TooManyPressesPerSecondStopKeysButNotEvents) {
    SurfaceKeys limited({.id = "SN2", .node = "", .name = ""}, KeyMap(), keyboard, told, {},
                        {.pressesPerSecond = 2, .ticks = Util::TickConverter({1000, 1})}); // ticks of 1 us
    const auto tapAt = [&](std::uint64_t us) {
        for (const Gesture gesture : {Gesture::MayBegin, Gesture::Tap}) {
            const auto object = makeEvent(gestureEvent(gesture, kPixelRegionVolumeUp, us));
            SurfaceKeys::receive(&limited, nullptr, nullptr, object.get(), 0);
        }
    };
    for (std::uint64_t tap = 0; tap < 100; ++tap)
        tapAt(tap * 1000);
    EXPECT_THAT(told.events.lines(), SizeIs(200));
    EXPECT_THAT(told.keys.take(), SizeIs(4));
    EXPECT_THAT(told.others.take(), ElementsAre("quarantine of SN2 begins 1"));
    tapAt(2'099'000); // 2 s after the last one
    EXPECT_THAT(told.others.take(), ElementsAre("quarantine of SN2 ends 98"));
    EXPECT_THAT(told.keys.take(), ElementsAre("SN2 +115 by tap", "SN2 -115 by tap"));
    for (int tap = 0; tap < 2; ++tap)
        tapAt(2'100'000);
    limited.end(SurfaceEnd::Suspended);
    EXPECT_THAT(told.others.take(), ElementsAre("quarantine of SN2 begins 1"));
    limited.end(SurfaceEnd::DeviceGone);
    limited.end(SurfaceEnd::Stopped);
    EXPECT_THAT(told.others.take(), ElementsAre("quarantine of SN2 ends 1"));
}

TEST_F(SurfaceKeysTest, APressThatIsSuppressedDoesNotReleaseTheKeyOfAnotherSurface) {
    SurfaceKeys limited({.id = "SN2", .node = "", .name = ""}, KeyMap(), keyboard, told, {},
                        {.pressesPerSecond = 1});
    receive(Gesture::MayBegin);
    receive(Gesture::HoldStart);
    for (const Gesture gesture : {Gesture::MayBegin, Gesture::Tap, Gesture::MayBegin, Gesture::Tap}) {
        const auto object = makeEvent(gestureEvent(gesture, kPixelRegionVolumeUp));
        SurfaceKeys::receive(&limited, nullptr, nullptr, object.get(), 0);
    }
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    surface.end(SurfaceEnd::Stopped);
    limited.end(SurfaceEnd::Stopped);
}

TEST_F(SurfaceKeysTest, AnEventThatIsNoneChangesNothing) {
    receive(Gesture::MayBegin);
    receive(Gesture::HoldStart);
    SurfaceKeys::receive(&surface, nullptr, nullptr, nullptr, 0);
    receive(HostEvent::createAccelerometer(0, {}, 0));
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    surface.end(SurfaceEnd::Stopped);
}

} // namespace
} // namespace ZorvaTouch::Tools
