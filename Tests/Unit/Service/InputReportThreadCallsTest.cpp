#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <array>

namespace ZorvaTouch {
namespace {

using namespace Testing;

/// Calls that come to a running thread, from itself and from a host that keeps no order.
class InputReportThreadOfAProbe : public ServiceTest {
protected:
    InputReportThreadOfAProbe() {
        start(offered.get());
        schedule();
    }

    const Ref<ProbeDevice> probe = ProbeDevice::create();
    const Ref<ProbeService> offered = ProbeService::create(probe.get());
};

TEST_F(InputReportThreadOfAProbe, RefusesToBeUnscheduledByItself) {
    probe->runOnInputThread([this](const auto &) { unschedule(); });
    EXPECT_EQ(
        platform.journal.errors().back(),
        "unscheduleWithDispatchQueue: refused: it was called on the input report thread, which would wait "
        "for itself");
    EXPECT_TRUE(probe->isScheduled());
    unschedule();
    EXPECT_FALSE(probe->isScheduled());
}

TEST_F(InputReportThreadOfAProbe, RefusesToBeScheduledByItself) {
    probe->runOnInputThread([this](const auto &) { (*hid)->scheduleWithDispatchQueue(hid, queue.get()); });
    EXPECT_EQ(
        platform.journal.errors().back(),
        "scheduleWithDispatchQueue: refused: it was called on the input report thread, which would wait "
        "for itself");
    EXPECT_EQ(platform.threadsStarted(), 1u);
}

TEST_F(InputReportThreadOfAProbe, MayAskForProperties) {
    bool isSet = false;
    PropertyValue value;
    probe->runOnInputThread([&](const auto &) {
        isSet = set("Pipeline.Algs.ActivationThreshold", 123.0);
        value = get("Pipeline.Algs.ActivationThreshold");
    });
    EXPECT_TRUE(isSet);
    EXPECT_EQ(value, PropertyValue(123.0));
}

TEST_F(InputReportThreadOfAProbe, KeepsItsDeviceWhenTheHostStopsFirst) {
    (*plugIn)->Stop(plugIn);
    const std::array<std::uint8_t, 1> report{9};
    probe->report(0, 9, report.data(), report.size(), 0);
    EXPECT_EQ(platform.journal.count("debug Invalid input report with ID 9"), 1u);
    unschedule();
    EXPECT_EQ(probe->calls().back(), "unregister 512");
    EXPECT_EQ(probe->references(), 2u); // the test's and the offered service's
}

TEST_F(InputReportThreadOfAProbe, LivesOnInAServiceThatWasReleasedAndEndsWithoutASource) {
    PlugInInterfaceTable **const kept = plugIn;
    EXPECT_EQ(releaseService(), 1u);
    const std::array<std::uint8_t, 1> report{9};
    probe->report(0, 9, report.data(), report.size(), 0);
    EXPECT_EQ(platform.journal.count("debug Invalid input report with ID 9"), 1u);
    EXPECT_EQ(platform.journal.count("debug dealloc"), 0u);
    probe->runOnInputThread([kept](const auto &) { (*kept)->AddRef(kept); }); // the host comes back
    plugIn = kept;
    void *found = nullptr;
    (*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, &found);
    hid = static_cast<HidServiceInterfaceTable **>(found);
    EXPECT_EQ((*hid)->Release(hid), 2u);
    unschedule();
    EXPECT_EQ(referenceCount(), 1u);
}

} // namespace
} // namespace ZorvaTouch
