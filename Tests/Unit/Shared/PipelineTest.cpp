#include "Shared/Pipeline.h"

#include "Tests/Support/FramesScript.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace ZorvaTouch {
namespace {

using Scripted::electrodes;
using Scripted::eventsText;
using Scripted::firmwareReport;
using Scripted::imageReport;
using Bytes = std::vector<std::uint8_t>;

/// A pipeline whose hooks write down what they are told, one line per call.
class PipelineHooks : public ::testing::Test {
protected:
    PipelineHooks() {
        pipeline.onSetState = [this](std::uint64_t t, const std::string &key, const PropertyValue &) {
            note(t, "setState " + key);
        };
        pipeline.onInputReport = [this](std::uint64_t t, const std::uint8_t *, std::size_t length) {
            note(t, "inputReport " + std::to_string(length));
        };
        pipeline.onMetadata = [this](std::uint64_t t, const std::string &key, const PropertyValue &value) {
            note(t, "metadata " + key + "=" + *value.asString());
        };
        pipeline.onUnhandledReport = [this](std::uint64_t t, const std::uint8_t *, std::size_t length) {
            note(t, "unhandledReport " + std::to_string(length));
        };
        pipeline.onFirmwareEvent = [this](std::uint64_t t, const InputReport::FirmwareEvent *event) {
            note(t, "firmwareEvent " + std::to_string(event->eventCode));
        };
        pipeline.onImage = [this](std::uint64_t t, const InputReport::Image *image) {
            note(t, "image " + std::to_string(image->frameNumber));
        };
        pipeline.onDisjointImage = [this](std::uint64_t t, std::uint32_t previous,
                                          const InputReport::Image *image) {
            note(t, "disjointImage " + std::to_string(previous) + "->" + std::to_string(image->frameNumber));
        };
        pipeline.onHIDEvents = [this](std::uint64_t t, const HostEventList &events) {
            note(t, "events " + eventsText(events));
            batches.push_back(events);
        };
        pipeline.onGetState = [this](const std::string &key) { notes.push_back("getState " + key); };
    }

    void note(std::uint64_t timestamp, const std::string &text) {
        notes.push_back(std::to_string(timestamp) + " " + text);
    }

    void report(std::uint64_t timestamp, const Bytes &bytes) {
        pipeline.handleInputReport(timestamp, bytes.data(), bytes.size());
    }

    std::vector<std::string> takeNotes() { return std::exchange(notes, {}); }

    Pipeline pipeline{Ports::silentLogProvider()};
    std::vector<std::string> notes;
    std::vector<HostEventList> batches;
};

using Notes = std::vector<std::string>;

// --- Images --------------------------------------------------------------------------------------

TEST_F(PipelineHooks, RunInTheOrderOfAnImagesWay) {
    report(10, imageReport(5, 1000));
    EXPECT_EQ(takeNotes(), (Notes{"10 inputReport 73", "10 image 5"}));
    report(11, imageReport(8, 1010, electrodes({{'H', 300}})));
    EXPECT_EQ(takeNotes(),
              (Notes{"11 inputReport 73", "11 image 8", "11 disjointImage 5->8", "11 events may-begin 3"}));
}

TEST_F(PipelineHooks, SeeAnImageBeforeTheRecognizerDoes) {
    int calls = 0;
    const auto expectUntouched = [&] {
        ++calls;
        EXPECT_FALSE(pipeline.algs().handStats().isTouching);
    };
    report(1, imageReport(1, 1000));
    pipeline.onInputReport = [&](auto...) { expectUntouched(); };
    pipeline.onImage = [&](auto...) { expectUntouched(); };
    pipeline.onDisjointImage = [&](auto...) { expectUntouched(); };
    report(2, imageReport(9, 1010, electrodes({{'H', 300}})));
    EXPECT_EQ(calls, 3);
    EXPECT_TRUE(pipeline.algs().handStats().isTouching);
}

TEST_F(PipelineHooks, AreToldOfADisjointImageWithThePreviousNumber) {
    for (const std::uint32_t frameNumber : {5u, 6u, 8u})
        report(frameNumber, imageReport(frameNumber, 1000));
    EXPECT_EQ(pipeline.disjointImageCount(), 1u);
    EXPECT_EQ(takeNotes().back(), "8 disjointImage 6->8");
    report(9, imageReport(9, 1000));
    EXPECT_EQ(pipeline.disjointImageCount(), 1u) << "9 follows 8";
}

TEST_F(PipelineHooks, TheFirstImageIsNeverDisjoint) {
    report(1, imageReport(4000000000, 1000));
    EXPECT_EQ(pipeline.disjointImageCount(), 0u);
    EXPECT_EQ(takeNotes(), (Notes{"1 inputReport 73", "1 image 4000000000"}));
}

TEST_F(PipelineHooks, FrameNumbersWrapWithoutComplaint) {
    report(1, imageReport(0xFFFFFFFF, 1000));
    report(2, imageReport(0, 1010));
    EXPECT_EQ(pipeline.disjointImageCount(), 0u);
}

TEST_F(PipelineHooks, RepeatedAndBackwardNumbersAreDisjoint) {
    for (const std::uint32_t frameNumber : {7u, 7u, 6u, 7u, 0u, 0xFFFFFFFFu})
        report(1, imageReport(frameNumber, 1000));
    EXPECT_EQ(pipeline.disjointImageCount(), 4u) << "7-7, 7-6, 7-0 and 0-FFFFFFFF; 6-7 follows";
}

TEST_F(PipelineHooks, ADisjointImageIsAFrameLikeAnyOther) {
    report(1, imageReport(1, 1000));
    report(2, imageReport(50, 1010, electrodes({{'H', 300}})));
    ASSERT_EQ(batches.size(), 1u);
    EXPECT_EQ(batches[0].at(0)->integerField(0xB001B), 50);
}

TEST_F(PipelineHooks, EventsBearTheReportsTime) {
    report(123456789012345, imageReport(1, 1000, electrodes({{'H', 300}})));
    ASSERT_EQ(batches.size(), 1u);
    EXPECT_EQ(batches[0].at(0)->timestamp(), 123456789012345u);
    EXPECT_EQ(takeNotes().back(), "123456789012345 events may-begin 3");
}

TEST_F(PipelineHooks, AnEmptyBatchIsNotEmitted) {
    report(1, imageReport(1, 1000));
    pipeline.handleHIDEvents(2, {});
    EXPECT_TRUE(batches.empty());
}

TEST_F(PipelineHooks, ABatchIsStampedEvenIfNobodyListens) {
    pipeline.onHIDEvents = nullptr;
    const HostEventList events{Algs::createCancelEvent(), Algs::createTapEvent(kPixelRegionPlayPause)};
    pipeline.handleHIDEvents(99, events);
    EXPECT_EQ(events[0]->timestamp(), 99u);
    EXPECT_EQ(events[1]->timestamp(), 99u);
}

TEST_F(PipelineHooks, ALongerImageReportIsAnImage) {
    Bytes bytes = imageReport(1, 1000, electrodes({{'H', 300}}));
    bytes.resize(80, 0xFF);
    report(1, bytes);
    EXPECT_EQ(takeNotes(), (Notes{"1 inputReport 80", "1 image 1", "1 events may-begin 3"}));
}

// --- Other reports -------------------------------------------------------------------------------

TEST_F(PipelineHooks, ReportsThatAreNeitherKindAreUnhandled) {
    Bytes shortImage = imageReport(1, 1000);
    shortImage.pop_back();
    Bytes shortFirmware = firmwareReport(0);
    shortFirmware.pop_back();
    Bytes otherId = imageReport(1, 1000);
    otherId[0] = 3;
    report(1, shortImage);
    EXPECT_EQ(takeNotes(), (Notes{"1 inputReport 72", "1 unhandledReport 72"}));
    report(2, shortFirmware);
    EXPECT_EQ(takeNotes(), (Notes{"2 inputReport 9", "2 unhandledReport 9"}));
    report(3, otherId);
    EXPECT_EQ(takeNotes(), (Notes{"3 inputReport 73", "3 unhandledReport 73"}));
    EXPECT_EQ(pipeline.resetCount(), 0u);
}

TEST_F(PipelineHooks, AnEmptyReportIsUnhandled) {
    pipeline.handleInputReport(4, nullptr, 0);
    EXPECT_EQ(takeNotes(), (Notes{"4 inputReport 0", "4 unhandledReport 0"}));
}

TEST_F(PipelineHooks, GetTheReportsBytesAsTheyCame) {
    const Bytes bytes{9, 8, 7};
    int calls = 0;
    const auto expectBytes = [&](std::uint64_t, const std::uint8_t *data, std::size_t length) {
        ++calls;
        EXPECT_EQ(data, bytes.data());
        EXPECT_EQ(length, 3u);
    };
    pipeline.onInputReport = expectBytes;
    pipeline.onUnhandledReport = expectBytes;
    report(1, bytes);
    EXPECT_EQ(calls, 2);
}

TEST_F(PipelineHooks, AFirmwareEventThatIsNoResetIsOnlyTold) {
    for (const std::uint8_t code : {std::uint8_t{1}, std::uint8_t{3}, std::uint8_t{255}})
        report(code, firmwareReport(code));
    EXPECT_EQ(takeNotes(), (Notes{"1 inputReport 10", "1 firmwareEvent 1", "3 inputReport 10",
                                  "3 firmwareEvent 3", "255 inputReport 10", "255 firmwareEvent 255"}));
    EXPECT_EQ(pipeline.resetCount(), 0u);
}

TEST_F(PipelineHooks, AFirmwareEventsPayloadIsHandedOver) {
    std::array<std::uint8_t, 8> payload{};
    pipeline.onFirmwareEvent = [&](std::uint64_t, const InputReport::FirmwareEvent *event) {
        payload = event->payload;
    };
    report(1, firmwareReport(3));
    EXPECT_EQ(payload, (std::array<std::uint8_t, 8>{0xF1, 0xF2, 0xF3, 0xF4, 0xF5, 0xF6, 0xF7, 0xF8}));
}

// --- Device resets -------------------------------------------------------------------------------

TEST_F(PipelineHooks, AResetIsCountedAndEmitsTheVendorEvent) {
    report(7, firmwareReport(0));
    EXPECT_EQ(takeNotes(), (Notes{"7 inputReport 10", "7 firmwareEvent 0", "7 events reset"}));
    EXPECT_EQ(pipeline.resetCount(), 1u);
    ASSERT_EQ(batches.size(), 1u);
    const HostEvent &event = *batches[0].at(0);
    EXPECT_EQ(event.timestamp(), 7u);
    EXPECT_EQ(event.options(), 0u);
    EXPECT_EQ(event.phase(), 0);
    ASSERT_NE(event.vendorDefined(), nullptr);
    EXPECT_EQ(event.vendorDefined()->usagePage, 0xFF60);
    EXPECT_EQ(event.vendorDefined()->usage, 2);
    EXPECT_EQ(event.vendorDefined()->version, 0u);
    EXPECT_TRUE(event.vendorDefined()->payload.empty()) << "the firmware's payload stays here";
}

TEST_F(PipelineHooks, AResetInMidTouchCancelsBeforeTheVendorEvent) {
    report(1, imageReport(40, 1000, electrodes({{'H', 300}})));
    report(2, firmwareReport(0));
    EXPECT_EQ(takeNotes().back(), "2 events cancel, reset");
    const HostEventList &batch = batches.back();
    EXPECT_EQ(batch.at(0)->integerField(0xB001B), 0);
    EXPECT_EQ(batch.at(0)->timestamp(), 2u);
    EXPECT_EQ(batch.at(1)->timestamp(), 2u);
    EXPECT_FALSE(batch.at(1)->integerField(0xB001B).has_value());
}

TEST_F(PipelineHooks, AResetInMidTouchWithoutTapSuppressionIsATap) {
    pipeline.setState(0, "Algs.EnableTapSuppression", false);
    report(1, imageReport(40, 1000, electrodes({{'H', 300}})));
    report(2, firmwareReport(0));
    EXPECT_EQ(takeNotes().back(), "2 events tap 3, reset");
}

TEST_F(PipelineHooks, AResetInMidHoldEndsTheHold) {
    report(1, imageReport(40, 1000, electrodes({{'K', 400}})));
    report(2, imageReport(41, 1501, electrodes({{'K', 400}})));
    EXPECT_EQ(takeNotes().back(), "2 events hold-start 1");
    report(3, firmwareReport(0));
    EXPECT_EQ(takeNotes().back(), "3 events hold-end 1, reset");
}

TEST_F(PipelineHooks, AResetTellsTheFirmwareEventBeforeItCounts) {
    std::uint32_t countThen = 99;
    bool touchingThen = false;
    pipeline.onFirmwareEvent = [&](auto...) {
        countThen = pipeline.resetCount();
        touchingThen = pipeline.algs().handStats().isTouching;
    };
    report(1, imageReport(40, 1000, electrodes({{'H', 300}})));
    report(2, firmwareReport(0));
    EXPECT_EQ(countThen, 0u);
    EXPECT_TRUE(touchingThen);
}

TEST_F(PipelineHooks, AResetDoesNotForgiveTheNextFrameNumber) {
    report(1, imageReport(40, 1000));
    report(2, firmwareReport(0));
    report(3, imageReport(1, 5));
    EXPECT_EQ(pipeline.disjointImageCount(), 1u);
    EXPECT_EQ(takeNotes().back(), "3 disjointImage 40->1");
    report(4, firmwareReport(0));
    report(5, imageReport(2, 15));
    EXPECT_EQ(pipeline.disjointImageCount(), 1u) << "2 follows 1, reset or not";
    EXPECT_EQ(pipeline.resetCount(), 2u);
}

TEST_F(PipelineHooks, AResetBeforeAnyImageLeavesTheFirstImageFirst) {
    report(1, firmwareReport(0));
    report(2, imageReport(77, 5));
    EXPECT_EQ(pipeline.disjointImageCount(), 0u);
}

// --- State ---------------------------------------------------------------------------------------

TEST_F(PipelineHooks, StateKeysOfTheRecognizersDomainReachIt) {
    pipeline.setState(5, "Algs.HoldTimeoutMilliseconds", 750u);
    EXPECT_EQ(pipeline.getState("Algs.HoldTimeoutMilliseconds"), PropertyValue(750u));
    EXPECT_EQ(takeNotes(),
              (Notes{"5 setState Algs.HoldTimeoutMilliseconds", "getState Algs.HoldTimeoutMilliseconds"}));
}

TEST_F(PipelineHooks, AreToldOfAWriteBeforeItIsApplied) {
    PropertyValue before;
    PropertyValue told;
    pipeline.onSetState = [&](std::uint64_t, const std::string &, const PropertyValue &value) {
        before = pipeline.algs().getState("HoldTimeoutMilliseconds");
        told = value;
    };
    pipeline.setState(5, "Algs.HoldTimeoutMilliseconds", 750u);
    EXPECT_EQ(before, PropertyValue(500u));
    EXPECT_EQ(told, PropertyValue(750u));
}

TEST_F(PipelineHooks, KeysOfOtherDomainsAreToldAndIgnored) {
    for (const char *key : {"Pipeline.x", "Pipeline.Algs.ActivationThreshold", "algs.ActivationThreshold",
                            "Algs", "AlgsActivationThreshold", "ActivationThreshold", "",
                            "Algs.Algs.ActivationThreshold", "DebugInfo"}) {
        pipeline.setState(5, key, 1u);
        EXPECT_EQ(takeNotes(), (Notes{"5 setState " + std::string(key)}));
    }
    EXPECT_EQ(pipeline.getState("Algs.ActivationThreshold"), PropertyValue(200.0));
}

TEST_F(PipelineHooks, UnknownKeysReadAsNullAndAreTold) {
    for (const char *key : {"", "Algs", "Algs.", "Algs.x", "algs.ActivationThreshold", "ActivationThreshold",
                            "debuginfo", "DebugInfo.x", "DebugInfo ", "Pipeline.DebugInfo", "ResetCount"}) {
        EXPECT_TRUE(pipeline.getState(key).isNull()) << key;
        EXPECT_EQ(takeNotes(), (Notes{"getState " + std::string(key)}));
    }
}

TEST_F(PipelineHooks, DebugInfoHasBothCounters) {
    EXPECT_EQ(pipeline.getState("DebugInfo"),
              PropertyValue(PropertyValue::Dictionary{{"DisjointImageCount", 0u}, {"ResetCount", 0u}}));
    report(1, firmwareReport(0));
    for (const std::uint32_t frameNumber : {5u, 7u, 9u})
        report(2, imageReport(frameNumber, 1000));
    EXPECT_EQ(pipeline.getState("DebugInfo"),
              PropertyValue(PropertyValue::Dictionary{{"DisjointImageCount", 2u}, {"ResetCount", 1u}}));
}

TEST_F(PipelineHooks, TheRecognizersDebugInfoIsAnother) {
    const PropertyValue info = pipeline.getState("Algs.DebugInfo");
    ASSERT_NE(info.asDictionary(), nullptr);
    EXPECT_EQ(info.asDictionary()->size(), 1u);
    EXPECT_NE(info.find("EventStats"), nullptr);
}

TEST_F(PipelineHooks, TheOutputViewReachesTheSameState) {
    const PipelineOutput &output = pipeline;
    EXPECT_EQ(output.getState("Algs.HoldTimeoutMilliseconds"), PropertyValue(500u));
}

TEST_F(PipelineHooks, MetadataGoesToItsHookOnly) {
    pipeline.handleMetadata(6, "Accel", "burst");
    EXPECT_EQ(takeNotes(), (Notes{"6 metadata Accel=burst"}));
}

// --- Without hooks, and with hooks that fail -----------------------------------------------------

TEST(Pipeline, WorksWithoutHooks) {
    Pipeline pipeline(Ports::silentLogProvider());
    for (const Bytes &bytes : {imageReport(1, 1000, electrodes({{'H', 300}})), imageReport(9, 1020),
                               firmwareReport(0), firmwareReport(3), Bytes{1, 2}})
        pipeline.handleInputReport(1, bytes.data(), bytes.size());
    pipeline.handleInputReport(2, nullptr, 0);
    pipeline.setState(3, "Algs.ActivationThreshold", 100u);
    pipeline.handleMetadata(4, "note", PropertyValue());
    EXPECT_EQ(pipeline.getState("Algs.ActivationThreshold"), PropertyValue(100.0));
    EXPECT_EQ(pipeline.resetCount(), 1u);
    EXPECT_EQ(pipeline.disjointImageCount(), 1u);
    EXPECT_EQ(pipeline.algs().eventStats().numTaps, 1u);
}

/// Sets a hook that throws and makes the pipeline call it.
struct FailingHook {
    const char *name;
    void (*provoke)(Pipeline &);
};

template <typename... Arguments> void fail(Arguments...) { throw std::runtime_error("a hook has failed"); }

void feed(Pipeline &pipeline, const Bytes &bytes) {
    pipeline.handleInputReport(1, bytes.data(), bytes.size());
}

constexpr FailingHook kFailingHooks[] = {
    {"onSetState",
     [](Pipeline &p) {
         p.onSetState = [](auto...) { fail(); };
         p.setState(1, "x", true);
     }},
    {"onInputReport",
     [](Pipeline &p) {
         p.onInputReport = [](auto...) { fail(); };
         feed(p, {9});
     }},
    {"onMetadata",
     [](Pipeline &p) {
         p.onMetadata = [](auto...) { fail(); };
         p.handleMetadata(1, "x", true);
     }},
    {"onUnhandledReport",
     [](Pipeline &p) {
         p.onUnhandledReport = [](auto...) { fail(); };
         feed(p, {9});
     }},
    {"onFirmwareEvent",
     [](Pipeline &p) {
         p.onFirmwareEvent = [](auto...) { fail(); };
         feed(p, firmwareReport(3));
     }},
    {"onImage",
     [](Pipeline &p) {
         p.onImage = [](auto...) { fail(); };
         feed(p, imageReport(1, 1000));
     }},
    {"onDisjointImage",
     [](Pipeline &p) {
         p.onDisjointImage = [](auto...) { fail(); };
         feed(p, imageReport(1, 1000));
         feed(p, imageReport(3, 1000));
     }},
    {"onHIDEvents",
     [](Pipeline &p) {
         p.onHIDEvents = [](auto...) { fail(); };
         feed(p, firmwareReport(0));
     }},
    {"onGetState",
     [](Pipeline &p) {
         p.onGetState = [](auto...) { fail(); };
         (void)p.getState("DebugInfo");
     }},
};

TEST(PipelineDeathTest, AHookThatThrowsEndsTheProcess) {
    for (const FailingHook &hook : kFailingHooks) {
        SCOPED_TRACE(hook.name);
        EXPECT_DEATH(
            {
                Pipeline pipeline(Ports::silentLogProvider());
                hook.provoke(pipeline);
            },
            "a hook has failed");
    }
}

} // namespace
} // namespace ZorvaTouch
