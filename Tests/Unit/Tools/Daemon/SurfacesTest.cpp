#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include "Host/Linux/Journal.h"
#include "Host/Objects/Accelerometer.h"
#include "Host/Runtime/AsyncLogs.h"
#include "Host/Simulated/Device.h"
#include "Tests/Unit/Host/Linux/JournalSocket.h"
#include <gmock/gmock.h>

#include <cerrno>
#include <cstddef>
#include <ostream>
#include <string>
#include <thread>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr const char *kLost = "lost SN1: the device is gone (read: Input/output error)";

using namespace std::chrono_literals;
using Linux::Tests::Bytes;
using Linux::Tests::FakeNode;
using Linux::Tests::openDescriptors;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using Tests::Delays;
using Tests::Lines;
using Tests::TouchScript;

class SurfacesTest : public Tests::SurfacesFixture {
protected:
    using SurfacesFixture::SurfacesFixture;

    /// A surface with the serial number SN1 at /dev/hidraw1 and a key of its that is down.
    void holdOne() {
        surfaces->onAdded(identity(1, "SN1"));
        sendAndWait(1, touch.holdLouder(), 1);
        ASSERT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    }
    /// The device goes, and the main loop has not heard of it.
    void unplug(int number) { node(number)->unplug(); }

    TouchScript touch;
};

// --- Coming and going, in every order
// ------------------------------------------------------------------------

TEST_F(SurfacesTest, AreAddedOpenedAndRemoved) {
    surfaces->onAdded(identity(1, "SN1"));
    EXPECT_EQ(surfaces->count(), 1u);
    const std::weak_ptr<FakeNode> opened = node(1);
    surfaces->onRemoved(identity(1, "SN1"));
    EXPECT_TRUE(opened.expired());
    EXPECT_EQ(surfaces->count(), 0u);
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", "removed SN1"));
    EXPECT_THAT(ended, ElementsAre("SN1"));
    EXPECT_EQ(logs->lines().count("Surfaces error"), 0u);
}

TEST_F(SurfacesTest, OneThatWasLostIsClosedAndAwaitedUntilItIsRemoved) {
    surfaces->onAdded(identity(1, "SN1"));
    unplug(1);
    runUntilLost();
    EXPECT_EQ(opener(1).node(), nullptr);
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
    surfaces->onRemoved(identity(1, "SN1"));
    EXPECT_THAT(timers.pending(), IsEmpty());
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", kLost, "removed SN1"));
    EXPECT_THAT(ended, ElementsAre("SN1"));
}

TEST_F(SurfacesTest, OneThatIsRemovedBeforeItsLossIsNoticedIsNotTriedAgain) {
    holdOne();
    unplug(1);
    told.keys.waitFor(2); // the input thread knows; word to the main loop is on its way
    surfaces->onRemoved(identity(1, "SN1"));
    settle();
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", "removed SN1"));
    EXPECT_THAT(timers.pending(), IsEmpty());
}

TEST_F(SurfacesTest, OneThatIsRemovedWithoutALossIsClosed) {
    surfaces->onAdded(identity(1, "SN1"));
    const auto held = node(1);
    surfaces->onRemoved(identity(1, "SN1"));
    held->unplug();
    settle();
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", "removed SN1"));
}

TEST_F(SurfacesTest, OneThatFailsAndStaysWorksAgain) {
    holdOne();
    unplug(1);
    runUntilLost();
    fireFirst();
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", kLost, "opened SN1"));
    TouchScript anew;
    sendAndWait(1, anew.tapPlay(), 2);
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 +164", "1 -164"));
}

TEST_F(SurfacesTest, RemovingWhatIsNotThereDoesNothing) {
    surfaces->onAdded(identity(1, "SN1"));
    surfaces->onRemoved(identity(2, "SN1"));
    surfaces->onRemoved(identity(1, "SN1"));
    surfaces->onRemoved(identity(1, "SN1"));
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", "removed SN1"));
}

TEST_F(SurfacesTest, ComingBackWhileTheOldOneIsStillThereIsAnotherSurface) {
    surfaces->onAdded(identity(1, "SN1"));
    surfaces->onAdded(identity(2, "SN1"));
    surfaces->onRemoved(identity(1, "SN1"));
    sendAndWait(2, touch.tapPlay(), 2);
    surfaces->onRemoved(identity(2, "SN1"));
    surfaces->onAdded(identity(1, "SN1"));
    EXPECT_THAT(told.surfaces.lines(),
                ElementsAre("added SN1", "opened SN1", "added SN1@usb-2", "opened SN1@usb-2", "removed SN1",
                            "removed SN1@usb-2", "added SN1", "opened SN1"));
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1@usb-2 +164 by tap", "SN1@usb-2 -164 by tap"));
}

TEST_F(SurfacesTest, NoTwoHaveTheSameIdentity) {
    surfaces->onAdded(identity(1, "SN1"));
    surfaces->onAdded(identity(2, "SN1"));
    surfaces->onAdded(identity(2, "SN1", "/sys/anew")); // while the one before is not removed yet
    EXPECT_THAT(told.surfaces.lines(),
                ElementsAre("added SN1", "opened SN1", "added SN1@usb-2", "opened SN1@usb-2",
                            "added SN1@usb-2-2", "opened SN1@usb-2-2"));
}

TEST_F(SurfacesTest, NeitherDoTwoThatTheSystemDoesNotTellOf) {
    const auto nothing = [](const std::shared_ptr<Linux::HidrawObserver> &) {
        return Simulated::Device::create();
    };
    const SurfaceName name{.id = "sim:day", .node = "sim:day", .name = ""};
    surfaces->add(name, nothing, keyboard);
    surfaces->add(name, nothing, keyboard);
    surfaces->add(name, nothing, keyboard);
    EXPECT_THAT(told.surfaces.lines(),
                ElementsAre("added sim:day", "opened sim:day", "added sim:day-2", "opened sim:day-2",
                            "added sim:day-3", "opened sim:day-3"));
}

TEST_F(SurfacesTest, TwinsPressTheSameKeyOnce) {
    TouchScript other;
    surfaces->onAdded(identity(1, "SN1"));
    surfaces->onAdded(identity(2, "SN1"));
    sendAndWait(1, touch.holdLouder(), 1);
    send(2, other.holdLouder());
    told.events.waitFor(4); // two may-begins, two holds
    settle();
    surfaces->onRemoved(identity(1, "SN1"));
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    surfaces->onRemoved(identity(2, "SN1"));
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115"));
}

// --- Opening
// -------------------------------------------------------------------------------------------------

struct OpenError {
    int number;
    std::string reason;
};
void PrintTo(const OpenError &error, std::ostream *stream) { *stream << error.number; }

class SurfacesOpen : public SurfacesTest, public testing::WithParamInterface<OpenError> {
protected:
    /// So many opens fail.
    void failOpens(int times) {
        for (int i = 0; i < times; ++i)
            opener(1).errors.push_back(GetParam().number);
    }
};

TEST_P(SurfacesOpen, ThatFailsIsTriedAgainEverLessOftenUntilItWorks) {
    failOpens(3);
    surfaces->onAdded(identity(1, "SN1"));
    const std::string failed = "failed SN1: " + GetParam().reason;
    for (const auto delay : {250ms, 500ms, 1000ms}) {
        EXPECT_THAT(timers.pending(), ElementsAre(delay));
        fireFirst();
    }
    EXPECT_THAT(timers.pending(), IsEmpty());
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", failed, failed, failed, "opened SN1"));
    sendAndWait(1, touch.tapPlay(), 2);
    EXPECT_THAT(ended, IsEmpty());
}

TEST_P(SurfacesOpen, ThatFailsForGoodIsTriedEveryHalfMinute) {
    failOpens(12);
    const auto before = openDescriptors();
    surfaces->onAdded(identity(1, "SN1"));
    Delays delays = timers.pending();
    for (int i = 0; i < 9; ++i) {
        fireFirst();
        delays.push_back(timers.pending().back());
    }
    EXPECT_EQ(delays,
              (Delays{250ms, 500ms, 1000ms, 2000ms, 4000ms, 8000ms, 16000ms, 30000ms, 30000ms, 30000ms}));
    surfaces->onRemoved(identity(1, "SN1"));
    EXPECT_EQ(openDescriptors(), before);
    EXPECT_THAT(told.surfaces.lines().back(), "removed SN1");
}

TEST_P(SurfacesOpen, ThatFailsDisturbsNoOther) {
    surfaces->onAdded(identity(2, "SN2"));
    failOpens(1);
    surfaces->onAdded(identity(1, "SN1"));
    sendAndWait(2, touch.tapPlay(), 2);
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN2 +164 by tap", "SN2 -164 by tap"));
}

INSTANTIATE_TEST_SUITE_P(
    Errno, SurfacesOpen,
    testing::Values(OpenError{EACCES,
                              "open: Permission denied; a udev rule gives access to it, see the manual"},
                    OpenError{ENOENT, "open: No such file or directory"},
                    OpenError{ENODEV, "open: No such device"}, OpenError{EMFILE, "open: Too many open files"},
                    OpenError{EIO, "open: Input/output error"},
                    OpenError{ENXIO, "open: No such device or address"},
                    OpenError{EINTR, "open: Interrupted system call"}));

TEST_F(SurfacesTest, OneThatIsLostAgainAndAgainIsTriedEverLessOften) {
    surfaces->onAdded(identity(1, "SN1"));
    for (const auto delay : {250ms, 500ms, 1000ms, 2000ms}) {
        unplug(1);
        runUntilLost();
        EXPECT_THAT(timers.pending(), ElementsAre(delay));
        fireFirst();
    }
}

TEST_F(SurfacesTest, OneThatHasWorkedForHalfAMinuteIsTriedAtOnceAgain) {
    surfaces->onAdded(identity(1, "SN1"));
    for (const auto &[worked, delay] : {std::pair{29'999ms, 250ms}, {29'999ms, 500ms}, {30'000ms, 250ms}}) {
        clock.sleepMicroseconds(static_cast<std::uint64_t>(worked / 1us));
        unplug(1);
        runUntilLost();
        EXPECT_THAT(timers.pending(), ElementsAre(delay));
        fireFirst();
    }
}

TEST_F(SurfacesTest, OneThatGoesWhileItIsOpenedIsTriedAgain) {
    opener(1).prepare = [](FakeNode &opened) { opened.infoError = ENODEV; };
    surfaces->onAdded(identity(1, "SN1"));
    opener(1).prepare = [](FakeNode &opened) { opened.unplug(); }; // opened, and gone at the first read
    fireFirst();
    runUntilLost();
    opener(1).prepare = nullptr;
    fireFirst();
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "failed SN1: open: No such device",
                                                   "opened SN1", kLost, "opened SN1"));
}

TEST_F(SurfacesTest, WithAPlugInThatMakesNoServiceTheyFailAndAreTriedAgain) {
    const auto noPlugIn = std::make_shared<Host::PlugInFile>(ZORVA_TEST_PLUGIN);
    const Host::PlugInFile taken = std::move(*noPlugIn);
    surfaces.emplace(
        SurfaceSurroundings{.plugIn = noPlugIn,
                            .events = events,
                            .keyQueue = keyQueue,
                            .keyboard = keyboard,
                            .keyMap = KeyMap(),
                            .listener = told,
                            .loop = loop,
                            .log = DaemonLog(*logs, "Surfaces"),
                            .after = timers.timer()},
        [](const Linux::DeviceIdentity &) { return DeviceMaker(); }, clock,
        SurfaceHooks{.onComing = [](const SurfaceName &) {},
                     .onEnding = [](const SurfaceName &, const Surface &) {}});
    surfaces->onAdded(identity(1, "SN1"));
    EXPECT_THAT(told.surfaces.lines(), SizeIs(2));
    EXPECT_THAT(told.surfaces.lines().back(), testing::HasSubstr("has no factory"));
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
}

// --- Reports that are not what they should be
// ------------------------------------------------------------------

TEST_F(SurfacesTest, ReportsThatWaitedWhenTheDeviceWentStillCount) {
    surfaces->onAdded(identity(1, "SN1"));
    send(1, touch.holdLouder());
    unplug(1);
    runUntilLost();
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115"));
}

TEST_F(SurfacesTest, ShortAndLongReportsBetweenOthersChangeNothing) {
    surfaces->onAdded(identity(1, "SN1"));
    for (const Bytes &report : touch.tapPlay()) {
        send(1, {{0x01}, {0x02}, {0x1F, 0, 0}, Bytes(72, 0x01), Bytes(9, 0x02), Bytes(4096, 0x7F)});
        send(1, {report});
    }
    told.keys.waitFor(2);
    settle();
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +164 by tap", "SN1 -164 by tap"));
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1"));
}

TEST_F(SurfacesTest, AReadThatFailsLosesNoHold) {
    opener(1).prepare = [](FakeNode &opened) { opened.readErrors = {EINVAL, EAGAIN, EINTR, ENOMEM}; };
    holdOne();
    EXPECT_EQ(logs->lines().count("Surfaces error: a report was lost: read: "), 2u);
    sendAndWait(1, touch.letGo(), 1);
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +115 by hold-start", "SN1 -115 by hold-end"));
}

TEST_F(SurfacesTest, ADeviceWhoseReadsOnlyFailIsTriedAgain) {
    opener(1).prepare = [](FakeNode &opened) {
        opened.readErrors.assign(Linux::HidrawDevice::kFailuresUntilGone, EINVAL);
    };
    surfaces->onAdded(identity(1, "SN1"));
    send(1, {touch.image()});
    runUntilLost();
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
    EXPECT_EQ(logs->lines().count("a report was lost"), 8u);
}

TEST_F(SurfacesTest, ADeviceThatAnswersNoQuestionsWorks) {
    opener(1).prepare = [](FakeNode &opened) {
        opened.infoError = opened.textError = opened.descriptorError = EIO;
        opened.onFeature = [](std::span<std::uint8_t>) {
            return Linux::IoResult{.count = 0, .errorNumber = ETIMEDOUT};
        };
    };
    surfaces->onAdded(identity(1, "SN1"));
    sendAndWait(1, touch.tapPlay(), 2);
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1"));
}

TEST_F(SurfacesTest, AResetInTheMiddleOfAHoldLetsGo) {
    holdOne();
    send(1, {Scripted::firmwareReport(0x01)});
    sendAndWait(1, touch.letGo(), 0);
    told.keys.waitFor(2);
    EXPECT_THAT(keys.down(), IsEmpty());
}

// --- Every key that is down goes up
// ------------------------------------------------------------------------------

TEST_F(SurfacesTest, AKeyGoesUpWhenTheDeviceIsGoneWithoutTheMainLoop) {
    holdOne();
    unplug(1);
    told.keys.waitFor(2);
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +115 by hold-start", "SN1 -115"));
}

TEST_F(SurfacesTest, AKeyIsUpOnceItsSurfaceIsRemoved) {
    holdOne();
    surfaces->onRemoved(identity(1, "SN1"));
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_THAT(told.keys.lines(), ElementsAre("SN1 +115 by hold-start", "SN1 -115"));
}

TEST_F(SurfacesTest, AKeyIsUpOnceTheyAreClosed) {
    holdOne();
    surfaces->closeAll();
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_EQ(surfaces->count(), 0u);
    EXPECT_THAT(ended, ElementsAre("SN1"));
    surfaces->closeAll();
    EXPECT_THAT(ended, ElementsAre("SN1"));
}

TEST_F(SurfacesTest, AKeyIsUpOnceTheyAreDestroyed) {
    holdOne();
    surfaces.reset();
    EXPECT_THAT(keys.down(), IsEmpty());
}

TEST_F(SurfacesTest, AKeyIsUpOnceTheyAreSuspendedAndItsTouchDoesNothingMore) {
    holdOne();
    surfaces->suspend();
    EXPECT_THAT(keys.down(), IsEmpty());
    for (int i = 0; i < 60; ++i)
        send(1, {touch.image({{'A', 300}})}); // the hold moves to another region
    send(1, touch.letGo());
    sendAndWait(1, touch.tapPlay(), 2);
    EXPECT_THAT(told.keys.lines(),
                ElementsAre("SN1 +115 by hold-start", "SN1 -115", "SN1 +164 by tap", "SN1 -164 by tap"));
}

TEST_F(SurfacesTest, AKeyGoesUpWhenTheInputThreadEnds) {
    keepsDevices = true;
    holdOne();
    const auto elsewhere = Host::processPlatform().createRunLoop();
    const auto device = lastDevices.at("/dev/hidraw1");
    device->table->schedule(device.get(), elsewhere->boundary(), "elsewhere");
    told.keys.waitFor(2);
    runUntilLost();
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_THAT(told.surfaces.lines().back(), "lost SN1: its input thread ended");
    device->table->unschedule(device.get(), elsewhere->boundary(), "elsewhere");
    fireFirst();
    TouchScript anew;
    sendAndWait(1, anew.tapPlay(), 2);
}

TEST_F(SurfacesTest, AfterALossNothingMoreComesFromWhatWasOnItsWay) {
    surfaces->onAdded(identity(1, "SN1"));
    for (int i = 0; i < 3; ++i) {
        TouchScript anew;
        send(1, anew.holdLouder());
        unplug(1);
        runUntilLost();
        EXPECT_THAT(keys.down(), IsEmpty());
        fireFirst();
    }
    EXPECT_EQ(told.keys.count("+115"), told.keys.count("-115"));
}

TEST_F(SurfacesTest, OneThatGoesLeavesTheKeysOfTheOther) {
    TouchScript other;
    surfaces->onAdded(identity(2, "SN2"));
    sendAndWait(2, other.holdPlay(), 1);
    surfaces->onAdded(identity(1, "SN1"));
    sendAndWait(1, touch.holdLouder(), 1);
    unplug(1);
    told.keys.waitFor(3);
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVoiceCommand));
    sendAndWait(2, other.letGo(), 1);
}

// --- Listening anew
// ------------------------------------------------------------------------------------------------

TEST_F(SurfacesTest, ListenAnewAtOnceWhereNothingIsTouched) {
    surfaces->onAdded(identity(1, "SN1"));
    const auto accelerometer = Host::Accelerometer::create(events);
    EXPECT_EQ(accelerometer->reportInterval(), std::nullopt);
    surfaces->reschedule();
    platform.waitUntilServing();
    EXPECT_NE(accelerometer->reportInterval(), std::nullopt);
    EXPECT_THAT(timers.pending(), IsEmpty());
    sendAndWait(1, touch.tapPlay(), 2);
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1"));
}

TEST_F(SurfacesTest, ListenAnewOnlyWhenTheTouchIsOver) {
    holdOne();
    const auto accelerometer = Host::Accelerometer::create(events);
    surfaces->reschedule();
    EXPECT_THAT(timers.pending(), ElementsAre(500ms));
    fireFirst();
    EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
    EXPECT_THAT(timers.pending(), ElementsAre(500ms));
    EXPECT_EQ(accelerometer->reportInterval(), std::nullopt);
    sendAndWait(1, touch.letGo(), 1);
    keyQueue.drain();
    fireFirst();
    platform.waitUntilServing();
    EXPECT_NE(accelerometer->reportInterval(), std::nullopt);
    EXPECT_THAT(timers.pending(), IsEmpty());
}

TEST_F(SurfacesTest, OneThatWaitsToListenAnewMayGo) {
    holdOne();
    surfaces->reschedule();
    surfaces->onRemoved(identity(1, "SN1"));
    fireFirst();
    EXPECT_THAT(timers.pending(), IsEmpty());
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", "removed SN1"));
}

TEST_F(SurfacesTest, OneThatDoesNotWorkListensAnewByOpening) {
    opener(1).errors = {ENOENT};
    surfaces->onAdded(identity(1, "SN1"));
    const auto accelerometer = Host::Accelerometer::create(events);
    surfaces->reschedule();
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
    fireFirst();
    platform.waitUntilServing();
    EXPECT_NE(accelerometer->reportInterval(), std::nullopt);
}

TEST_F(SurfacesTest, OneThatIsGoneUnnoticedAndListensAnewIsLost) {
    const auto accelerometer =
        Host::Accelerometer::create(events); // keeps the input thread alive without a device
    holdOne();
    unplug(1);
    told.keys.waitFor(2);
    keyQueue.drain(); // by then it is idle
    surfaces->reschedule();
    runUntilLost();
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
}

TEST_F(SurfacesTest, AKeyGoesUpWhenTheDeviceIsSilentInTheMiddleOfAHold) {
    holdOne();
    fireSilence(); // the report that began it was the last
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_EQ(logs->lines().count("silent in the middle of a hold"), 1u);
    EXPECT_FALSE(timers.isWatchingSilence());
}

/// Everything is logged, at level debug, to a journal that is full and does not read.
class SurfacesWithAStalledJournal : public SurfacesTest {
protected:
    SurfacesWithAStalledJournal() : SurfacesTest(std::make_shared<StalledLogs>()) {}

private:
    class StalledLogs final : public Ports::LogProvider {
    public:
        StalledLogs() {
            for (std::size_t i = 0; i < 2 * Host::AsyncWriter::kCapacity; ++i)
                openLog("s", "c")->write(Ports::LogLevel::Error, "full");
            _journal.waitUntilFull();
        }
        std::shared_ptr<Ports::Log> openLog(std::string_view subsystem, std::string_view category) override {
            return _logs.openLog(subsystem, category);
        }

    private:
        Linux::Tests::JournalSocket _journal;
        Host::AsyncLogs _logs{Ports::LogLevel::Debug, Linux::journalFormat(),
                              std::make_shared<Linux::JournalWriter>(_journal.path())};
    };
};

TEST_F(SurfacesWithAStalledJournal, AKeyGoesUpWhenTheDeviceIsSilent) {
    holdOne();
    fireSilence();
    EXPECT_THAT(keys.down(), IsEmpty());
}

TEST_F(SurfacesWithAStalledJournal, AKeyGoesUpBeforeTheMachineSleeps) {
    holdOne();
    surfaces->suspend();
    keyQueue.drain();
    EXPECT_THAT(keys.down(), IsEmpty());
}

TEST_F(SurfacesTest, AKeyStaysDownAsLongAsReportsCome) {
    keepsDevices = true;
    holdOne();
    const auto reports = [this] { return lastDevices.at("/dev/hidraw1")->counters().reports; };
    for (int second = 0; second < 3; ++second) {
        runUntil([this] { return timers.isWatchingSilence(); });
        const std::uint64_t before = reports();
        send(1, {{0x7E, 0}}); // of whichever kind
        while (reports() == before)
            std::this_thread::yield();
        fireSilence();
    }
    EXPECT_THAT(keys.down(), SizeIs(1));
}

TEST_F(SurfacesTest, OneWithAnAccelerometerOfItsOwnGetsNoSamplesOfOthers) {
    std::vector<std::shared_ptr<Host::EventSystem>> systems;
    std::vector<Ref<Host::Accelerometer>> accelerometers;
    std::vector<Ref<Simulated::Device>> devices;
    for (int i = 0; i < 2; ++i) {
        systems.push_back(Host::EventSystem::create());
        accelerometers.push_back(Host::Accelerometer::create(systems.back()));
        devices.push_back(Simulated::Device::create());
        surfaces->add(
            {.id = "sim", .node = "sim", .name = ""},
            [device = devices.back()](const std::shared_ptr<Linux::HidrawObserver> &) { return device; },
            keyboard, systems.back());
        platform.waitUntilServing();
    }
    for (int i = 0; i < 3; ++i) {
        accelerometers[0]->deliver(0, 0, 1, 1000);
        accelerometers[0]->waitUntilHandled();
    }
    EXPECT_EQ(systems[0]->counters().heard, 3u);
    EXPECT_EQ(systems[1]->counters().clients, 1u);
    EXPECT_EQ(systems[1]->counters().heard, 0u);
    EXPECT_EQ(events->counters().clients, 0u);
}

TEST_F(SurfacesTest, OneThatAnotherProgramUsesIsKnownUntilItWorks) {
    surfaces->onAdded(identity(2, "SN2"));
    EXPECT_EQ(surfaces->inUse(), nullptr);
    opener(1).errors = {EBUSY};
    surfaces->onAdded(identity(1, "SN1"));
    ASSERT_NE(surfaces->inUse(), nullptr);
    EXPECT_EQ(surfaces->inUse()->id, "SN1");
    fireFirst();
    EXPECT_EQ(surfaces->inUse(), nullptr);
    EXPECT_THAT(told.surfaces.lines().back(), "opened SN1");
}

TEST_F(SurfacesTest, OneThatChangesIsTriedAgainAtOnce) {
    opener(1).errors = {EACCES};
    surfaces->onAdded(identity(1, "SN1"));
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
    surfaces->onChanged(identity(1, "SN1")); // its permissions, say
    EXPECT_THAT(told.surfaces.lines().back(), "opened SN1");
}

TEST_F(SurfacesTest, InTheEndEveryKeyIsUpBeforeAnyRecordingIsSaved) {
    holdOne();
    bool wereUp = false;
    surfaces->onAdded(identity(2, "SN2"));
    whenEnding = [&] { wereUp = keys.down().empty(); };
    surfaces->closeAll();
    EXPECT_TRUE(wereUp);
}

/// Says that a device is gone in the moment in which it is taken off its run loop, once.
class GoneAsItLeaves final : public Linux::HidrawObserver {
public:
    explicit GoneAsItLeaves(std::shared_ptr<Linux::HidrawObserver> to) : _to(std::move(to)) {}

    void onGone(const Linux::SystemFailure &reason) noexcept override { _to->onGone(reason); }
    void onFailure(const Linux::SystemFailure &failure) noexcept override { _to->onFailure(failure); }
    void onUnscheduled() noexcept override {
        if (!std::exchange(_isTold, true))
            _to->onGone({"read", EIO});
        _to->onUnscheduled();
    }

private:
    const std::shared_ptr<Linux::HidrawObserver> _to;
    bool _isTold = false;
};

TEST_F(SurfacesTest, OneThatGoesInTheMomentInWhichItListensAnewIsLost) {
    const auto accelerometer =
        Host::Accelerometer::create(events); // keeps the input thread alive without a device
    observedBy = [](std::shared_ptr<Linux::HidrawObserver> surface) {
        return std::make_shared<GoneAsItLeaves>(std::move(surface));
    };
    surfaces->onAdded(identity(1, "SN1"));
    platform.waitUntilServing();
    surfaces->reschedule();
    runUntilLost();
    EXPECT_THAT(timers.pending(), ElementsAre(250ms));
    fireFirst();
    EXPECT_THAT(told.surfaces.lines(), ElementsAre("added SN1", "opened SN1", kLost, "opened SN1"));
}

// --- For ever
// --------------------------------------------------------------------------------------------------------

TEST_F(SurfacesTest, AThousandComingsAndGoingsKeepNoDescriptor) {
    surfaces->onAdded(identity(1, "SN1"));
    surfaces->onRemoved(identity(1, "SN1"));
    const auto before = openDescriptors();
    for (int i = 0; i < 1000; ++i) {
        surfaces->onAdded(identity(1, "SN1"));
        surfaces->onRemoved(identity(1, "SN1"));
    }
    EXPECT_EQ(openDescriptors(), before);
    EXPECT_EQ(logs->lines().count("Surfaces error"), 0u);
}

TEST_F(SurfacesTest, AHundredLossesKeepNoDescriptor) {
    surfaces->onAdded(identity(1, "SN1"));
    const auto loseInAHold = [this] {
        TouchScript anew;
        send(1, anew.holdLouder());
        unplug(1);
        runUntilLost();
        fireFirst();
        platform.waitUntilServing();
    };
    loseInAHold();
    const auto before = openDescriptors();
    for (int i = 0; i < 100; ++i)
        loseInAHold();
    EXPECT_EQ(openDescriptors(), before);
    EXPECT_EQ(told.keys.count("+115"), 101u);
    EXPECT_EQ(told.keys.count("-115"), 101u);
}

} // namespace
} // namespace ZorvaTouch::Tools
