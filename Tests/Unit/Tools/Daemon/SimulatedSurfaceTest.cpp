#include "Tools/Daemon/SimulatedSurface.h"

#include "Host/Simulated/Player.h"
#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <gmock/gmock.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using Tests::TouchScript;

/// A touch of this scenario, so long.
SimulatedFinger finger(const char *scenario, double seconds) {
    SimulatedFinger finger = fingerOf(*Synth::scenarioNamed(scenario));
    finger.seconds = seconds;
    return finger;
}

/// The process's own clock: a finger plays at the pace of life.
class SimulatedSurfaceTest : public testing::Test {
protected:
    Tests::JournalOfLogs logs;
    Linux::MainLoop loop;
    int finished = 0;
};

TEST_F(SimulatedSurfaceTest, IsCalledByItsScenarioAndHasOneDevice) {
    const SimulatedSurface surface(finger("taps", 0.1), false, loop, [] {});
    EXPECT_EQ(surface.name().id, "sim:taps");
    EXPECT_EQ(surface.name().node, "sim:taps");
    EXPECT_EQ(surface.maker()(nullptr).get(), surface.maker()(nullptr).get());
}

TEST_F(SimulatedSurfaceTest, SaysOnTheMainLoopWhenAllHasBeenPlayed) {
    SimulatedSurface surface(finger("taps", 0.1), false, loop, [this] {
        ++finished;
        loop.quit();
    });
    surface.play();
    loop.run();
    EXPECT_EQ(finished, 1);
}

TEST_F(SimulatedSurfaceTest, ItsObserverIsNotifiedOfEachReport) {
    struct Counter final : Linux::HidrawObserver {
        void onGone(const Linux::SystemFailure &) noexcept override {}
        void onFailure(const Linux::SystemFailure &) noexcept override {}
        void onReport(std::uint64_t, std::span<const std::uint8_t> report) noexcept override {
            reports += report.size() == 73 ? 1 : 0;
        }
        std::atomic<int> reports = 0;
    };
    const auto counter = std::make_shared<Counter>();
    SimulatedSurface surface(finger("taps", 0.1), {}, loop, [this] { loop.quit(); });
    static_cast<void>(surface.maker()(counter));
    surface.play();
    loop.run();
    EXPECT_EQ(counter->reports, 9) << "at 10 to 90 ms";
}

TEST_F(SimulatedSurfaceTest, OneThatIsGoneSaysNothing) {
    {
        SimulatedSurface surface(finger("idle", 36000), false, loop, [this] { ++finished; });
        surface.play();
    }
    loop.post([this] { loop.quit(); });
    loop.run();
    EXPECT_EQ(finished, 0);
}

TEST_F(SimulatedSurfaceTest, HasAnEventSystemOfItsOwnForItsAccelerometer) {
    const SimulatedSurface first(finger("taps", 0.1), true, loop, [] {});
    const SimulatedSurface second(finger("taps", 0.1), true, loop, [] {});
    EXPECT_NE(first.events(), nullptr);
    EXPECT_NE(first.events(), second.events());
    EXPECT_EQ(SimulatedSurface(finger("taps", 0.1), false, loop, [] {}).events(), nullptr);
}

/// A simulated device among the surfaces, in lock-step with a clock that stands still in between.
class PlayedSurfaceTest : public Tests::SurfacesFixture {
protected:
    void SetUp() override {
        surfaces->add(
            {.id = "sim", .node = "sim", .name = ""},
            [this](const std::shared_ptr<Linux::HidrawObserver> &) { return Ref<ZorvaDevice>(device); },
            keyboard);
        platform.waitUntilServing();
    }

    void play(Simulated::FrameSource frames) {
        Simulated::Player player(std::move(frames), {.device = device,
                                                     .accelerometer = {},
                                                     .onReport = nullptr,
                                                     .onMetadata = nullptr,
                                                     .onState = nullptr});
        player.playAll(clock);
        keyQueue.drain();
    }
    /// Reports 10 ms apart.
    void play(const std::vector<Linux::Tests::Bytes> &reports) {
        FrameList frames;
        std::uint64_t timeNs = 0;
        for (const auto &report : reports)
            frames.appendReport(timeNs += 10'000'000, report);
        play(Simulated::framesOf(std::move(frames)));
    }

    const Ref<Simulated::Device> device = Simulated::Device::create();
    TouchScript touch;
};

TEST_F(PlayedSurfaceTest, PressesForEachGestureOnce) {
    play(touch.tapPlay());
    play(touch.holdLouder());
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    play(touch.letGo());
    play(touch.holdPlay());
    play(touch.letGo());
    EXPECT_THAT(told.keys.lines(),
                ElementsAre("sim +164 by tap", "sim -164 by tap", "sim +115 by hold-start",
                            "sim -115 by hold-end", "sim +582 by hold-start", "sim -582 by hold-end"));
}

class Scenarios : public PlayedSurfaceTest, public testing::WithParamInterface<const char *> {};

TEST_P(Scenarios, EveryPressHasItsReleaseAndATouchActsOnce) {
    play(framesOf(finger(GetParam(), 20)));
    surfaces->closeAll();
    int pressed = 0;
    for (const std::string &line : told.keys.lines()) {
        pressed += line.find('+') != std::string::npos ? 1 : -1;
        EXPECT_GE(pressed, 0) << line;
        EXPECT_LE(pressed, 1) << line;
    }
    EXPECT_EQ(pressed, 0);
    // A hold that moves presses again, and is the only touch that does.
    EXPECT_LE(told.keys.count("+") - told.keys.count("by hold-change") / 2, told.events.count("may-begin"));
}

INSTANTIATE_TEST_SUITE_P(Synth, Scenarios,
                         testing::Values("idle", "taps", "double-taps", "holds", "slides", "palms", "thumbs",
                                         "grazes", "water", "link-faults", "resets", "day"),
                         [](const auto &tested) {
                             std::string name = tested.param;
                             std::erase(name, '-');
                             return name;
                         });

} // namespace
} // namespace ZorvaTouch::Tools
