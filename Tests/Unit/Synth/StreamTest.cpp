#include "Synth/Stream.h"

#include "Shared/InputReport.h"
#include "Shared/RecordingContainer.h"
#include "Synth/Labels.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <optional>

namespace ZorvaTouch::Synth {
namespace {

using InputReport::FirmwareEvent;
using InputReport::Image;

const Scenario &scenario(std::string_view name) { return *scenarioNamed(name); }

FrameList record(std::string_view name, double seconds, std::uint64_t seed = 1) {
    return synthesize(scenario(name), parametersOf(scenario(name)), seed, seconds);
}

std::optional<Image> imageOf(const FrameView &frame) {
    return Image::parse(frame.data.data(), frame.data.size());
}

bool isReset(const FrameView &frame) {
    return FirmwareEvent::parse(frame.data.data(), frame.data.size()).has_value();
}

std::vector<Image> imagesOf(const FrameList &frames) {
    std::vector<Image> images;
    for (const FrameView &frame : frames)
        if (const auto image = imageOf(frame))
            images.push_back(*image);
    return images;
}

std::vector<PropertyValue> labelsIn(const FrameList &frames) {
    std::vector<PropertyValue> labels;
    for (const FrameView &frame : frames)
        if (frame.type == FrameType::Metadata && frame.key == kLabelKey)
            labels.push_back(frame.value);
    return labels;
}

std::uint64_t msIn(const PropertyValue &label, const char *key) { return *label.find(key)->asUnsigned(); }

TEST(SynthStream, TheSameSeedGivesTheSameBytes) {
    EXPECT_EQ(writeRecordingContainer(record("day", 20)), writeRecordingContainer(record("day", 20)));
    EXPECT_NE(writeRecordingContainer(record("day", 20)), writeRecordingContainer(record("day", 20, 2)));
}

TEST(SynthStream, ALongerRecordingBeginsLikeAShorterOne) {
    const FrameList shorter = record("idle", 5), longer = record("idle", 10);
    ASSERT_LT(shorter.size(), longer.size());
    for (std::size_t i = 0; i < shorter.size(); ++i)
        ASSERT_EQ(shorter[i].toFrame(), longer[i].toFrame());
}

TEST(SynthStream, FramesAreInOrderOfTime) {
    Parameters parameters;
    parameters.accelRate = 70;
    std::uint64_t lastNs = 0;
    for (const FrameView &frame : synthesize(scenario("resets"), parameters, 1, 30)) {
        EXPECT_GE(frame.timestampNs, lastNs);
        lastNs = frame.timestampNs;
    }
}

TEST(SynthStream, Gives100ImagesASecond) {
    EXPECT_NEAR(static_cast<double>(imagesOf(record("taps", 60)).size()), 6000, 1);
}

TEST(SynthStream, ImagesAreNumberedFrom0AndTimed) {
    const std::vector<Image> images = imagesOf(record("idle", 10));
    for (std::size_t i = 0; i < images.size(); ++i) {
        EXPECT_EQ(images[i].frameNumber, i);
        // The first measurement is a period after the beginning; jitter is far below 2 ms.
        EXPECT_NEAR(static_cast<double>(images[i].timeMs), 10.0 * static_cast<double>(i + 1), 2);
    }
}

TEST(SynthStream, UntouchedSignalsAreSmallNoise) {
    Parameters parameters;
    parameters.noise = 3;
    parameters.commonNoise = 4;
    parameters.drift = 0;
    double squares = 0, count = 0;
    for (const Image &image : imagesOf(synthesize(scenario("idle"), parameters, 1, 100)))
        for (const std::int16_t signal : image.signals) {
            squares += signal * signal;
            ++count;
        }
    // sqrt(3^2 + 4^2) = 5; rounding and the baseline, which follows the noise a little, add some
    EXPECT_NEAR(std::sqrt(squares / count), 5.05, 0.1);
}

TEST(SynthStream, RawCountsAreBaselinePlusSignal) {
    for (const Image &image : imagesOf(record("taps", 10)))
        for (std::size_t i = 0; i < kElectrodeCount; ++i)
            EXPECT_NEAR(image.rawCounts[i] - image.signals[i], 20000, 5000);
}

TEST(SynthStream, ContactsAreWhereTheLabelsSay) {
    const FrameList frames = record("taps", 60);
    const std::vector<Image> images = imagesOf(frames);
    const std::vector<PropertyValue> labels = labelsIn(frames);
    ASSERT_GT(labels.size(), 30u);
    const auto strongestDuring = [&](std::uint64_t fromMs, std::uint64_t toMs) {
        std::int16_t strongest = 0;
        for (const Image &image : images)
            if (image.timeMs > fromMs && image.timeMs < toMs)
                strongest =
                    std::max(strongest, *std::max_element(image.signals.begin(), image.signals.end()));
        return strongest;
    };
    std::uint64_t untouchedSince = 0;
    for (const PropertyValue &label : labels) {
        EXPECT_GT(strongestDuring(msIn(label, "StartMs"), msIn(label, "EndMs")), 100);
        EXPECT_LT(strongestDuring(untouchedSince, msIn(label, "StartMs")),
                  35); // five times all noise together, and
                       // what the baseline has missed
        untouchedSince = msIn(label, "EndMs") + 10;
    }
}

TEST(SynthStream, ALabelFollowsItsContactAtOnce) {
    std::uint32_t lastMs = 0;
    for (const FrameView &frame : record("taps", 60)) {
        if (const auto image = imageOf(frame))
            lastMs = image->timeMs;
        else
            EXPECT_NEAR(static_cast<double>(msIn(frame.value, "EndMs")), lastMs, 12);
    }
}

TEST(SynthStream, NothingTouchesBeforeTheBaselineIsFound) {
    for (const Scenario &each : scenarios())
        for (const PropertyValue &label : labelsIn(synthesize(each, parametersOf(each), 3, 15)))
            if (*label.find("Kind")->asString() != "Remainder") {
                EXPECT_GE(msIn(label, "StartMs"), each.name == "resets" ? 0u : 300u) << each.name;
            }
}

TEST(SynthStream, ARecordingEndsUntouched) {
    for (const Scenario &each : scenarios())
        for (const PropertyValue &label : labelsIn(synthesize(each, parametersOf(each), 2, 12)))
            EXPECT_LE(msIn(label, "EndMs"), 11'800u) << each.name;
}

TEST(SynthStream, ALoudSensorIsTouchedAtTheSameTimes) {
    Parameters parameters = parametersOf(scenario("day"));
    const std::vector<PropertyValue> usual = labelsIn(synthesize(scenario("day"), parameters, 4, 60));
    parameters.noise = 50;
    parameters.drift = 50;
    parameters.accelRate = 100;
    const std::vector<PropertyValue> loud = labelsIn(synthesize(scenario("day"), parameters, 4, 60));
    EXPECT_GT(usual.size(), 5u);
    EXPECT_EQ(usual, loud);
}

TEST(SynthStream, DropsAndRepeatsItsShareOfImages) {
    Parameters parameters;
    parameters.dropRate = 5;
    parameters.repeatRate = 3;
    std::size_t missing = 0, repeated = 0;
    std::optional<Image> last;
    for (const Image &image : imagesOf(synthesize(scenario("idle"), parameters, 1, 200))) {
        if (last && image.frameNumber == last->frameNumber) {
            ++repeated;
            EXPECT_EQ(image.timeMs, last->timeMs);
            EXPECT_EQ(image.signals, last->signals);
        } else if (last) {
            missing += image.frameNumber - last->frameNumber - 1;
        }
        last = image;
    }
    EXPECT_NEAR(static_cast<double>(missing), 1000, 125); // of 20000
    EXPECT_NEAR(static_cast<double>(repeated), 570, 95);  // of those that arrive
}

TEST(SynthStream, AfterAResetTheDeviceBootsAndCountsFrom0) {
    const FrameList frames = record("resets", 20);
    std::size_t resets = 0;
    std::uint64_t resetNs = 0;
    for (const FrameView &frame : frames) {
        if (frame.type == FrameType::InputReport && isReset(frame)) {
            ++resets;
            resetNs = frame.timestampNs;
            EXPECT_EQ(frame.data[1], FirmwareEvent::kDeviceReset);
        } else if (const auto image = imageOf(frame); image && resetNs != 0) {
            EXPECT_EQ(image->frameNumber, 0u);
            EXPECT_GE(image->timeMs, 60u);
            EXPECT_LE(image->timeMs, 72u);
            EXPECT_GT(frame.timestampNs, resetNs + 59'000'000);
            resetNs = 0;
        }
    }
    EXPECT_GE(resets, 5u);
}

TEST(SynthStream, AResetCutsAContactInTwoLabels) {
    const FrameList frames = record("resets", 60);
    std::optional<PropertyValue> lastLabel;
    std::uint32_t lastMs = 0;
    std::size_t resets = 0, remainders = 0;
    for (const FrameView &frame : frames) {
        if (const auto image = imageOf(frame)) {
            lastMs = image->timeMs;
        } else if (frame.type == FrameType::Metadata) {
            lastLabel = frame.value;
            if (*frame.value.find("Kind")->asString() == "Remainder") {
                ++remainders;
                EXPECT_EQ(msIn(frame.value, "StartMs"), 0u);
            }
        } else {
            ++resets;
            ASSERT_TRUE(lastLabel);
            EXPECT_NEAR(static_cast<double>(msIn(*lastLabel, "EndMs")), lastMs, 12); // right before the reset
        }
    }
    EXPECT_EQ(remainders, resets);
}

TEST(SynthStream, AFingerThatLiesThroughAResetVanishes) {
    Parameters parameters;
    parameters.noise = parameters.commonNoise = 0;
    std::int16_t strongest = 0, weakest = 0;
    bool hasReset = false;
    for (const FrameView &frame :
         synthesize(scenario("resets"), parameters, 12, 3)) { // a hold, 613 ms and 200 after
        if (const auto image = imageOf(frame); image && hasReset) {
            strongest = std::max(strongest, *std::max_element(image->signals.begin(), image->signals.end()));
            weakest = std::min(weakest, *std::min_element(image->signals.begin(), image->signals.end()));
        }
        if (frame.type == FrameType::Metadata && hasReset)
            break; // the finger has been lifted
        hasReset = hasReset || (frame.type == FrameType::InputReport && isReset(frame));
    }
    EXPECT_TRUE(hasReset);
    EXPECT_LT(strongest, 60); // its tremor
    EXPECT_LT(weakest, -100); // as it is lifted
}

TEST(SynthStream, AccelerometerSamplesComeWhenAskedFor) {
    Parameters parameters;
    parameters.accelRate = 50;
    std::size_t samples = 0;
    for (const FrameView &frame : synthesize(scenario("taps"), parameters, 1, 10)) {
        if (frame.key != kAccelKey)
            continue;
        ++samples;
        EXPECT_EQ(frame.type, FrameType::Metadata);
        EXPECT_EQ(frame.value.asDictionary()->size(), 3u);
    }
    EXPECT_NEAR(static_cast<double>(samples), 500, 1);
}

TEST(SynthStream, GoesOnForEver) {
    Stream stream(scenario("day"), parametersOf(scenario("day")), 1, Script::kForEver, 77);
    std::size_t labels = 0;
    Frame frame = stream.next();
    EXPECT_GE(frame.timestampNs, 77u);
    while (stream.now() < 1'800'000'000) { // half an hour; a day's recording is two minutes
        frame = stream.next();
        labels += frame.key == kLabelKey;
    }
    EXPECT_GT(labels, 150u);
}

} // namespace
} // namespace ZorvaTouch::Synth
