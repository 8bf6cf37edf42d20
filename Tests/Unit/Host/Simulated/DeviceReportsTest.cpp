#include "Host/Simulated/Device.h"

#include "Tests/Unit/Host/Simulated/ManualLoop.h"
#include "Tests/Unit/Host/Simulated/ReportLog.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <optional>

namespace ZorvaTouch::Simulated {
namespace {

using Reports = std::vector<Received>;

class DeviceReports : public testing::Test {
protected:
    ~DeviceReports() override {
        if (device)
            log.end(*device.get(), &loop);
    }

    void begin() { log.begin(*device.get(), &loop); }
    void deliver(const Bytes &report, std::uint64_t timestamp = 1) {
        static_cast<void>(device->deliver(report, timestamp));
    }

    ManualLoop loop;
    ReportLog log;
    Ref<Device> device = Device::create();
};

TEST_F(DeviceReports, ReachTheCallbackInThePassThatServesThem) {
    begin();
    EXPECT_TRUE(device->deliver(Bytes{7, 8, 9}, 123));
    EXPECT_TRUE(log.reports.empty());
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports, (Reports{{7, {7, 8, 9}, 123}}));
    EXPECT_EQ(log.result, 0u);
    EXPECT_EQ(log.type, 0u);
    EXPECT_EQ(log.sender, device.get());
    EXPECT_EQ(device->counters().handled, 1u);
}

TEST_F(DeviceReports, AreServedOneAPassInTheirOrder) {
    begin();
    for (const std::uint8_t id : {std::uint8_t{1}, std::uint8_t{2}, std::uint8_t{3}})
        deliver({id}, id);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_TRUE(loop.serveOne());
    EXPECT_FALSE(loop.serveOne());
    EXPECT_EQ(log.reports, (Reports{{1, {1}, 1}, {2, {2}, 2}, {3, {3}, 3}}));
}

TEST_F(DeviceReports, EmptyOnesHaveReportIdZero) {
    begin();
    deliver({}, 5);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports, (Reports{{0, {}, 5}}));
}

TEST_F(DeviceReports, AreCutToTheBufferAndKeepTheirId) {
    log.buffer = Bytes(2);
    begin();
    deliver({7, 8, 9});
    loop.serveOne();
    EXPECT_EQ(log.reports, (Reports{{7, {7, 8}, 1}}));
    EXPECT_EQ(log.buffer, (Bytes{7, 8}));
}

TEST_F(DeviceReports, AreCutToNothingByAnEmptyBuffer) {
    log.buffer = {};
    begin();
    deliver({7, 8});
    loop.serveOne();
    EXPECT_EQ(log.reports, (Reports{{7, {}, 1}}));
}

TEST_F(DeviceReports, SixtyThreeWaitAndTheNewestBeyondIsDroppedAndCounted) {
    begin();
    for (std::uint8_t id = 1; id <= 63; ++id)
        EXPECT_TRUE(device->deliver(Bytes{id}, id));
    EXPECT_FALSE(device->deliver(Bytes{64}, 64));
    EXPECT_EQ(device->counters().dropped, 1u);
    while (loop.serveOne())
        ;
    ASSERT_EQ(log.reports.size(), 63u);
    EXPECT_EQ(log.reports.front().reportId, 1u);
    EXPECT_EQ(log.reports.back().reportId, 63u);
    EXPECT_EQ(device->counters().handled, 63u);
    EXPECT_TRUE(device->deliver(Bytes{65}, 65)) << "there is room again";
}

TEST_F(DeviceReports, AreNotServedInAnotherMode) {
    begin();
    deliver({1});
    EXPECT_FALSE(loop.serveOne("other"));
    EXPECT_TRUE(log.reports.empty());
    EXPECT_TRUE(loop.serveOne("mode"));
    EXPECT_EQ(log.reports.size(), 1u);
}

TEST_F(DeviceReports, WaitForTheNextSchedule) {
    deliver({1});
    begin();
    EXPECT_TRUE(loop.serveOne());
    log.end(*device.get(), &loop);
    deliver({2});
    EXPECT_FALSE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
    begin();
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports, (Reports{{1, {1}, 1}, {2, {2}, 1}}));
}

TEST_F(DeviceReports, AreDroppedByAClose) {
    begin();
    deliver({1});
    deliver({2});
    device->table->close(device.get(), 0);
    loop.serveOne();
    EXPECT_TRUE(log.reports.empty());
    EXPECT_EQ(device->counters().dropped, 2u);
}

TEST_F(DeviceReports, AreDroppedWhenTheirTurnComesAndNobodyListens) {
    begin();
    deliver({1, 2});
    deliver({3, 4});
    log.unregisterAt(*device.get());
    EXPECT_TRUE(loop.serveOne());
    EXPECT_FALSE(loop.serveOne());
    EXPECT_TRUE(log.reports.empty());
    EXPECT_EQ(log.buffer, Bytes(80)) << "the buffer was taken back, too";
    EXPECT_EQ(device->counters().dropped, 2u);
}

TEST_F(DeviceReports, DoNotBelongToACallbackThatGoesOn) {
    log.onReport = [this] { EXPECT_TRUE(device->deliver(Bytes{9}, 2)) << "no lock is held"; };
    begin();
    deliver({1});
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
    log.onReport = nullptr;
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.back(), (Received{9, {9}, 2}));
}

// --- Unplugged -----------------------------------------------------------------------------------

TEST_F(DeviceReports, AnUnplugTakesTheSourceAndDropsWhatWaits) {
    begin();
    deliver({1});
    EXPECT_EQ(loop.sourceCount(), 1u);
    device->unplug();
    EXPECT_EQ(loop.sourceCount(), 0u);
    EXPECT_FALSE(device->deliver(Bytes{2}, 2));
    EXPECT_EQ(device->counters().dropped, 2u);
    EXPECT_FALSE(loop.serveOne());
}

TEST_F(DeviceReports, AnUnplugInTheCallbackEndsTheReports) {
    log.onReport = [this] {
        device->unplug();
        EXPECT_EQ(loop.sourceCount(), 0u);
    };
    begin();
    deliver({1});
    deliver({2});
    EXPECT_TRUE(loop.serveOne());
    EXPECT_FALSE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
    EXPECT_EQ(device->counters().handled, 1u);
    EXPECT_EQ(device->counters().dropped, 1u);
}

TEST_F(DeviceReports, AnUnpluggedDeviceHasNoSourceUntilItIsPluggedAndScheduled) {
    device->unplug();
    begin();
    EXPECT_EQ(loop.sourceCount(), 0u);
    device->plug();
    EXPECT_EQ(loop.sourceCount(), 0u);
    begin();
    EXPECT_EQ(loop.sourceCount(), 1u);
    deliver({1});
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
}

// --- Scheduled -----------------------------------------------------------------------------------

TEST_F(DeviceReports, TheLoopIsKeptAsLongAsTheDeviceIsScheduled) {
    begin();
    EXPECT_EQ(loop.references, 2);
    device->unplug();
    EXPECT_EQ(loop.references, 2);
    log.end(*device.get(), &loop);
    EXPECT_EQ(loop.references, 1);
    EXPECT_EQ(loop.sourceCount(), 0u);
    log.end(*device.get(), &loop);
    EXPECT_EQ(loop.references, 1) << "twice does no harm";
}

TEST_F(DeviceReports, ASecondScheduleLeavesTheFirstLoop) {
    ManualLoop first;
    log.begin(*device.get(), &first);
    begin();
    EXPECT_EQ(first.references, 1);
    EXPECT_EQ(first.sourceCount(), 0u);
    EXPECT_EQ(loop.sourceCount(), 1u);
}

TEST_F(DeviceReports, AnUnscheduleOfAnotherPlaceDoesNothing) {
    ManualLoop other;
    begin();
    device->table->unschedule(device.get(), &loop, "other");
    device->table->unschedule(device.get(), &other, "mode");
    EXPECT_EQ(loop.sourceCount(), 1u);
}

TEST_F(DeviceReports, ADeviceThatIsLetGoOfGoesOnUntilItIsUnscheduled) {
    begin();
    deliver({1});
    EXPECT_EQ(device->counters().references, 2u);
    Device *const borrowed = device.get();
    device.reset();
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
    borrowed->table->unschedule(borrowed, &loop, "mode");
    EXPECT_EQ(loop.references, 1);
}

TEST_F(DeviceReports, TheLastReferenceMayGoInTheCallback) {
    begin();
    deliver({1});
    Device *const borrowed = device.get();
    device.reset();
    log.onReport = [&] {
        borrowed->table->unschedule(borrowed, &loop, "mode");
        EXPECT_EQ(borrowed->counters().references, 1u) << "the pass's own";
    };
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
    EXPECT_EQ(loop.references, 1);
}

// --- Waiting -------------------------------------------------------------------------------------

TEST_F(DeviceReports, NobodyWaitsForADeviceWithoutASource) {
    deliver({1});
    device->waitUntilHandled(); // not scheduled
    begin();
    deliver({1});
    device->unplug();
    device->waitUntilHandled(); // unplugged
    device->plug();
    log.end(*device.get(), &loop);
    loop.isOutOfMemory = true;
    begin();
    deliver({1});
    device->waitUntilHandled(); // scheduled in vain
    EXPECT_TRUE(log.reports.empty());
}

TEST_F(DeviceReports, TheCallbackDoesNotWaitForItself) {
    log.onReport = [this] { device->waitUntilHandled(); };
    begin();
    deliver({1});
    deliver({2});
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(log.reports.size(), 1u);
}

} // namespace
} // namespace ZorvaTouch::Simulated
