#include "Bench/Reference/RecognizerPair.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/StateKey.h"

#include <array>

namespace ZorvaTouch::Reference {
namespace {

/// Every state, and some that are none.
std::vector<std::string> stateKeys() {
    std::vector<std::string> keys{"EnableHoldSuppression",
                                  "EnableTapSuppression",
                                  "HoldTimeoutMilliseconds",
                                  "ActivationThreshold",
                                  "EventStats",
                                  "DebugInfo",
                                  "ResetEventStats",
                                  "Unknown",
                                  "VirtualNormalizationFactors",
                                  "VirtualNormalizationFactors.x"};
    for (std::size_t index = 0; index <= kVirtualPixelCount; ++index)
        keys.push_back("VirtualNormalizationFactors." + std::to_string(index));
    return keys;
}

} // namespace

std::string jsonLines(const HostEventList &events) {
    std::string lines;
    for (const auto &event : events)
        lines += jsonText(*event) + "\n";
    return lines;
}

std::string differenceOn(const std::vector<InputReport::Image> &images) {
    RecognizerPair pair;
    for (const InputReport::Image &image : images)
        pair.handleImage(image);
    pair.compareStates();
    return pair.difference();
}

RecognizerPair::RecognizerPair() : _algs(Ports::silentLogProvider()) {}

void RecognizerPair::handleImage(const InputReport::Image &image) {
    compareFrame(_algs.handleImage(image), _reference.handleImage(image), image.signals, image.timeMs);
}

void RecognizerPair::handleReset() {
    const std::array<std::int16_t, kElectrodeCount> zeros{};
    compareFrame(_algs.handleReset(), _reference.handleReset(), zeros, 0);
}

void RecognizerPair::setState(const std::string &key, const PropertyValue &value) {
    _algs.setState(key, value);
    _reference.setState(key, value);
}

void RecognizerPair::handleFrame(const FrameView &frame) {
    std::string key(frame.key);
    if (frame.type == FrameType::State && Util::stripDomainFromKey(key, "Algs"))
        return setState(key, frame.value);
    if (frame.type != FrameType::InputReport)
        return;
    const auto firmware = InputReport::FirmwareEvent::parse(frame.data.data(), frame.data.size());
    if (firmware && firmware->eventCode == InputReport::FirmwareEvent::kDeviceReset)
        return handleReset();
    if (const auto image = InputReport::Image::parse(frame.data.data(), frame.data.size()))
        handleImage(*image);
}

void RecognizerPair::compareStates() {
    for (const std::string &key : stateKeys())
        compare(key, Util::jsonText(_algs.getState(key)), Util::jsonText(_reference.getState(key)));
}

std::string RecognizerPair::phrase() const {
    return _touchDescription.substr(_touchDescription.rfind("] ") + 2);
}

void RecognizerPair::compareFrame(const HostEventList &events, const HostEventList &referenceEvents,
                                  std::span<const std::int16_t, kElectrodeCount> values,
                                  std::uint32_t timeMs) {
    ++_frameCount;
    _events = jsonLines(events);
    _touchDescription = _algs.touchStateDescription(values, timeMs);
    compare("events", _events, jsonLines(referenceEvents));
    compare("touch description", _touchDescription, _reference.touchStateDescription(values, timeMs));
    compare("virtual description", _algs.virtualStateDescription(values, timeMs),
            _reference.virtualStateDescription(values, timeMs));
}

void RecognizerPair::compare(std::string_view what, const std::string &text,
                             const std::string &referenceText) {
    if (text == referenceText || !_difference.empty())
        return;
    _difference = "frame " + std::to_string(_frameCount) + ", " + std::string(what) +
                  "\n  recognizer: " + text + "\n  reference:  " + referenceText;
}

} // namespace ZorvaTouch::Reference
