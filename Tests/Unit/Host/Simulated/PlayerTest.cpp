#include "Host/Simulated/Player.h"

#include "Host/Runtime/SteadyClock.h"
#include "Tests/Unit/Host/Simulated/LoopThread.h"
#include "Tests/Unit/Host/Simulated/ReportLog.h"

#include <gtest/gtest.h>

#include <limits>
#include <stdexcept>
#include <string>
#include <system_error>

namespace ZorvaTouch::Simulated {
namespace {

using Host::Accelerometer;
using Host::EventSystem;

using Texts = std::vector<std::string>;

constexpr double kAtOnce = std::numeric_limits<double>::infinity();
constexpr std::uint64_t kMillisecond = 1'000'000;
constexpr std::uint64_t kHour = 3'600'000 * kMillisecond;

Frame reportFrame(std::uint64_t timeNs, std::uint8_t id) {
    return {FrameType::InputReport, timeNs, "", {}, {id}};
}
Frame metadataFrame(std::uint64_t timeNs, const char *key, PropertyValue value) {
    return {FrameType::Metadata, timeNs, key, std::move(value), {}};
}
Frame stateFrame(std::uint64_t timeNs, const char *key) { return {FrameType::State, timeNs, key, 1u, {}}; }

FrameSource sourceOf(const std::vector<Frame> &frames) {
    FrameList list;
    for (const Frame &frame : frames)
        list.append(frame);
    return framesOf(std::move(list));
}

class PlayerFixture : public testing::Test {
protected:
    PlayerOutput output() {
        PlayerOutput output;
        output.device = device;
        output.accelerometer = accelerometer;
        output.onReport = [this](const Frame &frame) { note("report", frame); };
        output.onMetadata = [this](const Frame &frame) { note("metadata " + frame.key, frame); };
        output.onState = [this](const Frame &frame) { note("state " + frame.key, frame); };
        return output;
    }
    void note(const std::string &what, const Frame &frame) {
        notes.push_back(std::to_string(frame.timestampNs) + " " + what);
        if (onNote)
            onNote();
    }

    Ref<Device> device = Device::create();
    std::shared_ptr<EventSystem> system = EventSystem::create();
    Ref<Accelerometer> accelerometer = Accelerometer::create(system);
    Texts notes;
    std::function<void()> onNote;
};

// --- In lock-step --------------------------------------------------------------------------------

class LockStep : public PlayerFixture {
protected:
    static void hear(void *context, const ZorvaEvent *event) noexcept {
        auto &self = *static_cast<LockStep *>(context);
        self.notes.push_back("heard at " + std::to_string(event->table->timestamp(event)));
    }
    void begin(ZorvaRunLoop *loop) {
        log.begin(*device.get(), loop);
        client->table->registerCallback(client.get(), hear, this);
        client->table->schedule(client.get(), loop, "mode");
    }
    void end(ZorvaRunLoop *loop) {
        client->table->unschedule(client.get(), loop, "mode");
        log.end(*device.get(), loop);
    }

    VirtualClock clock{0, {125, 3}};
    ReportLog log;
    Ref<ZorvaEventClient> client = system->createClient();
};

TEST_F(LockStep, EveryFrameIsHandledAtItsTimeBeforeTheNextOne) {
    log.onReport = [this] {
        notes.push_back("handled at " + std::to_string(log.reports.back().timestamp) + ", now " +
                        std::to_string(clock.nowTicks()));
    };
    const PropertyValue sample = PropertyValue::Dictionary{{"X", 0.5}, {"Y", 0.0}, {"Z", -1.0}};
    {
        LoopThread thread([this](ZorvaRunLoop *loop) { begin(loop); },
                          [this](ZorvaRunLoop *loop) { end(loop); });
        Player player(
            sourceOf({stateFrame(125, "Algs.X"), reportFrame(1250, 1), metadataFrame(2500, "Accel", sample),
                      metadataFrame(3750, "Label", "tap"), reportFrame(kHour * 24, 2)}),
            output());
        player.playAll(clock);
    }
    EXPECT_EQ(notes, (Texts{"125 state Algs.X", "handled at 30, now 30", "1250 report", "heard at 60",
                            "3750 metadata Label", "handled at 2073600000000, now 2073600000000",
                            "86400000000000 report"}));
}

TEST_F(LockStep, AThousandReportsFitThroughAShortQueue) {
    std::vector<Frame> frames;
    for (std::uint64_t i = 0; i < 1000; ++i)
        frames.push_back(reportFrame(i * 10 * kMillisecond, 1));
    {
        LoopThread thread([this](ZorvaRunLoop *loop) { begin(loop); },
                          [this](ZorvaRunLoop *loop) { end(loop); });
        Player(sourceOf(frames), output()).playAll(clock);
    }
    EXPECT_EQ(device->counters().handled, 1000u);
    EXPECT_EQ(device->counters().dropped, 0u);
}

TEST_F(LockStep, TimeNeverGoesBack) {
    clock.advanceToNanoseconds(2500);
    Player(sourceOf({reportFrame(1250, 1)}), output()).playAll(clock);
    EXPECT_EQ(clock.nowTicks(), 60u);
}

TEST_F(LockStep, ADeviceThatNobodyServesHoldsNothingUp) {
    Player(sourceOf({reportFrame(1, 1), reportFrame(2, 2)}), output()).playAll(clock);
    EXPECT_EQ(notes, (Texts{"1 report", "2 report"}));
}

TEST_F(LockStep, AnAccelItemWithoutThreeEntriesIsMetadata) {
    const PropertyValue partial = PropertyValue::Dictionary{{"X", 0.5}, {"Y", 0.0}};
    const PropertyValue full = PropertyValue::Dictionary{{"X", 0.5}, {"Y", 0.0}, {"Z", 1.0}};
    Player(sourceOf({metadataFrame(1, "Accel", partial), metadataFrame(2, "Accel", "text"),
                     metadataFrame(3, "accel", full)}),
           output())
        .playAll(clock);
    EXPECT_EQ(notes, (Texts{"1 metadata Accel", "2 metadata Accel", "3 metadata accel"}));
}

TEST_F(LockStep, ObserversAndTheAccelerometerMayBeMissing) {
    PlayerOutput bare;
    bare.device = device;
    const PropertyValue sample = PropertyValue::Dictionary{{"X", 0.5}, {"Y", 0.0}, {"Z", 1.0}};
    Player(sourceOf({stateFrame(1, "x"), reportFrame(2, 1), metadataFrame(3, "Accel", sample),
                     metadataFrame(4, "Label", "tap")}),
           bare)
        .playAll(clock);
    EXPECT_TRUE(device->deliver(Bytes{2}, 1)) << "and one report waits";
}

TEST_F(LockStep, AnObserverMayStopIt) {
    Player player(sourceOf({reportFrame(1, 1), reportFrame(2, 2)}), output());
    onNote = [&] { player.stop(); };
    player.playAll(clock);
    EXPECT_EQ(notes, (Texts{"1 report"}));
    player.playAll(clock);
    EXPECT_EQ(notes.size(), 1u) << "stopped for good";
}

TEST_F(LockStep, WhatAnObserverThrowsComesOut) {
    onNote = [] { throw std::runtime_error("observer"); };
    Player player(sourceOf({reportFrame(1, 1)}), output());
    EXPECT_THROW(player.playAll(clock), std::runtime_error);
}

// --- Live ----------------------------------------------------------------------------------------

class Live : public PlayerFixture {
protected:
    /// Plays to the end.
    /// @return Nanoseconds that it took.
    std::uint64_t play(const std::vector<Frame> &frames, double speed = 1) {
        Player player(sourceOf(frames), output());
        Host::SteadyClock clock;
        const std::uint64_t begin = clock.nowTicks();
        player.start(Host::processPlatform(), speed);
        player.waitUntilFinished();
        return clock.nowTicks() - begin;
    }
};

TEST_F(Live, FramesAreAsFarApartAsRecorded) {
    // Real time, a few milliseconds: pace is what is tested.
    EXPECT_GE(play({reportFrame(kHour, 1), reportFrame(kHour + 2 * kMillisecond, 2),
                    reportFrame(kHour + 5 * kMillisecond, 3)}),
              5 * kMillisecond);
    EXPECT_EQ(notes, (Texts{"3600000000000 report", "3600002000000 report", "3600005000000 report"}));
}

TEST_F(Live, ASpeedScalesTheGaps) {
    EXPECT_GE(play({reportFrame(0, 1), reportFrame(kMillisecond, 2)}, 0.25), 4 * kMillisecond);
    EXPECT_GE(play({reportFrame(0, 1), reportFrame(kHour, 2)}, 3'600'000), kMillisecond);
    EXPECT_EQ(notes.size(), 4u);
}

TEST_F(Live, ASpeedThatIsNoneIsTheRecorded) {
    for (const double speed : {0.0, -1.0, std::numeric_limits<double>::quiet_NaN()})
        EXPECT_GE(play({reportFrame(0, 1), reportFrame(kMillisecond, 2)}, speed), kMillisecond) << speed;
    EXPECT_EQ(notes.size(), 6u);
}

TEST_F(Live, AtInfiniteSpeedNobodyWaits) {
    play({reportFrame(0, 1), reportFrame(kHour, 2), reportFrame(50 * kHour, 3)}, kAtOnce);
    EXPECT_EQ(notes.size(), 3u);
}

TEST_F(Live, AGapOfYearsIsAnHourAndAStepBackIsNone) {
    // At this speed an hour is a millisecond, and 30 years would be four minutes.
    play({reportFrame(260'000 * kHour, 1), reportFrame(0, 2), reportFrame(260'000 * kHour, 3)}, 3'600'000);
    EXPECT_EQ(notes.size(), 3u);
}

TEST_F(Live, AStopEndsAGapOfMinutes) {
    const auto hasBegun = Host::processPlatform().createSemaphore();
    onNote = [&] { hasBegun->signal(); };
    Player player(sourceOf({reportFrame(0, 1), reportFrame(kHour / 2, 2)}), output());
    player.start(Host::processPlatform());
    hasBegun->wait();
    player.stop();
    EXPECT_EQ(notes, (Texts{"0 report"}));
    player.waitUntilFinished();
}

TEST_F(Live, ADestroyedPlayerHasStopped) {
    const auto hasBegun = Host::processPlatform().createSemaphore();
    onNote = [&] { hasBegun->signal(); };
    {
        Player player(sourceOf({reportFrame(0, 1), reportFrame(kHour / 2, 2)}), output());
        player.start(Host::processPlatform());
        hasBegun->wait();
    }
    EXPECT_EQ(notes, (Texts{"0 report"}));
}

TEST_F(Live, AnObserverMayStopIt) {
    Player player(sourceOf({reportFrame(0, 1), reportFrame(0, 2)}), output());
    onNote = [&] { player.stop(); };
    player.start(Host::processPlatform());
    player.waitUntilFinished();
    EXPECT_EQ(notes, (Texts{"0 report"}));
}

TEST_F(Live, WhatAnObserverThrowsComesOutOfTheWaitOnce) {
    onNote = [] { throw std::runtime_error("observer"); };
    Player player(sourceOf({reportFrame(0, 1), reportFrame(0, 2)}), output());
    player.start(Host::processPlatform());
    EXPECT_THROW(player.waitUntilFinished(), std::runtime_error);
    player.waitUntilFinished();
    EXPECT_EQ(notes.size(), 1u);
}

TEST_F(Live, NobodyWaitsForWhatWasNotStarted) {
    Player player(sourceOf({reportFrame(0, 1)}), output());
    player.waitUntilFinished();
    player.stop();
    EXPECT_TRUE(notes.empty());
}

TEST_F(Live, APlayerThatWasStoppedPlaysNothing) {
    Player player(sourceOf({reportFrame(0, 1)}), output());
    player.stop();
    player.start(Host::processPlatform());
    player.waitUntilFinished();
    EXPECT_TRUE(notes.empty());
}

/// The system's platform with no thread to spare.
class Threadless final : public Host::Platform {
public:
    Ports::LogProvider &logs() noexcept override { return _system.logs(); }
    Ports::Clock &clock() noexcept override { return _system.clock(); }
    Host::TraceSink &trace() noexcept override { return _system.trace(); }
    std::unique_ptr<Host::Semaphore> createSemaphore() override { return _system.createSemaphore(); }
    std::unique_ptr<Host::Thread> startThread(const char *, std::function<void()>) override {
        throw std::system_error(std::make_error_code(std::errc::resource_unavailable_try_again));
    }
    std::shared_ptr<Host::RunLoop> createRunLoop() override { return _system.createRunLoop(); }
    int setRoundRobinPriority(int priority) noexcept override {
        return _system.setRoundRobinPriority(priority);
    }

private:
    Host::Platform &_system = Host::processPlatform();
};

TEST_F(Live, NobodyWaitsForAThreadThatWasNotToBeHad) {
    Threadless platform;
    Player player(sourceOf({reportFrame(0, 1)}), output());
    EXPECT_THROW(player.start(platform), std::system_error);
    player.waitUntilFinished();
    player.stop();
    EXPECT_TRUE(notes.empty());
}

TEST_F(Live, ReportsAreStampedWithTheTimeOfDelivery) {
    Host::SteadyClock clock;
    ReportLog log;
    const std::uint64_t before = clock.nowTicks();
    {
        LoopThread thread([&](ZorvaRunLoop *loop) { log.begin(*device.get(), loop); },
                          [&](ZorvaRunLoop *loop) { log.end(*device.get(), loop); });
        play({reportFrame(7, 1)});
        device->waitUntilHandled();
    }
    ASSERT_EQ(log.reports.size(), 1u);
    EXPECT_GE(log.reports[0].timestamp, before);
    EXPECT_LE(log.reports[0].timestamp, clock.nowTicks());
}

} // namespace
} // namespace ZorvaTouch::Simulated
