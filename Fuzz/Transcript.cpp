#include "Fuzz/Transcript.h"

#include "Shared/Util/Json.h"

#include <array>
#include <limits>

namespace ZorvaTouch::Fuzzing {
namespace {

constexpr const char *kTunables[] = {"Algs.EnableHoldSuppression", "Algs.EnableTapSuppression",
                                     "Algs.HoldTimeoutMilliseconds", "Algs.ActivationThreshold"};

} // namespace

TranscribedPipeline::TranscribedPipeline()
    : _pipeline(std::make_shared<Pipeline>(Ports::silentLogProvider())) {
    _pipeline->onHIDEvents = [this](std::uint64_t, const HostEventList &events) {
        for (const auto &event : events)
            _events.append(jsonText(*event)).push_back('\n');
    };
}

void TranscribedPipeline::play(const FrameList &frames) {
    StillClock clock;
    PipelineRecording recording(frames, clock);
    recording.pipeline = _pipeline;
    recording.playReset();
    while (recording.playCanContinue())
        recording.playNextFrame(std::numeric_limits<float>::infinity());
}

std::string TranscribedPipeline::tunables() const {
    std::string text;
    for (const char *key : kTunables)
        text.append(Util::jsonText(_pipeline->getState(key))).push_back(' ');
    for (std::size_t i = 0; i < kVirtualPixelCount; ++i)
        text.append(
                Util::jsonText(_pipeline->getState("Algs.VirtualNormalizationFactors." + std::to_string(i))))
            .push_back(' ');
    return text;
}

std::string TranscribedPipeline::text() const {
    const std::array<std::int16_t, kElectrodeCount> noSignals{};
    return _events + Util::jsonText(_pipeline->getState("Algs.EventStats")) +
           Util::jsonText(_pipeline->getState("DebugInfo")) +
           _pipeline->algs().touchStateDescription(noSignals, 0) +
           _pipeline->algs().virtualStateDescription(noSignals, 0) + tunables();
}

void demandReplayAgrees(const FrameList &frames) {
    TranscribedPipeline first;
    TranscribedPipeline second;
    first.play(frames);
    second.play(frames);
    ZORVA_MUST(first.text() == second.text());

    FrameList trimmed = frames;
    trimmed.trim(frames.size() / 2);
    TranscribedPipeline third;
    third.play(trimmed);
    ZORVA_MUST(first.tunables() == third.tunables());
}

} // namespace ZorvaTouch::Fuzzing
