#include "Bench/Reference/Descriptions.h"

#include "Shared/Util/Text.h"

namespace ZorvaTouch::Reference {
namespace {

std::string fixed(float value) {
    std::string text;
    Util::appendFixed(text, static_cast<double>(value));
    return text;
}

std::string inFour(std::int32_t value) {
    std::string text;
    Util::appendInteger(text, value, 4);
    return text;
}

std::string onMark(const Pixel &pixel) { return pixel.isTouched ? "<==ON" : ""; }

std::string headText(const Hand &hand) {
    return "ts=" + fixed(hand.touchScore) + ", sd=" + fixed(hand.strengthDurationRatio) +
           ", tsd=" + fixed(hand.touchStrengthDurationRatio) +
           ", NonActivePixels=" + std::to_string(hand.nonActivePixels) +
           ", TimeDurationRatio=" + fixed(hand.timeDurationRatio) +
           ", TapSVMScore=" + fixed(hand.tapSvmScore) + ", ";
}

/// A phrase with its duration, a wrapping difference shown as a signed number.
std::string phrase(const char *name, std::uint32_t durationMs, const Hand &hand) {
    return std::string(name) + " " + std::to_string(static_cast<std::int32_t>(durationMs)) +
           "ms ActiveRegion=" + std::to_string(static_cast<std::uint32_t>(hand.activeRegion));
}

std::string gesturePhrase(const Hand &hand, std::uint32_t timeMs) {
    const std::uint32_t soFarMs = timeMs - hand.touchStartTime;
    const std::uint32_t lastedMs = hand.touchEndTime - hand.touchStartTime;
    const std::string noise = hand.isAboveFloor ? " ABOVENOISE" : " BELOWNOISE";
    if (hand.isTouching && !hand.wasTouching)
        return phrase("STARTTOUCH", soFarMs, hand);
    if (hand.isHolding && hand.wasHolding)
        return phrase("HOLDING", soFarMs, hand);
    if (hand.isHolding)
        return phrase("STARTHOLD", soFarMs, hand);
    if (hand.isHoldSuppressed)
        return phrase("SUPPRESSHOLD", soFarMs, hand);
    if (hand.isTouching)
        return phrase("TOUCHING", soFarMs, hand);
    if (hand.wasHolding)
        return phrase("ENDHOLD", lastedMs, hand) + noise;
    if (hand.isTapCandidate && !hand.isTap)
        return phrase("SUPPRESSTAP", soFarMs, hand) + noise;
    if (hand.isTap)
        return phrase("TAP", lastedMs, hand) + noise;
    if (hand.wasTouching)
        return phrase("ENDTOUCH", lastedMs, hand) + noise;
    return "";
}

} // namespace

std::string touchDescription(const Hand &hand, const std::vector<Pixel> &pixels,
                             std::span<const std::int16_t, kElectrodeCount> values, std::uint32_t timeMs) {
    std::string list;
    for (std::size_t i = 0; i < pixels.size(); ++i) {
        const Pixel &pixel = pixels[i];
        list += i == 0 ? "" : ", ";
        list += static_cast<char>('A' + pixel.index);
        list.append("=")
            .append(inFour(values[i]))
            .append(" ")
            .append(inFour(pixel.value))
            .append(onMark(pixel));
    }
    return headText(hand) + "[" + list + "] " + gesturePhrase(hand, timeMs);
}

std::string virtualDescription(const Hand &hand, const std::vector<VirtualPixel> &virtualPixels,
                               std::uint32_t timeMs) {
    std::string list;
    for (const VirtualPixel &pixel : virtualPixels) {
        list += list.empty() ? "" : ", ";
        list += pixel.name + "=" + inFour(pixel.value) + onMark(pixel);
    }
    return headText(hand) + "[" + list + "] " + gesturePhrase(hand, timeMs);
}

} // namespace ZorvaTouch::Reference
