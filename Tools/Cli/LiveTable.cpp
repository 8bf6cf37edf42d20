#include "Tools/Cli/LiveTable.h"

#include "Tools/Cli/ElectrodeLine.h"
#include "Tools/Cli/GestureLook.h"
#include "Tools/Cli/Layout.h"

#include <string>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::int64_t kNanosecondsPerSecond = 1'000'000'000;
constexpr std::string_view kGap = "  ";
constexpr std::string_view kEraseLine = "\r\x1b[K";

// Widths of the columns, in characters; together with the last, of 17 at most, less than 80.
constexpr std::size_t kTimeWidth = 9;
constexpr std::size_t kGestureWidth = 16;
constexpr std::size_t kRegionWidth = 11;
constexpr std::size_t kDurationWidth = 6;
constexpr std::size_t kActionWidth = 16;
constexpr std::size_t kTableWidth = 79;
constexpr std::size_t kRowsAbovePicture = 6; ///< for gestures, at least

std::string timeText(std::uint64_t timeNs) {
    return fixedPointText(static_cast<std::int64_t>(timeNs), kNanosecondsPerSecond);
}

} // namespace

LiveTable::~LiveTable() {
    try {
        clear();
    } catch (...) { // standard output is gone: then so is the line
    }
}

void LiveTable::print(const LiveGesture &gesture) {
    beginRow();
    const GestureLook &look = lookOf(gesture.gesture);
    const bool hasRegion = gesture.region != kPixelRegionNone;
    appendCells(_environment.output.text(),
                {.time = timeText(gesture.timeNs),
                 .gesture = look.name,
                 .region = hasRegion ? titleOf(gesture.region) : std::string_view(),
                 .duration = gesture.durationMs ? std::to_string(*gesture.durationMs) : std::string(),
                 .action = titleOf(gesture.action),
                 .finger = gesture.finger},
                look.colour, _environment.usesColour);
    _environment.output.wrote();
}

void LiveTable::printSilence(std::uint64_t timeNs, const std::string &what, bool isMissed) {
    beginRow();
    std::string row;
    appendCells(row,
                {.time = timeText(timeNs),
                 .gesture = "no gesture",
                 .region = "",
                 .duration = "",
                 .action = isMissed ? "(missed)" : "nothing",
                 .finger = what},
                Colour::None, false);
    appendColoured(_environment.output.text(), row.substr(0, row.size() - 1), Colour::Dim,
                   _environment.usesColour);
    _environment.output.write("\n");
}

void LiveTable::refresh(std::uint64_t timeNs, const std::optional<InputReport::Image> &image) {
    // The last column stays free: a terminal may go on to the next line behind it.
    const std::size_t columns = _environment.screenColumns();
    if (columns > 1 && image) {
        const bool hasPicture =
            columns > kPictureColumns && _environment.screenRows() >= kPictureRows + kRowsAbovePicture;
        eraseElectrodes();
        _environment.output.write((hasPicture ? electrodePicture : electrodeLine)(*image, timeNs, columns - 1,
                                                                                  _environment.usesColour));
        _visibleLines = hasPicture ? kPictureRows : 1;
    }
    _environment.output.flush();
}

void LiveTable::clear() {
    eraseElectrodes();
    _environment.output.flush();
}

void LiveTable::beginRow() {
    eraseElectrodes();
    if (std::exchange(_hasRows, true))
        return;
    std::string row;
    appendCells(row,
                {.time = "time s",
                 .gesture = "gesture",
                 .region = "region",
                 .duration = "ms",
                 .action = "host does",
                 .finger = "finger did"},
                Colour::None, false);
    appendColoured(_environment.output.text(), row.substr(0, row.size() - 1), Colour::Dim,
                   _environment.usesColour);
    _environment.output.write("\n");
}

void LiveTable::appendCells(std::string &row, const Cells &cells, Colour gestureColour,
                            bool usesColour) const {
    std::string gesture;
    appendLeft(gesture, cells.gesture, kGestureWidth);
    appendRight(row, cells.time, kTimeWidth);
    appendColoured(row.append(kGap), gesture, gestureColour, usesColour);
    if (isNarrow()) {
        row.append(cells.region).append("\n");
        return;
    }
    appendLeft(row, cells.region, kRegionWidth);
    appendRight(row, cells.duration, kDurationWidth);
    row.append(kGap);
    if (_showsFinger && !cells.finger.empty())
        appendLeft(row, cells.action, kActionWidth);
    else
        row.append(cells.action);
    row.append(_showsFinger ? cells.finger : std::string_view()).append("\n");
}

void LiveTable::eraseElectrodes() {
    const std::size_t lines = std::exchange(_visibleLines, 0);
    std::string &text = _environment.output.text();
    if (lines > 1)
        text.append("\r\x1b[").append(std::to_string(lines - 1)).append("A\x1b[J");
    else if (lines == 1)
        text.append(kEraseLine);
}

bool LiveTable::isNarrow() const {
    const std::size_t columns = _environment.screenColumns();
    return columns > 0 && columns <= kTableWidth;
}

} // namespace ZorvaTouch::Tools
