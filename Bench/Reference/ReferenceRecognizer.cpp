#include "Bench/Reference/ReferenceRecognizer.h"

#include "Bench/Reference/Descriptions.h"
#include "Shared/Util/StateKey.h"

#include <array>
#include <optional>
#include <sstream>

namespace ZorvaTouch::Reference {
namespace {

constexpr std::uint16_t kPhaseNone = 0;
constexpr std::uint16_t kPhaseBegan = 1;
constexpr std::uint16_t kPhaseChanged = 2;
constexpr std::uint16_t kPhaseEnded = 4;
constexpr std::uint16_t kPhaseCancelled = 8;
constexpr std::uint16_t kPhaseMayBegin = 128;

constexpr std::uint32_t kMaskNone = 0;
constexpr std::uint32_t kMaskHold = 2;
constexpr std::uint32_t kMaskTap = 0x20000;

std::shared_ptr<HostEvent> makeEvent(std::uint32_t mask, std::uint16_t phase, Region region) {
    DigitizerFields fields;
    fields.transducerType = 2;
    fields.eventMask = mask;
    fields.y = static_cast<double>(region);
    auto event = HostEvent::createDigitizer(0, fields, 0);
    if (phase != kPhaseNone)
        event->setPhase(phase);
    return event;
}

/// The index in a key such as "VirtualNormalizationFactors.5"; nothing if it is no such key.
std::optional<std::uint64_t> factorIndex(std::string key) {
    if (!Util::stripDomainFromKey(key, "VirtualNormalizationFactors"))
        return std::nullopt;
    std::istringstream stream(key);
    std::uint64_t index = 0;
    stream >> index; // 0 for what is no number, the largest index for what is too large
    return index;
}

} // namespace

Recognizer::Recognizer() : _pixels(makePixels()), _virtualPixels(makeVirtualPixels(_virtualImage)) {}

HostEventList Recognizer::handleImage(const InputReport::Image &image) {
    HostEventList events;
    processTouchFrame(image.signals, image.frameNumber, image.timeMs, events);
    return events;
}

HostEventList Recognizer::handleReset() {
    HostEventList events;
    const std::array<std::int16_t, kElectrodeCount> zeros{};
    processTouchFrame(zeros, 0, 0, events);
    return events;
}

void Recognizer::processTouchFrame(Signals values, std::uint32_t frameNumber, std::uint32_t timeMs,
                                   HostEventList &events) {
    for (std::size_t i = 0; i < _pixels.size(); ++i)
        _pixels[i].update(values[i], _hand.activationThreshold);
    _virtualImage.updateValues(_pixels);
    for (std::size_t i = 0; i < _virtualPixels.size(); ++i) {
        // Only the low 16 bits of a sum count, as of an electrode's value. That is meant.
        const auto sum = static_cast<std::int16_t>(_virtualImage.values[i]);
        _virtualPixels[i].update(sum, _hand.activationThreshold);
        _virtualPixels[i].index = _virtualImage.dominantIndices[i];
    }
    _hand.update(_pixels, _virtualPixels, timeMs);

    if (const auto event = decideEvent()) {
        event->setIntegerField(kDigitizerFieldFrameNumber, frameNumber);
        _lastEventPhase = event->phase();
        events.push_back(event);
    }
    _counters.update(_hand);
}

std::shared_ptr<HostEvent> Recognizer::decideEvent() {
    const bool isReleased = !_hand.isTouching && _hand.wasTouching;
    const Region region = _hand.activeRegion;
    if (_hand.isTouching && !_hand.wasTouching)
        return makeEvent(kMaskNone, kPhaseMayBegin, region);
    if (_hand.isHolding && !_hand.wasHolding)
        return makeEvent(kMaskHold, kPhaseBegan, region);
    if (_hand.isHolding && _hand.wasHolding && region != _hand.previousActiveRegion)
        return makeEvent(kMaskHold, kPhaseChanged, region);

    std::shared_ptr<HostEvent> event;
    if (!_hand.isHolding && _hand.wasHolding)
        event = makeEvent(kMaskHold, kPhaseEnded, region);
    else if (_hand.isTap)
        event = makeEvent(kMaskTap, kPhaseNone, region);
    else if (isReleased && _lastEventPhase == kPhaseMayBegin)
        event = makeEvent(kMaskNone, kPhaseCancelled, kRegionNone);
    else if (!isReleased)
        return nullptr;
    reset();
    return event;
}

void Recognizer::reset() {
    for (Pixel &pixel : _pixels)
        pixel.resetStatistics();
    for (VirtualPixel &pixel : _virtualPixels)
        pixel.resetStatistics();
    _hand.reset();
}

PropertyValue Recognizer::getState(const std::string &key) const {
    if (key == "EnableHoldSuppression")
        return _hand.enableHoldSuppression;
    if (key == "EnableTapSuppression")
        return _hand.enableTapSuppression;
    if (key == "HoldTimeoutMilliseconds")
        return _hand.holdTimeoutMs;
    if (key == "ActivationThreshold")
        return _hand.activationThreshold;
    if (const auto index = factorIndex(key))
        return *index < _virtualImage.normalizationFactors.size()
                   ? PropertyValue(_virtualImage.normalizationFactors[*index])
                   : PropertyValue();
    if (key == "EventStats")
        return _counters.dictionary();
    if (key == "DebugInfo")
        return PropertyValue::Dictionary{{"EventStats", _counters.dictionary()}};
    return {};
}

void Recognizer::setState(const std::string &key, const PropertyValue &value) {
    if (key == "EnableHoldSuppression") {
        _hand.enableHoldSuppression = value.toBool();
    } else if (key == "EnableTapSuppression") {
        _hand.enableTapSuppression = value.toBool();
    } else if (key == "ResetEventStats") {
        _counters.reset();
    } else if (key == "ActivationThreshold") {
        _hand.activationThreshold = value.toFloat();
    } else if (key == "HoldTimeoutMilliseconds") {
        _hand.holdTimeoutMs = static_cast<std::uint32_t>(value.toUnsigned()); // the low 32 bits, as is meant
    } else if (const auto index = factorIndex(key)) {
        if (*index >= _virtualImage.normalizationFactors.size())
            return;
        _virtualImage.normalizationFactors[*index] = value.toFloat();
        _virtualPixels[*index].gain = value.toFloat();
    }
}

std::string Recognizer::touchStateDescription(Signals values, std::uint32_t timeMs) const {
    return touchDescription(_hand, _pixels, values, timeMs);
}

std::string Recognizer::virtualStateDescription(Signals, std::uint32_t timeMs) const {
    return virtualDescription(_hand, _virtualPixels, timeMs);
}

} // namespace ZorvaTouch::Reference
