#include "Tests/Unit/Synth/Recognition.h"

#include "Synth/Labels.h"
#include "Tools/Stimulus/EventNames.h"
#include "Tools/Stimulus/Replay.h"
#include "Tools/Stimulus/VirtualClock.h"

#include <algorithm>
#include <cstdint>
#include <string>
#include <tuple>
#include <vector>

namespace ZorvaTouch::Test {
namespace {

using Tools::Gesture;

constexpr std::uint64_t kSlackMs =
    60; ///< from a contact's end to the latest image that can still tell its gesture

struct Label {
    std::string kind;
    std::uint64_t region, startMs, endMs;

    [[nodiscard]] bool isIntended() const { return region != kPixelRegionNone; }
    [[nodiscard]] Gesture expected() const {
        if (kind == "Slide")
            return Gesture::HoldChange;
        return kind == "Hold" ? Gesture::HoldStart : Gesture::Tap;
    }
};

struct Found {
    Gesture gesture;
    std::uint64_t region, timeMs;
    bool isTaken = false;
};

/// What happened between two resets.
struct Stretch {
    std::vector<Label> labels;
    std::vector<Found> found;
};

Label readLabel(const PropertyValue &value) {
    return {.kind = *value.find("Kind")->asString(),
            .region = *value.find("Region")->asUnsigned(),
            .startMs = *value.find("StartMs")->asUnsigned(),
            .endMs = *value.find("EndMs")->asUnsigned()};
}

bool isLabel(const FrameView &frame) {
    return frame.type == FrameType::Metadata && frame.key == Synth::kLabelKey;
}

void collectGestures(const Tools::ReplayedFrame &frame, Stretch &stretch) {
    for (const auto &event : frame.events) {
        const auto gesture = Tools::gestureOf(*event);
        if (gesture == Gesture::Tap || gesture == Gesture::HoldStart || gesture == Gesture::HoldChange)
            stretch.found.push_back({*gesture, Tools::regionOf(*event), frame.image.timeMs});
    }
}

std::vector<Stretch> replayInStretches(const FrameList &frames) {
    Tools::VirtualClock clock;
    Tools::Replay replay(frames, clock, Ports::silentLogProvider());
    std::vector<Stretch> stretches(1);
    while (replay.next()) {
        if (isLabel(replay.recorded()))
            stretches.back().labels.push_back(readLabel(replay.recorded().value));
        collectGestures(replay.frame(), stretches.back());
        if (replay.frame().kind == Tools::InputKind::Reset)
            stretches.emplace_back();
    }
    return stretches;
}

/// The first gesture of a kind in a label's time that nobody has taken.
Found *take(Stretch &stretch, const Label &label, Gesture gesture) {
    const auto belongs = [&](const Found &found) {
        return !found.isTaken && found.gesture == gesture && found.timeMs >= label.startMs &&
               found.timeMs <= label.endMs + kSlackMs;
    };
    const auto found = std::find_if(stretch.found.begin(), stretch.found.end(), belongs);
    if (found == stretch.found.end())
        return nullptr;
    found->isTaken = true;
    return &*found;
}

void judgeIntended(Stretch &stretch, const Label &label, Outcomes &outcomes) {
    if (const Found *found = take(stretch, label, label.expected()))
        ++(found->region == label.region ? outcomes.right : outcomes.wrongRegion);
    else if (label.kind != "Slide" &&
             (take(stretch, label, Gesture::Tap) || take(stretch, label, Gesture::HoldStart)))
        ++outcomes.wrongGesture;
    else
        ++outcomes.nothing;
}

void judgeAccident(Stretch &stretch, const Label &label, Outcomes &outcomes) {
    std::size_t taken = 0;
    for (const Gesture gesture : {Gesture::Tap, Gesture::HoldStart, Gesture::HoldChange})
        while (take(stretch, label, gesture))
            ++taken;
    ++(taken == 0 ? outcomes.right : outcomes.wrongGesture);
}

void judge(Stretch &stretch, Recognition &result) {
    const auto meaningFirst = [](const Label &a, const Label &b) {
        return std::tuple(!a.isIntended(), a.startMs) < std::tuple(!b.isIntended(), b.startMs);
    };
    std::stable_sort(stretch.labels.begin(), stretch.labels.end(), meaningFirst);
    for (const Label &label : stretch.labels) {
        Outcomes &outcomes = result.byKind[label.kind];
        ++outcomes.labels;
        (label.isIntended() ? judgeIntended : judgeAccident)(stretch, label, outcomes);
    }
    const auto isStray = [](const Found &found) { return !found.isTaken; };
    result.stray +=
        static_cast<std::size_t>(std::count_if(stretch.found.begin(), stretch.found.end(), isStray));
}

} // namespace

Recognition recognize(const FrameList &frames) {
    Recognition result;
    for (Stretch &stretch : replayInStretches(frames))
        judge(stretch, result);
    return result;
}

} // namespace ZorvaTouch::Test
