#include "Shared/Algs.h"

#include "Shared/LogNames.h"
#include "Shared/StateDescription.h"
#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"

#include <array>

namespace ZorvaTouch {
namespace {

constexpr std::uint32_t kTransducerFinger = 2;

/// The region travels in the y coordinate; mask and phase tell the gestures apart.
std::shared_ptr<HostEvent> createGestureEvent(std::uint32_t eventMask, std::uint16_t phase,
                                              PixelRegion region) {
    DigitizerFields fields;
    fields.transducerType = kTransducerFinger;
    fields.eventMask = eventMask;
    fields.y = static_cast<double>(region);
    auto event = HostEvent::createDigitizer(0, fields, 0);
    event->setPhase(phase);
    return event;
}

bool touchBegins(const HandStats &hand) { return hand.isTouching && !hand.wasTouching; }
bool touchEnds(const HandStats &hand) { return !hand.isTouching && hand.wasTouching; }
bool holdBegins(const HandStats &hand) { return hand.isHolding && !hand.wasHolding; }
bool holdMoves(const HandStats &hand) {
    return hand.isHolding && hand.wasHolding && hand.activeRegion != hand.previousActiveRegion;
}
bool holdEnds(const HandStats &hand) { return !hand.isHolding && hand.wasHolding; }

/// One row of the event decision.
struct Decision {
    bool (*applies)(const HandStats &hand, std::uint16_t lastEventPhase);
    std::shared_ptr<HostEvent> (*createEvent)(PixelRegion region); ///< null: no event
    bool resets;                                                   ///< the touch is over
};

/// What a frame's state means for the host; the first row that applies decides. A frame that none applies to
/// has no event. A hold end masks a tap that the same frame reports, and a may-begin that neither a hold nor
/// a tap followed is withdrawn with a cancel.
constexpr std::array<Decision, 7> kDecisions{{
    {[](const HandStats &hand, std::uint16_t) { return touchBegins(hand); }, Algs::createMayBeginEvent,
     false},
    {[](const HandStats &hand, std::uint16_t) { return holdBegins(hand); }, Algs::createHoldStartEvent,
     false},
    {[](const HandStats &hand, std::uint16_t) { return holdMoves(hand); }, Algs::createHoldChangeEvent,
     false},
    {[](const HandStats &hand, std::uint16_t) { return holdEnds(hand); }, Algs::createHoldEndEvent, true},
    {[](const HandStats &hand, std::uint16_t) { return hand.isTap; }, Algs::createTapEvent, true},
    {[](const HandStats &hand, std::uint16_t last) { return touchEnds(hand) && last == kEventPhaseMayBegin; },
     [](PixelRegion) { return Algs::createCancelEvent(); }, true},
    {[](const HandStats &hand, std::uint16_t) { return touchEnds(hand); }, nullptr, true},
}};

} // namespace

Algs::Algs(Ports::LogProvider &logs)
    : _log(logs.openLog(kLogSubsystem, kLogCategoryAlgs)), _pixels(makePixels()),
      _virtualPixels(makeVirtualPixels(_virtualImage)) {}

HostEventList Algs::handleImage(const InputReport::Image &image) {
    HostEventList events;
    processTouchFrame(image.signals, image.frameNumber, image.timeMs, events);
    return events;
}

HostEventList Algs::handleReset() {
    static constexpr std::array<std::int16_t, kElectrodeCount> kNoSignals{};
    HostEventList events;
    processTouchFrame(kNoSignals, 0, 0, events);
    return events;
}

void Algs::processTouchFrame(Signals values, std::uint32_t frameNumber, std::uint32_t timeMs,
                             HostEventList &events) {
    updatePixels(values);
    _virtualImage.updateValues(_pixels);
    updateVirtualPixels();
    _handStats.updateHandState(_pixels, _virtualPixels, timeMs);
    if (auto event = decideEvent()) {
        stampEvent(*event, frameNumber);
        events.push_back(std::move(event));
    }
    _eventStats.update(_handStats);
    if (_log->isEnabled(Ports::LogLevel::Debug))
        logFrame(values, frameNumber, timeMs);
}

void Algs::updatePixels(Signals values) noexcept {
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        _pixels[i].updatePixelState(values[i], _handStats.activationThreshold);
}

void Algs::updateVirtualPixels() noexcept {
    for (std::size_t i = 0; i < kVirtualPixelCount; ++i) {
        // Only the low 16 bits, as for a real electrode: a larger sum wraps, and that is meant.
        const auto sum = static_cast<std::int16_t>(_virtualImage.values[i]);
        _virtualPixels[i].updatePixelState(sum, _handStats.activationThreshold,
                                           _virtualImage.dominantIndices[i]);
    }
}

std::shared_ptr<HostEvent> Algs::decideEvent() {
    for (const Decision &decision : kDecisions) {
        if (!decision.applies(_handStats, _lastEventPhase))
            continue;
        auto event = decision.createEvent ? decision.createEvent(_handStats.activeRegion) : nullptr;
        if (decision.resets)
            Reset();
        return event;
    }
    return nullptr;
}

void Algs::stampEvent(HostEvent &event, std::uint32_t frameNumber) {
    event.setIntegerField(kDigitizerFieldFrameNumber, frameNumber);
    _lastEventPhase = event.phase();
}

void Algs::Reset() noexcept {
    for (Pixel &pixel : _pixels)
        pixel.resetGlobalStats();
    for (VirtualPixel &pixel : _virtualPixels)
        pixel.resetGlobalStats();
    _handStats.Reset();
}

std::string Algs::touchStateDescription(Signals values, std::uint32_t timeMs) const {
    return describeTouchState(_handStats, _pixels, values, timeMs);
}

std::string Algs::virtualStateDescription(Signals /*values*/, std::uint32_t timeMs) const {
    return describeVirtualState(_handStats, _virtualPixels, timeMs);
}

void Algs::logFrame(Signals values, std::uint32_t frameNumber, std::uint32_t timeMs) const {
    const auto writeRecord = [&](std::string_view title, const auto &describe) {
        if (!_log->isEnabled(Ports::LogLevel::Debug)) // may have been switched off since
            return;
        std::string text = "Frame ";
        Util::appendUnsigned(text, frameNumber);
        text.append(" @");
        Util::appendUnsigned(text, timeMs);
        text.append("ms, *** ").append(title).append(" ***\n").append(describe());
        _log->write(Ports::LogLevel::Debug, text);
    };
    writeRecord("Event Stats", [&] { return Util::jsonText(_eventStats.statsDictionary()); });
    writeRecord("Touch State Description", [&] { return touchStateDescription(values, timeMs); });
    writeRecord("Virtual State Description", [&] { return virtualStateDescription(values, timeMs); });
}

std::shared_ptr<HostEvent> Algs::createMayBeginEvent(PixelRegion region) {
    return createGestureEvent(0, kEventPhaseMayBegin, region);
}

std::shared_ptr<HostEvent> Algs::createHoldStartEvent(PixelRegion region) {
    return createGestureEvent(kEventMaskHold, kEventPhaseBegan, region);
}

std::shared_ptr<HostEvent> Algs::createHoldChangeEvent(PixelRegion region) {
    return createGestureEvent(kEventMaskHold, kEventPhaseChanged, region);
}

std::shared_ptr<HostEvent> Algs::createHoldEndEvent(PixelRegion region) {
    return createGestureEvent(kEventMaskHold, kEventPhaseEnded, region);
}

std::shared_ptr<HostEvent> Algs::createTapEvent(PixelRegion region) {
    // The one event without a phase: it is complete in itself.
    return createGestureEvent(kEventMaskTap, kEventPhaseNone, region);
}

std::shared_ptr<HostEvent> Algs::createCancelEvent() {
    return createGestureEvent(0, kEventPhaseCancelled, kPixelRegionNone);
}

} // namespace ZorvaTouch
