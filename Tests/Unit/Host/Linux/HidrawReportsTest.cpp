#include "Host/Linux/HidrawDevice.h"

#include "Tests/Unit/Host/Linux/DeviceFixture.h"

#include <gmock/gmock.h>

#include <cerrno>

namespace ZorvaTouch::Linux {
namespace {

using Host::RunOutcome;
using testing::ElementsAre;
using testing::IsEmpty;
using Tests::Bytes;
using Tests::Received;

class HidrawReports : public Tests::DeviceFixture {};

TEST_F(HidrawReports, AreReadIntoTheRegisteredBufferAndHandedOver) {
    begin();
    const auto before = Host::processPlatform().clock().nowTicks();
    nodes.node()->send({1, 2, 3});
    passes(1);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1, 2, 3}}));
    EXPECT_EQ(result, 0u);
    EXPECT_EQ(type, 0u);
    EXPECT_EQ(sender, device.get());
    EXPECT_EQ(place, buffer.data());
    EXPECT_GE(timestamp, before);
    EXPECT_LE(timestamp, Host::processPlatform().clock().nowTicks());
    EXPECT_EQ(device->counters().reports, 1u);
}

TEST_F(HidrawReports, ComeOneInEachPassAndInOrder) {
    begin();
    for (const std::uint8_t id : Bytes{1, 2, 3})
        nodes.node()->send({id});
    passes(1);
    EXPECT_EQ(reports.size(), 1u);
    passes(2);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}, Received{2, {2}}, Received{3, {3}}));
    EXPECT_EQ(nodes.node()->reads, 3u);
}

TEST_F(HidrawReports, AreCutToTheBuffer) {
    buffer.resize(2);
    begin();
    nodes.node()->send({9, 8, 7});
    nodes.node()->send({6});
    passes(2);
    EXPECT_THAT(reports, ElementsAre(Received{9, {9, 8}}, Received{6, {6}}));
}

TEST_F(HidrawReports, AreReadAndDroppedWhileThereIsNoCallbackOrNoBuffer) {
    begin();
    unregisterCallback();
    nodes.node()->send({1});
    passes(1);
    buffer.clear();
    registerCallback();
    nodes.node()->send({2});
    passes(1);
    EXPECT_THAT(reports, IsEmpty());
    EXPECT_EQ(device->counters().dropped, 2u);
    EXPECT_THAT(observer->gone, IsEmpty());
}

TEST_F(HidrawReports, MayUnscheduleAndCloseAndReleaseTheDevice) {
    begin();
    nodes.node()->send({1});
    nodes.node()->send({2});
    onReport = [this] {
        unschedule();
        close();
        device.reset();
    };
    passes(1);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}));
    EXPECT_EQ(nodes.node(), nullptr);
}

// --- Errno by errno
// ------------------------------------------------------------------------------------------

class HidrawHarmlessErrors : public HidrawReports, public testing::WithParamInterface<int> {};

TEST_P(HidrawHarmlessErrors, AreNothing) {
    begin();
    nodes.node()->send({1});
    nodes.node()->readErrors.assign(20, GetParam());
    passes(20);
    EXPECT_THAT(reports, IsEmpty());
    passes(1);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}));
    EXPECT_THAT(observer->gone, IsEmpty());
    EXPECT_THAT(observer->failures, IsEmpty());
    EXPECT_EQ(device->counters().failures, 0u);
}
INSTANTIATE_TEST_SUITE_P(Errno, HidrawHarmlessErrors, testing::Values(EAGAIN, EINTR));

class HidrawFinalErrors : public HidrawReports, public testing::WithParamInterface<int> {};

TEST_P(HidrawFinalErrors, MeanThatTheDeviceIsGone) {
    begin();
    nodes.node()->send({1});
    nodes.node()->readErrors = {GetParam()};
    passes(1);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_THAT(observer->gone, ElementsAre(SystemFailure{"read", GetParam()}));
    EXPECT_THAT(observer->failures, IsEmpty());
    EXPECT_EQ(nodes.node(), nullptr) << "it is closed";
}
INSTANTIATE_TEST_SUITE_P(Errno, HidrawFinalErrors, testing::Values(EIO, ENODEV));

class HidrawOtherErrors : public HidrawReports, public testing::WithParamInterface<int> {};

TEST_P(HidrawOtherErrors, AreToldAndPassUnlessTheyAreEightInARow) {
    begin();
    const int e = GetParam();
    nodes.node()->send({1});
    nodes.node()->readErrors = {e, e, e, e, e, e, e};
    passes(8);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}));
    EXPECT_EQ(observer->failures, std::vector<SystemFailure>(7, {"read", e}));
    EXPECT_EQ(device->counters().failures, 7u);
    EXPECT_THAT(observer->gone, IsEmpty());

    nodes.node()->send({2});
    nodes.node()->readErrors.assign(8, e);
    passes(8);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(observer->failures.size(), 15u);
    EXPECT_THAT(observer->gone, ElementsAre(SystemFailure{"read", e}));
}
INSTANTIATE_TEST_SUITE_P(Errno, HidrawOtherErrors, testing::Values(EINVAL, ENOMEM, EFAULT, EBADF, EPERM));

TEST_F(HidrawReports, ThatWaitedAreDeliveredBeforeTheEndIsNoticed) {
    begin();
    for (const std::uint8_t id : Bytes{1, 2, 3})
        nodes.node()->send({id});
    nodes.node()->unplug();
    EXPECT_EQ(run(), RunOutcome::Finished);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}, Received{2, {2}}, Received{3, {3}}));
    EXPECT_THAT(observer->gone, ElementsAre(SystemFailure{"read", EIO}));
}

TEST_F(HidrawReports, EndWithAnEmptyRead) {
    nodes.prepare = [](Tests::FakeNode &node) { node.endError = 0; };
    begin();
    nodes.node()->unplug();
    EXPECT_EQ(run(), RunOutcome::Finished);
    EXPECT_THAT(observer->gone, ElementsAre(SystemFailure{"read", 0}));
    EXPECT_EQ(describe(observer->gone[0]), "read: ended");
}

// --- Any order
// -----------------------------------------------------------------------------------------------

TEST_F(HidrawReports, FlowWhenItIsScheduledBeforeItIsOpened) {
    registerCallback();
    schedule();
    EXPECT_EQ(pass(), RunOutcome::Finished) << "there is nothing to watch";
    open();
    nodes.node()->send({1});
    passes(1);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}));
}

TEST_F(HidrawReports, StopWhenItIsClosedFirstAndUnscheduledThen) {
    begin();
    nodes.node()->send({1});
    close();
    EXPECT_EQ(nodes.node(), nullptr);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    unschedule();
    EXPECT_THAT(reports, IsEmpty());
    EXPECT_THAT(observer->gone, IsEmpty()) << "it was closed, it did not go";
}

TEST_F(HidrawReports, StopWhenItIsUnscheduledAndWaitForTheNextTime) {
    begin();
    nodes.node()->send({1});
    unschedule("other");
    passes(1);
    unschedule();
    nodes.node()->send({2});
    EXPECT_EQ(pass(), RunOutcome::Finished);
    schedule();
    passes(1);
    EXPECT_THAT(reports, ElementsAre(Received{1, {1}}, Received{2, {2}}));
}

TEST_F(HidrawReports, AreReadOnceWhenItIsScheduledTwice) {
    begin();
    schedule();
    nodes.node()->send({1});
    passes(1);
    unschedule();
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(nodes.node()->reads, 1u);
}

TEST_F(HidrawReports, EndOnceForADeviceThatWentBeforeItWasScheduled) {
    open();
    nodes.node()->unplug();
    EXPECT_THAT(observer->gone, IsEmpty());
    registerCallback();
    schedule();
    EXPECT_EQ(run(), RunOutcome::Finished);
    unschedule();
    close();
    close();
    EXPECT_THAT(observer->gone, ElementsAre(SystemFailure{"read", EIO}));
}

TEST_F(HidrawReports, FlowAgainWhenADeviceThatHasGoneIsOpened) {
    begin();
    nodes.node()->unplug();
    EXPECT_EQ(run(), RunOutcome::Finished);
    EXPECT_EQ(open(), 0u);
    nodes.node()->send({4});
    passes(1);
    EXPECT_THAT(reports, ElementsAre(Received{4, {4}}));
    nodes.node()->unplug();
    EXPECT_EQ(run(), RunOutcome::Finished);
    EXPECT_EQ(observer->gone.size(), 2u) << "once for each open";
}

TEST_F(HidrawReports, EndMayUnscheduleAndCloseAndReleaseTheDevice) {
    begin();
    observer->whenGone = [this] {
        unschedule();
        close();
        device.reset();
    };
    nodes.node()->unplug();
    EXPECT_EQ(run(), RunOutcome::Finished);
    EXPECT_EQ(observer->gone.size(), 1u);
}

TEST_F(HidrawReports, NeedNoObserver) {
    device = HidrawDevice::create(nodes.opener(), nullptr);
    nodes.errors = {ENODEV};
    EXPECT_EQ(open(), kStatusNoDevice);
    begin();
    nodes.node()->readErrors = {EINVAL};
    nodes.node()->unplug();
    EXPECT_EQ(run(), RunOutcome::Finished);
    unschedule();
}

TEST_F(HidrawReports, LeaveNothingBehindAfterTwoHundredDevices) {
    begin(); // what the loop itself needs is there from now on
    unschedule();
    close();
    const auto before = Tests::openDescriptors();
    for (int round = 0; round < 200; ++round) {
        device = HidrawDevice::create(nodes.opener(), observer);
        begin();
        nodes.node()->send({1});
        passes(1);
        if (round % 4 != 0)
            nodes.node()->unplug();
        if (round % 4 == 1) {
            ASSERT_EQ(run(), RunOutcome::Finished);
        }
        if (round % 2 == 0)
            close();
        unschedule();
        if (round % 4 == 3)
            close();
    }
    device.reset();
    EXPECT_EQ(nodes.node(), nullptr);
    EXPECT_EQ(Tests::openDescriptors(), before);
    EXPECT_EQ(reports.size(), 200u);
}

} // namespace
} // namespace ZorvaTouch::Linux
