#include "Fuzz/Transcript.h"

#include <array>
#include <bit>
#include <concepts>
#include <limits>
#include <type_traits>

namespace ZorvaTouch::Fuzzing {
namespace {

constexpr std::size_t kUsualLength = 640; ///< words of a state without events

std::uint64_t wordOf(float value) { return std::bit_cast<std::uint32_t>(value); }
std::uint64_t wordOf(double value) { return std::bit_cast<std::uint64_t>(value); }
template <typename T>
requires std::integral<T> || std::is_enum_v<T> std::uint64_t wordOf(T value) {
    return static_cast<std::uint64_t>(value);
}

template <typename... Values> void add(Words &words, Values... values) {
    (words.push_back(wordOf(values)), ...);
}

template <typename Values> void addEach(Words &words, const Values &values) {
    for (const auto value : values)
        words.push_back(wordOf(value));
}

void addEvent(Words &words, const HostEvent &event) {
    add(words, event.timestamp(), event.type(), event.options(), event.phase(),
        event.integerField(kDigitizerFieldFrameNumber).value_or(-1));
    if (const DigitizerFields *const fields = event.digitizer())
        add(words, fields->transducerType, fields->transducerIndex, fields->identity, fields->eventMask,
            fields->buttonMask, fields->x, fields->y, fields->z, fields->tipPressure, fields->barrelPressure,
            fields->inRange, fields->touch);
    if (const VendorDefinedFields *const fields = event.vendorDefined()) {
        add(words, fields->usagePage, fields->usage, fields->version, fields->payload.size());
        addEach(words, fields->payload);
    }
}

void addPixel(Words &words, const Pixel &pixel) {
    add(words, pixel.value, pixel.gain, pixel.normalizedValue, pixel.peakValue, pixel.valleyValue,
        pixel.isTouched, pixel.isAboveFloor, pixel.wasAboveFloor, pixel.wasTouched, pixel.maxNormalizedValue,
        pixel.index);
}

void addHand(Words &words, const HandStats &hand) {
    add(words, hand.svm.score, hand.touchScore, hand.decayParameter, hand.activationThreshold,
        hand.holdTimeoutMs, hand.touchScoreThreshold, hand.touchScoreLimit, hand.tapStrength,
        hand.enableHoldSuppression, hand.enableTapSuppression);
    add(words, hand.isTouching, hand.wasTouching, hand.isAboveFloor, hand.wasAboveFloor, hand.isHolding,
        hand.wasHolding, hand.isHoldSuppressed, hand.wasHoldSuppressed, hand.isTapCandidate, hand.isTap,
        hand.isTapRejected, hand.isPastHoldTimeout, hand.wasPastHoldTimeout);
    add(words, hand.touchStartTime, hand.touchEndTime, hand.floorStartTime, hand.floorEndTime,
        hand.lastEventTime);
    add(words, hand.strengthDurationRatio, hand.touchStrengthDurationRatio, hand.timeDurationRatio,
        hand.nonActivePixels, hand.tapSvmScore, hand.activeRegion, hand.previousActiveRegion,
        hand.lastEventRegion, hand.maxTouchedValue, hand.maxTouchedIndex, hand.regionSwitchFactor);
    addEach(words, hand.regionMax);
}

void addState(Words &words, const Pipeline &pipeline) {
    const Algs &algs = pipeline.algs();
    add(words, pipeline.resetCount(), pipeline.disjointImageCount(), algs.lastEventPhase());
    addHand(words, algs.handStats());
    for (const Pixel &pixel : algs.pixels())
        addPixel(words, pixel);
    for (const VirtualPixel &pixel : algs.virtualPixels())
        addPixel(words, pixel);
    addEach(words, algs.virtualImage().values);
    addEach(words, algs.virtualImage().dominantIndices);
    addEach(words, algs.virtualImage().normalizationFactors);
    // All counters: they have one type and no gaps.
    addEach(words, std::bit_cast<std::array<std::uint64_t, sizeof(EventStats) / 8>>(algs.eventStats()));
}

} // namespace

TranscribedPipeline::TranscribedPipeline()
    : _pipeline(std::make_shared<Pipeline>(Ports::silentLogProvider())) {
    _pipeline->onHIDEvents = [this](std::uint64_t timestamp, const HostEventList &events) {
        add(_events, timestamp, events.size());
        for (const auto &event : events)
            addEvent(_events, *event);
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

Words TranscribedPipeline::tunables() const {
    const HandStats &hand = _pipeline->algs().handStats();
    Words words;
    add(words, hand.enableHoldSuppression, hand.enableTapSuppression, hand.holdTimeoutMs,
        hand.activationThreshold);
    addEach(words, _pipeline->algs().virtualImage().normalizationFactors);
    return words;
}

Words TranscribedPipeline::transcript() const {
    Words words;
    words.reserve(_events.size() + kUsualLength);
    words = _events;
    addState(words, *_pipeline);
    return words;
}

void demandReplayAgrees(const FrameList &frames) {
    TranscribedPipeline first;
    TranscribedPipeline second;
    first.play(frames);
    second.play(frames);
    ZORVA_MUST(first.transcript() == second.transcript());

    FrameList trimmed = frames;
    trimmed.trim(frames.size() / 2);
    TranscribedPipeline third;
    third.play(trimmed);
    ZORVA_MUST(first.tunables() == third.tunables());
}

} // namespace ZorvaTouch::Fuzzing
