#include "Tools/Cli/FingerTruth.h"

#include "Synth/Labels.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;
/// Longer than any contact lasts.
constexpr std::uint64_t kHorizonNs = 15'000'000'000;
/// Until then the gesture of something that is over still comes out.
constexpr std::uint64_t kLatestNs = 60 * kNanosecondsPerMs;
/// How much later an event may be heard than it happened.
constexpr std::uint64_t kHearingNs = 100 * kNanosecondsPerMs;

constexpr std::string_view kSlideKind = "Slide";

struct KindText {
    std::string_view kind, text;
    std::optional<Gesture> wanted; ///< nothing for an accident
};
constexpr std::array<KindText, 10> kKindTexts{{{"Tap", "tap", Gesture::Tap},
                                               {"DoubleTap", "tap", Gesture::Tap},
                                               {"Hold", "hold", Gesture::HoldStart},
                                               {kSlideKind, "slide", Gesture::HoldChange},
                                               {"Palm", "palm", std::nullopt},
                                               {"Broad", "broad contact", std::nullopt},
                                               {"Thumb", "thumb", std::nullopt},
                                               {"Graze", "graze", std::nullopt},
                                               {"Water", "water", std::nullopt},
                                               {"Remainder", "rest of a touch", std::nullopt}}};

const KindText &textOfKind(std::string_view kind) {
    const auto *const found = std::find_if(kKindTexts.begin(), kKindTexts.end(),
                                           [kind](const KindText &entry) { return entry.kind == kind; });
    return found == kKindTexts.end() ? kKindTexts.back() : *found;
}

constexpr std::array<std::string_view, kPixelRegionCount> kRegionTexts{"", " play/pause", " volume down",
                                                                       " volume up"};

std::uint64_t numberIn(const PropertyValue &label, std::string_view key) {
    const PropertyValue *const number = label.find(key);
    return number ? number->toUnsigned() : 0;
}

} // namespace

FingerTruth::FingerTruth(const SimulatedFinger &finger) {
    LiveSource source = playFinger(finger);
    _frames = std::move(source.frames);
    _startNs = source.startNs;
}

std::string FingerTruth::behind(Gesture gesture, std::uint64_t timeNs) {
    if (gesture == Gesture::HoldEnd || gesture == Gesture::Reset)
        return {};
    lookAhead(timeNs);
    Deed *const deed = deedBehind(gesture, timeNs);
    if (!deed)
        return {};
    deed->isTold = true;
    return textOf(*deed);
}

std::vector<FingerTruth::Silence> FingerTruth::takeSilences(std::uint64_t timeNs) {
    lookAhead(timeNs);
    std::vector<Silence> silences;
    const auto isOver = [timeNs](const Deed &deed) { return deed.endNs + kLatestNs + kHearingNs <= timeNs; };
    for (const Deed &deed : _deeds)
        if (isOver(deed) && !deed.isTold)
            silences.push_back({deed.endNs, textOf(deed), textOfKind(deed.kind).wanted.has_value()});
    std::erase_if(_deeds, isOver);
    return silences;
}

void FingerTruth::lookAhead(std::uint64_t timeNs) {
    while (!_isOver && _aheadNs < timeNs + kHorizonNs) {
        const std::optional<Frame> frame = _frames();
        _isOver = !frame;
        if (!frame)
            break;
        _aheadNs = frame->timestampNs - _startNs;
        if (frame->type == FrameType::Metadata && frame->key == Synth::kLabelKey)
            readLabel(*frame);
    }
}

void FingerTruth::readLabel(const Frame &frame) {
    const std::string *const kind = frame.value.find("Kind")->asString();
    const std::uint64_t startMs = numberIn(frame.value, "StartMs");
    const std::uint64_t endMs = numberIn(frame.value, "EndMs");
    if (*kind != kSlideKind) {
        _contactEndMs = endMs;
        _contactEndNs = frame.timestampNs - _startNs;
    }
    const auto hostNs = [this](std::uint64_t ms) {
        const std::uint64_t beforeEndNs = (_contactEndMs - ms) * kNanosecondsPerMs;
        return _contactEndNs - std::min(_contactEndNs, beforeEndNs);
    };
    _deeds.push_back({.kind = *kind,
                      .region = static_cast<PixelRegion>(numberIn(frame.value, "Region")),
                      .startNs = hostNs(startMs),
                      .endNs = hostNs(endMs)});
}

/// What is meant and not told yet comes first; of the rest, what began last.
FingerTruth::Deed *FingerTruth::deedBehind(Gesture gesture, std::uint64_t timeNs) {
    Deed *latest = nullptr;
    for (Deed &deed : _deeds) {
        if (deed.startNs > timeNs || deed.endNs + kLatestNs < timeNs)
            continue;
        if (textOfKind(deed.kind).wanted == gesture && !deed.isTold)
            return &deed;
        if (deed.kind != kSlideKind && (!latest || latest->startNs < deed.startNs))
            latest = &deed;
    }
    return latest;
}

std::string FingerTruth::textOf(const Deed &deed) {
    return std::string(textOfKind(deed.kind).text).append(kRegionTexts[deed.region]);
}

} // namespace ZorvaTouch::Tools
