#include "Fuzz/Transcript.h"

#include <array>
#include <bit>
#include <fuzzer/FuzzedDataProvider.h>
#include <string>
#include <vector>

// State writes of every kind of value to every key, mixed with images and firmware events: nothing crashes,
// the recording replays to the same text, and a bounded recording keeps its tunables.

using namespace ZorvaTouch;

namespace {

constexpr const char *kKeys[] = {"Algs.EnableHoldSuppression",
                                 "Algs.EnableTapSuppression",
                                 "Algs.HoldTimeoutMilliseconds",
                                 "Algs.ActivationThreshold",
                                 "Algs.ResetEventStats",
                                 "Algs.EventStats",
                                 "Algs.VirtualNormalizationFactors.0",
                                 "Algs.VirtualNormalizationFactors.19",
                                 "Algs.VirtualNormalizationFactors.23",
                                 "DebugInfo"};

PropertyValue makeValue(FuzzedDataProvider &input) {
    switch (input.ConsumeIntegralInRange(0, 8)) {
    case 0:
        return input.ConsumeBool();
    case 1:
        return input.ConsumeIntegral<std::uint64_t>();
    case 2:
        return std::bit_cast<double>(input.ConsumeIntegral<std::uint64_t>());
    case 3:
        return std::bit_cast<float>(input.ConsumeIntegral<std::uint32_t>());
    case 4:
        return input.ConsumeRandomLengthString(8);
    case 5:
        return input.ConsumeBytes<std::uint8_t>(4);
    case 6:
        return PropertyValue::Array{input.ConsumeBool(), "x"};
    case 7:
        return PropertyValue::Dictionary{{"x", input.ConsumeIntegral<std::uint64_t>()}};
    default:
        return {};
    }
}

std::vector<std::uint8_t> makeImage(FuzzedDataProvider &input, std::uint32_t frameNumber,
                                    std::uint32_t timeMs) {
    InputReport::Image image{};
    image.frameNumber = frameNumber;
    image.timeMs = timeMs;
    for (std::int16_t &signal : image.signals)
        signal = input.ConsumeIntegral<std::int16_t>();
    const auto report = image.toReport();
    return {report.begin(), report.end()};
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    FuzzedDataProvider input(data, size);
    Fuzzing::StillClock clock;
    Fuzzing::TranscribedPipeline live;
    PipelineRecording recording(clock);
    recording.pipeline = live.pipeline();
    PipelineRecording bounded(clock);
    bounded.setMaxFrameCount(input.ConsumeIntegralInRange<std::uint64_t>(0, 8));

    std::uint64_t now = 0;
    std::uint32_t timeMs = 0;
    std::uint32_t frameNumber = 0;
    while (input.remaining_bytes() > 0) {
        now += input.ConsumeIntegral<std::uint16_t>() * std::uint64_t{1000};
        if (input.ConsumeBool()) {
            const std::string key = input.ConsumeBool() ? input.PickValueInArray(kKeys)
                                                        : "Algs." + input.ConsumeRandomLengthString(12);
            const PropertyValue value = makeValue(input);
            recording.setState(now, key, value);
            bounded.setState(now, key, value);
            continue;
        }
        timeMs += input.ConsumeIntegral<std::uint8_t>();
        const auto report = input.ConsumeIntegralInRange(0, 15) == 0
                                ? std::vector<std::uint8_t>{2, 0, 0, 0, 0, 0, 0, 0, 0, 0}
                                : makeImage(input, ++frameNumber, timeMs);
        recording.handleInputReport(now, report.data(), report.size());
        bounded.handleInputReport(now, report.data(), report.size());
    }

    Fuzzing::TranscribedPipeline replayed;
    replayed.play(recording.frames());
    ZORVA_MUST(live.text() == replayed.text());

    Fuzzing::TranscribedPipeline fromBounded;
    fromBounded.play(bounded.frames());
    ZORVA_MUST(live.tunables() == fromBounded.tunables());
    ZORVA_MUST(!recording.json().empty());
    return 0;
}
