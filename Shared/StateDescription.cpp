#include "Shared/StateDescription.h"

#include "Shared/Util/Text.h"

#include <array>
#include <string_view>

namespace ZorvaTouch {
namespace {

enum class Measure { ToNow, ToTouchEnd };

/// One gesture state and how it is told; the first whose condition holds is the frame's.
struct GestureState {
    std::string_view name;
    bool (*applies)(const HandStats &hand);
    Measure measure;
    bool isEnding; ///< the noise level is told too
};

constexpr std::array<GestureState, 9> kGestureStates{{
    {"STARTTOUCH", [](const HandStats &hand) { return hand.isTouching && !hand.wasTouching; }, Measure::ToNow,
     false},
    {"HOLDING", [](const HandStats &hand) { return hand.isHolding && hand.wasHolding; }, Measure::ToNow,
     false},
    {"STARTHOLD", [](const HandStats &hand) { return hand.isHolding && !hand.wasHolding; }, Measure::ToNow,
     false},
    {"SUPPRESSHOLD", [](const HandStats &hand) { return hand.isHoldSuppressed; }, Measure::ToNow, false},
    {"TOUCHING", [](const HandStats &hand) { return hand.isTouching; }, Measure::ToNow, false},
    {"ENDHOLD", [](const HandStats &hand) { return hand.wasHolding; }, Measure::ToTouchEnd, true},
    // Measured to the current frame, unlike the other endings; that is meant.
    {"SUPPRESSTAP", [](const HandStats &hand) { return hand.isTapCandidate && !hand.isTap; }, Measure::ToNow,
     true},
    {"TAP", [](const HandStats &hand) { return hand.isTap; }, Measure::ToTouchEnd, true},
    {"ENDTOUCH", [](const HandStats &hand) { return hand.wasTouching; }, Measure::ToTouchEnd, true},
}};

void appendFeature(std::string &text, std::string_view label, float value) {
    text.append(label);
    Util::appendFixed(text, static_cast<double>(value));
    text.append(", ");
}

void appendHead(std::string &text, const HandStats &hand) {
    appendFeature(text, "ts=", hand.touchScore);
    appendFeature(text, "sd=", hand.strengthDurationRatio);
    appendFeature(text, "tsd=", hand.touchStrengthDurationRatio);
    text.append("NonActivePixels=");
    Util::appendInteger(text, hand.nonActivePixels);
    text.append(", ");
    appendFeature(text, "TimeDurationRatio=", hand.timeDurationRatio);
    appendFeature(text, "TapSVMScore=", hand.tapSvmScore);
}

void appendGestureState(std::string &text, const HandStats &hand, std::uint32_t timeMs) {
    for (const GestureState &state : kGestureStates) {
        if (!state.applies(hand))
            continue;
        const std::uint32_t end = state.measure == Measure::ToNow ? timeMs : hand.touchEndTime;
        text.append(state.name).push_back(' ');
        // A 32-bit difference shown as a signed number; a wrapped one is negative.
        Util::appendInteger(text, static_cast<std::int32_t>(end - hand.touchStartTime));
        text.append("ms ActiveRegion=");
        Util::appendUnsigned(text, hand.activeRegion);
        if (state.isEnding)
            text.append(hand.isAboveFloor ? " ABOVENOISE" : " BELOWNOISE");
        return;
    }
}

/// Head, bracketed list of channels, gesture state.
template <typename Channels, typename AppendChannel>
std::string describe(const HandStats &hand, const Channels &channels, std::uint32_t timeMs,
                     const AppendChannel &appendChannel) {
    std::string text;
    appendHead(text, hand);
    std::string_view separator = "[";
    for (const auto &channel : channels) {
        text.append(separator);
        appendChannel(text, channel);
        Util::appendInteger(text, channel.value, 4);
        if (channel.isTouched)
            text.append("<==ON");
        separator = ", ";
    }
    text.append("] ");
    appendGestureState(text, hand, timeMs);
    return text;
}

} // namespace

std::string describeTouchState(const HandStats &hand, const Pixels &pixels,
                               std::span<const std::int16_t, kElectrodeCount> values, std::uint32_t timeMs) {
    return describe(hand, pixels, timeMs, [values](std::string &text, const Pixel &pixel) {
        text.push_back(static_cast<char>('A' + pixel.index));
        text.push_back('=');
        Util::appendInteger(text, values[static_cast<std::size_t>(pixel.index)], 4);
        text.push_back(' ');
    });
}

std::string describeVirtualState(const HandStats &hand, const VirtualPixels &virtualPixels,
                                 std::uint32_t timeMs) {
    return describe(hand, virtualPixels, timeMs, [](std::string &text, const VirtualPixel &pixel) {
        text.append(pixel.name).push_back('=');
    });
}

} // namespace ZorvaTouch
