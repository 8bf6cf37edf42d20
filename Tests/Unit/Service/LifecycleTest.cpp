#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <optional>

namespace ZorvaTouch {
namespace {

using namespace Testing;

class ServiceLifecycle : public ServiceTest {};

TEST_F(ServiceLifecycle, BeginsWithOneReferenceAndLogsOfItsOwn) {
    EXPECT_EQ(referenceCount(), 1u);
    EXPECT_EQ(platform.journal.opened(),
              (Lines{"org.zorva.hid.ZorvaTouch/HIDService", "org.zorva.hid.ZorvaTouch/Algs"}));
    EXPECT_EQ(platform.threadsStarted(), 0u);
}

TEST_F(ServiceLifecycle, LogsEachOperationByItsName) {
    std::int32_t score = 0;
    (*plugIn)->Probe(plugIn, nullptr, nullptr, &score);
    start();
    (*hid)->open(hid, 0x2A);
    (*hid)->setEventCallback(hid, nullptr, nullptr, nullptr);
    (*hid)->copyEvent(hid, 11, nullptr, 0);
    (*hid)->setOutputEvent(hid, nullptr);
    (*hid)->close(hid, 0xFFFFFFFF);
    (*plugIn)->Stop(plugIn);
    EXPECT_EQ(releaseService(), 0u);
    EXPECT_EQ(platform.journal.lines(),
              (Lines{"debug probeWithService:properties:outScore:", "debug startWithService:properties:",
                     "debug openWithOptions:2a", "debug setEventCallback:target:refcon:",
                     "debug copyEventWithType:matching:options:", "debug setOutputEvent:",
                     "debug closeWithOptions:ffffffff", "debug stop", "debug dealloc"}));
}

TEST_F(ServiceLifecycle, WritesNoDebugLinesAtTheDefaultLevel) {
    platform.journal.setLevel(Ports::LogLevel::Default);
    start();
    (*hid)->open(hid, 1);
    EXPECT_TRUE(platform.journal.lines().empty());
}

TEST_F(ServiceLifecycle, ProbeLeavesTheScore) {
    std::int32_t score = -7;
    EXPECT_EQ((*plugIn)->Probe(plugIn, nullptr, nullptr, &score), 0u);
    EXPECT_EQ(score, -7);
    EXPECT_EQ((*plugIn)->Probe(plugIn, nullptr, nullptr, nullptr), 0u);
}

// --- Start and stop --------------------------------------------------------------------------------

TEST_F(ServiceLifecycle, StartCreatesTheDeviceAndStopReleasesIt) {
    start();
    EXPECT_EQ(offeredService->devicesCreated(), 1u);
    EXPECT_EQ(device->counters().references, 3u); // the test's, the offered service's, the service's
    EXPECT_EQ((*plugIn)->Stop(plugIn), 0u);
    EXPECT_EQ(device->counters().references, 2u);
    EXPECT_EQ((*plugIn)->Stop(plugIn), 0u);
    EXPECT_EQ(device->counters().references, 2u);
}

TEST_F(ServiceLifecycle, StartFailsWithoutADevice) {
    offeredService = Host::Service::create({});
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, offeredService.get()), 0xE00002BEu);
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, nullptr), 0xE00002BEu);
    ZorvaService hollow{nullptr};
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, &hollow), 0xE00002BEu);
}

TEST_F(ServiceLifecycle, StartFailsWithADeviceThatIsNotWhole) {
    struct HollowOffer : ZorvaService {
        ZorvaDevice device{nullptr};
    };
    const ZorvaServiceTable table{
        .size = sizeof(ZorvaServiceTable),
        .retain = [](ZorvaService *) {},
        .release = [](ZorvaService *) {},
        .createDevice = [](ZorvaService *service) { return &static_cast<HollowOffer *>(service)->device; },
        .createEventClient = nullptr,
        .setProperty = nullptr,
    };
    HollowOffer offered{{&table}};
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, &offered), 0xE00002BEu);
    EXPECT_EQ((*hid)->open(hid, 0), 0);
    (*plugIn)->Stop(plugIn); // it keeps the offered service until then
}

TEST_F(ServiceLifecycle, StartAgainLetsGoOfTheFirstDevice) {
    start();
    const auto other = Simulated::Device::create();
    offeredService->setDevice(other);
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, offeredService.get()), 0u);
    EXPECT_EQ(device->counters().references, 1u);
    EXPECT_EQ(other->counters().references, 3u);
    offeredService->setDevice({});
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, offeredService.get()), 0xE00002BEu);
    EXPECT_EQ(other->counters().references, 1u);
}

TEST_F(ServiceLifecycle, TheLastReleaseReleasesADeviceThatWasNotStopped) {
    start();
    EXPECT_EQ(releaseService(), 0u);
    EXPECT_EQ(device->counters().references, 2u);
    EXPECT_EQ(platform.journal.count("debug dealloc"), 1u);
}

TEST_F(ServiceLifecycle, KeepsTheOfferedServiceUntilItStops) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    EXPECT_EQ(offered->references(), 2u);
    (*plugIn)->Stop(plugIn);
    EXPECT_EQ(offered->references(), 1u);
}

// --- Open and close --------------------------------------------------------------------------------

TEST_F(ServiceLifecycle, OpensAndClosesWithTheHostsOptions) {
    start();
    EXPECT_EQ((*hid)->open(hid, 0x80000001), 1);
    (*hid)->close(hid, 9);
    const Simulated::DeviceCounters counters = device->counters();
    EXPECT_EQ(counters.opened, 1u);
    EXPECT_EQ(counters.openOptions, 0x80000001u);
    EXPECT_EQ(counters.closed, 1u);
    EXPECT_EQ(counters.closeOptions, 9u);
}

TEST_F(ServiceLifecycle, AnOpenThatFailsIsFalse) {
    start();
    for (const ZorvaStatus status : {0xE00002BEu, 0xE00002C7u, 1u}) {
        device->setOpenStatus(status);
        EXPECT_EQ((*hid)->open(hid, 0), 0);
    }
    EXPECT_TRUE(platform.journal.errors().empty());
}

TEST_F(ServiceLifecycle, WithoutADeviceOpensAndClosesNothing) {
    EXPECT_EQ((*hid)->open(hid, 0), 0);
    (*hid)->close(hid, 0);
    start();
    (*plugIn)->Stop(plugIn);
    EXPECT_EQ((*hid)->open(hid, 0), 0);
    (*hid)->close(hid, 0);
    EXPECT_EQ(device->counters().openOptions, std::nullopt);
    EXPECT_EQ(device->counters().closeOptions, std::nullopt);
}

// --- What it declines ------------------------------------------------------------------------------

TEST_F(ServiceLifecycle, CopiesNoEventAndTakesNone) {
    const auto event = [] { return reinterpret_cast<const ZorvaEvent *>(1); }; // not looked at
    EXPECT_EQ((*hid)->copyEvent(hid, 11, event(), 3), nullptr);
    EXPECT_EQ((*hid)->copyEvent(hid, 0, nullptr, 0), nullptr);
    EXPECT_EQ((*hid)->setOutputEvent(hid, event()), 0xE00002C7u);
    EXPECT_EQ((*hid)->setOutputEvent(hid, nullptr), 0xE00002C7u);
}

} // namespace
} // namespace ZorvaTouch
