#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

namespace ZorvaTouch {
namespace {

using namespace Testing;
using Scripted::electrodes;
using Scripted::firmwareReport;
using Scripted::imageReport;
using Points = std::vector<TracePoint>;

class InputReports : public ServiceTest {
protected:
    InputReports() {
        run();
        platform.journal.clear();
    }

    Lines lines() { return platform.journal.linesOfOthers(); }
};

// --- Logs ------------------------------------------------------------------------------------------

TEST_F(InputReports, OfAnImageAreLoggedOnTheirWay) {
    deliver(imageReport(7, 100), 4711);
    EXPECT_EQ(lines(),
              (Lines{"debug Received input report (type 0, reportID 1, reportLength 73, timestampMach 4711)",
                     "debug Input report probe", "debug Received image frame: 7"}));
}

TEST_F(InputReports, WithEventsLogTheHandOver) {
    deliver(imageReport(1, 0, electrodes({{'A', 300}})), 5);
    EXPECT_EQ(lines(),
              (Lines{"debug Received input report (type 0, reportID 1, reportLength 73, timestampMach 5)",
                     "debug Input report probe", "debug Received image frame: 1",
                     "debug HID events probe: 1 event(s)", "debug Dispatch 1 event(s) takeoff"}));
}

TEST_F(InputReports, ThatAreDisjointAreAnErrorWithTwoLineBreaks) {
    deliver(imageReport(4294967295, 0));
    deliver(imageReport(0, 10)); // follows
    EXPECT_TRUE(platform.journal.errors().empty());
    deliver(imageReport(0, 20));
    deliver(imageReport(5, 30));
    EXPECT_EQ(platform.journal.errors(), (Lines{"Disjoint image (frame number: 0 -> 0)\n\n",
                                                "Disjoint image (frame number: 0 -> 5)\n\n"}));
}

TEST_F(InputReports, OfTheFirmwareAreLoggedAtTheDefaultLevel) {
    platform.journal.setLevel(Ports::LogLevel::Default);
    deliver(firmwareReport(0xAB));
    EXPECT_EQ(lines(), (Lines{"default Firmware event probe; event: ab, context: f1f2f3f4f5f6f7f8"}));
}

TEST_F(InputReports, OfTheFirmwareWithoutAPayloadHaveAContextOfZero) {
    deliver({2, 1, 0, 0, 0, 0, 0, 0, 0, 0});
    EXPECT_EQ(lines().back(), "default Firmware event probe; event: 1, context: 0");
}

TEST_F(InputReports, OfAnotherKindAreLoggedByTheirId) {
    deliver({9, 1});
    EXPECT_EQ(lines().back(), "debug Invalid input report with ID 9");
    deliver({255});
    EXPECT_EQ(lines().back(), "debug Invalid input report with ID 255");
    deliver({1, 0}); // an image that is too short
    EXPECT_EQ(lines().back(), "debug Invalid input report with ID 1");
}

TEST_F(InputReports, OfNoLengthReachThePipeline) {
    deliver({}, 3);
    EXPECT_EQ(lines(),
              (Lines{"debug Received input report (type 0, reportID 0, reportLength 0, timestampMach 3)",
                     "debug Input report probe", "debug Invalid input report len==0"}));
}

// --- Trace points ----------------------------------------------------------------------------------

TEST_F(InputReports, AreTracedWithTheirFirstFourBytes) {
    deliver({9, 8, 7, 6, 5});
    deliver({9, 255});
    deliver({});
    EXPECT_EQ(platform.traces.points(),
              (Points{{0x2B150180, {9, 8, 7, 6}}, {0x2B150180, {9, 255, 0, 0}}, {0x2B150180, {0, 0, 0, 0}}}));
}

TEST_F(InputReports, OfTheFirmwareAreTracedWithCodeAndContext) {
    deliver(firmwareReport(0x7F));
    EXPECT_EQ(platform.traces.points(),
              (Points{{0x2B150180, {2, 0x7F, 0xF1, 0xF2}}, {0x2B15018C, {0x7F, 0xF1F2F3F4F5F6F7F8, 0, 0}}}));
}

// --- What the device says beside ---------------------------------------------------------------------

class ReportsOfAProbe : public ServiceTest {
protected:
    ReportsOfAProbe() {
        start(offered.get());
        schedule();
    }

    const Ref<ProbeDevice> probe = ProbeDevice::create();
    const Ref<ProbeService> offered = ProbeService::create(probe.get());
};

TEST_F(ReportsOfAProbe, HaveAnIdOfEightBits) {
    const Bytes report = firmwareReport(1);
    probe->report(0xFFFFFFFF, 0x102, report.data(), report.size(), 0xFFFFFFFFFFFFFFFF);
    EXPECT_EQ(platform.journal.count("debug Received input report (type 4294967295, reportID 2, "
                                     "reportLength 10, timestampMach 18446744073709551615)"),
              1u);
}

TEST_F(ReportsOfAProbe, WithoutBytesCountAsEmpty) {
    probe->report(0, 1, nullptr, 0, 0);
    EXPECT_EQ(platform.journal.linesOfOthers().back(), "debug Invalid input report len==0");
    probe->report(0, 1, nullptr, 73, 0);
    EXPECT_EQ(platform.journal.linesOfOthers().back(), "debug Invalid input report len==0");
}

TEST_F(ReportsOfAProbe, LongerThanTheBufferAreTakenWhole) {
    const Bytes report(2000, 9);
    probe->report(0, 9, report.data(), report.size(), 0);
    EXPECT_EQ(platform.journal.count(
                  "debug Received input report (type 0, reportID 9, reportLength 2000, timestampMach 0)"),
              1u);
}

// --- Their time --------------------------------------------------------------------------------------

TEST_F(InputReports, HaveTheTimeAtWhichTheyAreHandled) {
    platform.testClock.ticks = 5'000;
    deliver(imageReport(1, 0, electrodes({{'A', 300}})), 77);
    queue->runAll();
    ASSERT_EQ(events.calls().size(), 1u);
    EXPECT_EQ(events.calls()[0].timestamp, 5'000u);
}

class ReportsInOtherTicks : public ServiceTest {
protected:
    ReportsInOtherTicks() : ServiceTest({125, 3}) { run(); }
};

TEST_F(ReportsInOtherTicks, AreRecordedInNanosecondsAndDispatchedInTicks) {
    platform.testClock.ticks = 24'000; // 24000 * 125 / 3 ns
    deliver(imageReport(1, 0, electrodes({{'A', 300}})), 0);
    queue->runAll();
    EXPECT_EQ(events.calls().at(0).timestamp, 24'000u);
    const PropertyValue recording = get("Recording");
    ASSERT_TRUE(recording.asString());
    EXPECT_NE(recording.asString()->find(R"("Timestamp":1000000,)"), std::string::npos)
        << recording.asString()->substr(0, 100);
}

} // namespace
} // namespace ZorvaTouch
