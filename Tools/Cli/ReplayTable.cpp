#include "Tools/Cli/ReplayTable.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/Counters.h"
#include "Tools/Cli/GestureLook.h"
#include "Tools/Cli/Layout.h"

#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::int64_t kNanosecondsPerSecond = 1'000'000'000;
constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;

// Widths of the columns, in characters.
constexpr std::size_t kTimeWidth = 12;
constexpr std::size_t kGestureWidth = 17;
constexpr std::size_t kRegionWidth = 26;
constexpr std::size_t kDurationWidth = 9;
constexpr std::size_t kNumberWidth = 9;
constexpr std::string_view kGap = "  ";

std::string unsignedText(std::uint64_t value) {
    std::string text;
    Util::appendUnsigned(text, value);
    return text;
}

} // namespace

void ReplayTable::begin(const std::string &title, const Replay & /*replay*/) {
    _touch.reset();
    _holdRegion = kPixelRegionNone;
    _counts = {};
    _hasRows = false;
    if (_recordingCount++ > 0)
        _output.write("\n");
    appendColoured(_output.text(), title, Colour::Bold, _usesColour);
    _output.write("\n");
}

void ReplayTable::print(const Replay &replay) {
    _counts.add(replay.frame());
    for (const auto &event : replay.frame().events)
        if (const auto gesture = gestureOf(*event))
            printGesture(replay, *event, *gesture);
}

void ReplayTable::printGesture(const Replay &replay, const HostEvent &event, Gesture gesture) {
    if (gesture == Gesture::MayBegin) {
        _touch = {replay.frame().image.timeMs, replay.frame().timestampNs};
        return;
    }
    printRow(replay, event, gesture);
    _holdRegion = regionOf(event);
}

void ReplayTable::printRow(const Replay &replay, const HostEvent &event, Gesture gesture) {
    if (!_hasRows)
        printTitleRow();
    _hasRows = true;
    const ReplayedFrame &frame = replay.frame();
    const GestureLook &look = lookOf(gesture);
    const bool isImage = frame.kind == InputKind::Image;
    std::string name;
    appendLeft(name, look.name, kGestureWidth);

    std::string &text = _output.text();
    appendRight(text, fixedPointText(replay.offsetNs(), kNanosecondsPerSecond), kTimeWidth);
    appendColoured(text.append(kGap), name, look.colour, _usesColour);
    appendLeft(text, regionsOf(event, gesture), kRegionWidth);
    appendRight(text, gesture == Gesture::Reset ? "" : durationOf(frame), kDurationWidth);
    appendRight(text, isImage ? unsignedText(frame.image.frameNumber) : "", kNumberWidth);
    appendRight(text, unsignedText(frame.index), kNumberWidth);
    text.push_back('\n');
    if (_describe && isImage)
        printDescriptions(replay);
    _output.wrote();
}

void ReplayTable::printTitleRow() {
    std::string row;
    appendRight(row, "time s", kTimeWidth);
    appendLeft(row.append(kGap), "gesture", kGestureWidth);
    appendLeft(row, "region", kRegionWidth);
    appendRight(row, "ms", kDurationWidth);
    appendRight(row, "frame", kNumberWidth);
    appendRight(row, "n", kNumberWidth);
    appendColoured(_output.text(), row, Colour::Dim, _usesColour);
    _output.write("\n");
}

void ReplayTable::printDescriptions(const Replay &replay) {
    for (const std::string &description : {replay.touchDescription(), replay.virtualDescription()}) {
        appendColoured(_output.text().append(kTimeWidth, ' ').append(kGap), description, Colour::Dim,
                       _usesColour);
        _output.text().push_back('\n');
    }
}

std::string ReplayTable::durationOf(const ReplayedFrame &frame) const {
    if (!_touch)
        return {};
    // A device that has reset has started its clock again; then the time stamps must do.
    if (frame.kind == InputKind::Image)
        return unsignedText(frame.image.timeMs - _touch->timeMs);
    return unsignedText((frame.timestampNs - _touch->timestampNs) / kNanosecondsPerMs);
}

std::string ReplayTable::regionsOf(const HostEvent &event, Gesture gesture) const {
    if (gesture == Gesture::Cancel || gesture == Gesture::Reset)
        return {}; // these carry none
    std::string text;
    if (gesture == Gesture::HoldChange)
        text.append(titleOf(_holdRegion)).append(" → ");
    return text.append(titleOf(regionOf(event)));
}

void ReplayTable::end(const Replay &replay) {
    if (_counts.gestures() == 0)
        _output.write("  no gestures\n");
    _totals.add(_counts);
    printCounters(replay);
}

void ReplayTable::printCounters(const Replay &replay) {
    const Pipeline &pipeline = replay.pipeline();
    appendCounters(_output.text(), {.gestures = _counts,
                                    .eventStats = pipeline.algs().eventStats().statsDictionary(),
                                    .resets = pipeline.resetCount(),
                                    .disjointImages = pipeline.disjointImageCount()});
    _output.wrote();
}

void ReplayTable::finish() {
    if (_recordingCount < 2)
        return;
    std::string &text = _output.text();
    text.append("\n").append(unsignedText(_recordingCount)).append(" recordings: ");
    _totals.appendTo(text);
    text.append("\n");
    _output.wrote();
}

} // namespace ZorvaTouch::Tools
