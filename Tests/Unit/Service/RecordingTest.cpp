#include "Shared/PipelineRecording.h"
#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <string>

namespace ZorvaTouch {
namespace {

using namespace Testing;

class ServiceRecording : public ServiceTest {
protected:
    /// Reports of one byte on the input-report thread, at the times that follow the last one.
    void report(int count) {
        for (int number = 0; number < count; ++number) {
            platform.testClock.ticks = ++_time;
            probe->report(0, 9, &kReport, 1, 0);
        }
    }
    PipelineRecording recording() {
        const PropertyValue text = get("Recording");
        return {*text.asString(), platform.testClock};
    }

    static constexpr std::uint8_t kReport = 9;
    const Ref<ProbeDevice> probe = ProbeDevice::create();
    const Ref<ProbeService> offered = ProbeService::create(probe.get());

private:
    std::uint64_t _time = 0;
};

TEST_F(ServiceRecording, IsTheJsonOfWhatCameIn) {
    run();
    platform.testClock.ticks = 1'000;
    deliver({9, 0xAB}, 7);
    platform.testClock.ticks = 2'000;
    set("Pipeline.Algs.HoldTimeoutMilliseconds", std::uint32_t{300});
    EXPECT_EQ(
        get("Recording"),
        PropertyValue(R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1000,"Data":"09 ab "},)"
                      R"({"Type":"State","Timestamp":2000,"Key":"Algs.HoldTimeoutMilliseconds",)"
                      R"("Value":300}]})"));
}

TEST_F(ServiceRecording, GoesOnWhenItIsWritten) {
    run();
    EXPECT_TRUE(set("Recording", "off"));
    EXPECT_EQ(device->properties().get("Recording"), PropertyValue("off"));
    deliver({9});
    EXPECT_EQ(recording().frames().size(), 1u);
}

TEST_F(ServiceRecording, OutlivesAnUnscheduleAndAStop) {
    run();
    deliver({9});
    unschedule();
    (*plugIn)->Stop(plugIn);
    EXPECT_EQ(recording().frames().size(), 1u);
}

TEST_F(ServiceRecording, ReadsAsTheLatest4350Frames) {
    platform.journal.setLevel(Ports::LogLevel::Error);
    start(offered.get());
    schedule();
    report(4'400);
    const PipelineRecording first = recording();
    ASSERT_EQ(first.frames().size(), 4'350u);
    EXPECT_EQ((*first.frames().begin()).timestampNs, 51u);
    report(4'300); // 8700 in all: trimmed to 4350 as they come
    const PipelineRecording second = recording();
    ASSERT_EQ(second.frames().size(), 4'350u);
    EXPECT_EQ((*second.frames().begin()).timestampNs, 4'351u);
}

TEST_F(ServiceRecording, KeepsTheStateThatStillMattersWhenItIsTrimmed) {
    platform.journal.setLevel(Ports::LogLevel::Error);
    start(offered.get());
    schedule();
    set("Pipeline.Algs.ActivationThreshold", std::uint32_t{100});
    report(4'400);
    const PipelineRecording read = recording();
    ASSERT_EQ(read.frames().size(), 4'351u);
    EXPECT_EQ((*read.frames().begin()).toFrame().key, "Algs.ActivationThreshold");
}

} // namespace
} // namespace ZorvaTouch
