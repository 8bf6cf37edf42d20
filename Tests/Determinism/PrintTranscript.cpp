#include "Shared/Pipeline.h"
#include "Shared/Util/Json.h"

#include <array>
#include <bit>
#include <cstdio>
#include <limits>
#include <string>

// Prints everything that the recognizer says about a fixed, hard stimulus: odd thresholds and factors,
// fingers, palms and noise. Two builds of the core agree if this prints the same bytes.

using namespace ZorvaTouch;

namespace {

constexpr std::uint32_t kFrameCount = 20000;

class Noise {
public:
    std::uint32_t bits() {
        _state = _state * 6364136223846793005u + 1442695040888963407u;
        return static_cast<std::uint32_t>(_state >> 33);
    }
    int below(int limit) { return static_cast<int>(bits() % static_cast<std::uint32_t>(limit)); }

private:
    std::uint64_t _state = 20;
};

/// A blob of some strength and width around an electrode, over noise; now and then any bits at all.
InputReport::Image makeImage(Noise &noise, std::uint32_t frame, std::uint32_t timeMs) {
    InputReport::Image image{};
    image.frameNumber = frame;
    image.timeMs = timeMs;
    const bool isWild = noise.below(200) == 0;
    const bool isPressed = (frame / 37) % 3 != 0;
    const int strength = 80 + noise.below(60) + static_cast<int>(frame % 700);
    const int width = 40 + static_cast<int>(frame / 300 % 7) * 40;
    const int centre = static_cast<int>(frame / 11 % kElectrodeCount);
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        const int distance =
            static_cast<int>(i) > centre ? static_cast<int>(i) - centre : centre - static_cast<int>(i);
        const int blob = isPressed ? strength - distance * width : 0;
        const int signal =
            isWild ? static_cast<int>(noise.bits()) : (blob > 0 ? blob : 0) + noise.below(15) - 7;
        image.signals[i] = static_cast<std::int16_t>(signal);
    }
    return image;
}

/// What is tuned at which frame; most of the run has the defaults.
void tune(Pipeline &pipeline, std::uint32_t frame) {
    constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
    constexpr std::array<float, 8> kThresholds{200.0f, 123.4f, 200.0f, 0.0f, -3.5f, kNan, 1e-38f, 200.0f};
    if (frame % 2500 == 0)
        pipeline.setState(0, "Algs.ActivationThreshold", kThresholds[frame / 2500]);
    if (frame % 900 == 450)
        pipeline.setState(0, "Algs.VirtualNormalizationFactors." + std::to_string(frame / 900),
                          0.123f + static_cast<float>(frame));
    if (frame % 1111 == 0)
        pipeline.setState(0, "Algs.EnableHoldSuppression", frame % 2222 == 0);
}

void print(const std::string &text) { std::puts(text.c_str()); }

} // namespace

int main() {
    Pipeline pipeline(Ports::silentLogProvider());
    pipeline.onHIDEvents = [](std::uint64_t, const HostEventList &events) {
        for (const auto &event : events)
            print(jsonText(*event));
    };
    Noise noise;
    std::uint32_t timeMs = 0xFFFFF000u; // wraps on the way
    for (std::uint32_t frame = 0; frame < kFrameCount; ++frame) {
        tune(pipeline, frame);
        const InputReport::Image image = makeImage(noise, frame, timeMs);
        const auto report = image.toReport();
        timeMs += 8 + noise.bits() % 5;
        pipeline.handleInputReport(0, report.data(), report.size());
        print(pipeline.algs().touchStateDescription(image.signals, image.timeMs));
        print(pipeline.algs().virtualStateDescription(image.signals, image.timeMs));
        // The descriptions round to six decimals; the bits tell more.
        const HandStats &hand = pipeline.algs().handStats();
        std::printf("%08x %08x %08x %08x\n", std::bit_cast<std::uint32_t>(hand.touchScore + 0.0f),
                    std::bit_cast<std::uint32_t>(hand.maxTouchedValue),
                    std::bit_cast<std::uint32_t>(hand.regionMax[1]),
                    std::bit_cast<std::uint32_t>(hand.regionSwitchFactor));
    }
    print(Util::jsonText(pipeline.getState("Algs.EventStats")));
}
