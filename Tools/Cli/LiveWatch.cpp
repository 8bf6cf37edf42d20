#include "Tools/Cli/LiveWatch.h"

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;

} // namespace

void LiveWatch::heard(const HostEvent &event, std::uint64_t timeNs) {
    if (event.accelerometer()) // no service of ours sends any, but another plug-in's might
        return;
    const auto gesture = gestureOf(event);
    _history.add(event, gesture);
    if (!gesture)
        return;
    _counts.add(*gesture);
    if (*gesture == Gesture::MayBegin)
        _touchStartNs = timeNs;
    else if (_printer)
        _printer->print(describe(event, *gesture, timeNs));
}

void LiveWatch::passed(std::uint64_t timeNs, const std::optional<InputReport::Image> &image) {
    if (!_printer)
        return;
    if (_truth)
        for (const FingerTruth::Silence &silence : _truth->takeSilences(timeNs))
            _printer->printSilence(silence.endNs, silence.what, silence.isMissed);
    _printer->refresh(timeNs, image);
}

void LiveWatch::makeRoomForLog() {
    if (_printer)
        _printer->clear();
}

LiveGesture LiveWatch::describe(const HostEvent &event, Gesture gesture, std::uint64_t timeNs) {
    LiveGesture described{.gesture = gesture,
                          .region = regionOf(event),
                          .timeNs = timeNs,
                          .durationMs = std::nullopt,
                          .action = actionFor(gesture, regionOf(event)),
                          .finger = _truth ? _truth->behind(gesture, timeNs) : std::string()};
    if (_touchStartNs && gesture != Gesture::Reset)
        described.durationMs = (timeNs - *_touchStartNs + kNanosecondsPerMs / 2) / kNanosecondsPerMs;
    return described;
}

} // namespace ZorvaTouch::Tools
