#include "Tools/Cli/ElectrodeLine.h"

#include "Shared/Pixel.h"
#include "Shared/SensorPicture.h"
#include "Tools/Cli/GestureLook.h"
#include "Tools/Cli/Layout.h"

#include <algorithm>
#include <array>
#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

/// Eighths of a character, from none on.
constexpr std::array<std::string_view, 9> kBars{" ", "▁", "▂", "▃", "▄", "▅", "▆", "▇", "█"};
constexpr std::int32_t kCountsPerStep = 75; ///< scaled counts: a firm finger gives some 600
constexpr std::int32_t kTouched = 200;      ///< the recognizer's default threshold

constexpr std::size_t kTimeWidth = 9;    // "   3.20 s"; more after hours
constexpr std::size_t kRegionWidth = 13; // "  volume down"
constexpr std::size_t kWideCell = 3;
constexpr std::size_t kNarrowCell = 2;
constexpr std::uint64_t kNanosecondsPerCentisecond = 10'000'000;

/// In the order of the region codes.
constexpr std::array<Colour, kPixelRegionCount> kRegionColours{Colour::None, Colour::Green, Colour::Magenta,
                                                               Colour::Cyan};

using Values = std::array<std::int32_t, kElectrodeCount>;

/// Signals with the electrodes' gains, as the recognizer sees them.
Values scaledValues(const InputReport::Image &image) {
    static const Pixels pixels = makePixels();
    Values values;
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        values[i] = static_cast<std::int32_t>(static_cast<float>(image.signals[i]) * pixels[i].gain);
    return values;
}

PixelRegion regionOfIndex(std::size_t electrode) {
    return regionOfElectrode(static_cast<std::int32_t>(electrode));
}

/// The region of the strongest electrode, if that is touched.
PixelRegion activeRegion(const Values &values) {
    const auto *const strongest = std::max_element(values.begin(), values.end());
    return *strongest > kTouched ? regionOfIndex(static_cast<std::size_t>(strongest - values.begin()))
                                 : kPixelRegionNone;
}

std::string_view barOf(std::int32_t value) {
    const std::int32_t steps = (std::max(value, 0) + kCountsPerStep / 2) / kCountsPerStep;
    return kBars[std::min(static_cast<std::size_t>(steps), kBars.size() - 1)];
}

/// The time and a gap.
std::string timeText(std::uint64_t timeNs) {
    const std::uint64_t centiseconds = timeNs / kNanosecondsPerCentisecond;
    const std::string decimals = std::to_string(centiseconds % 100);
    std::string text;
    appendRight(text,
                std::to_string(centiseconds / 100) + (decimals.size() < 2 ? ".0" : ".") + decimals + " s",
                kTimeWidth);
    return text.append("  ");
}

void appendElectrodes(std::string &text, const Values &values, std::size_t cellWidth, bool usesColour) {
    const PixelRegion active = activeRegion(values);
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        std::string cell(1, static_cast<char>('A' + i));
        cell.append(barOf(values[i]));
        const bool isActive = active != kPixelRegionNone && regionOfIndex(i) == active;
        appendColoured(text, cell, isActive ? kRegionColours[active] : Colour::Dim, usesColour);
        text.append(i + 1 < kElectrodeCount ? cellWidth - kNarrowCell : 0, ' ');
    }
}

// --- The picture

constexpr std::size_t kLegendColumns = 40;
constexpr std::size_t kTimeRow = 1;
constexpr std::size_t kRegionRow = 2;
constexpr std::size_t kLegendRow = 5;
constexpr std::array<std::string_view, 3> kLegend{
    "A to O  electrodes at their places", "▁ to █  weak to firm touch", "colour  the touched region:"};

/// One row of the sensor. A run of one letter becomes the letter and a bar.
void appendSensorRow(std::string &text, std::string_view row, const Values &values, bool usesColour) {
    const PixelRegion active = activeRegion(values);
    for (std::size_t at = 0; at < row.size();) {
        const std::size_t end = row.find_first_not_of(row[at], at);
        const std::size_t length = std::min(end, row.size()) - at;
        if (row[at] == ' ') {
            text.append(length, ' ');
        } else {
            const auto electrode = static_cast<std::size_t>(row[at] - 'A');
            std::string field(1, row[at]);
            for (std::size_t i = 1; i < length; ++i)
                field.append(barOf(values[electrode]));
            const bool isActive = active != kPixelRegionNone && regionOfIndex(electrode) == active;
            appendColoured(text, field, isActive ? kRegionColours[active] : Colour::Dim, usesColour);
        }
        at += length;
    }
}

/// What stands beside a row of the sensor.
void appendBeside(std::string &text, std::size_t row, std::uint64_t timeNs, PixelRegion active,
                  bool usesColour) {
    if (row == kTimeRow)
        text.append("  ").append(timeText(timeNs));
    else if (row == kRegionRow && active != kPixelRegionNone)
        appendColoured(text.append("  "), titleOf(active), kRegionColours[active], usesColour);
    else if (row >= kLegendRow && row < kLegendRow + kLegend.size())
        appendColoured(text.append("  "), kLegend[row - kLegendRow], Colour::Dim, usesColour);
    else if (row == kLegendRow + kLegend.size())
        for (const auto region : {kPixelRegionPlayPause, kPixelRegionVolumeDown, kPixelRegionVolumeUp})
            appendColoured(text.append("  "), titleOf(region), kRegionColours[region], usesColour);
}

} // namespace

std::string electrodePicture(const InputReport::Image &image, std::uint64_t timeNs, std::size_t columns,
                             bool usesColour) {
    if (columns < kPictureColumns)
        return {};
    const Values values = scaledValues(image);
    const auto rows = Util::sensorRows();
    std::string text;
    for (std::size_t row = 0; row < rows.size(); ++row) {
        text.append(row == 0 ? "" : "\n");
        appendSensorRow(text, rows[row], values, usesColour);
        if (columns >= kPictureColumns + kLegendColumns)
            appendBeside(text, row, timeNs, activeRegion(values), usesColour);
    }
    return text;
}

std::string electrodeLine(const InputReport::Image &image, std::uint64_t timeNs, std::size_t columns,
                          bool usesColour) {
    constexpr std::size_t kWide = kElectrodeCount * kWideCell - 1;
    constexpr std::size_t kNarrow = kElectrodeCount * kNarrowCell;
    if (columns < kNarrow)
        return {};
    const Values values = scaledValues(image);
    const std::string time = timeText(timeNs);
    std::string text;
    if (columns >= time.size() + kWide)
        text.append(time);
    appendElectrodes(text, values, columns >= kWide ? kWideCell : kNarrowCell, usesColour);
    const PixelRegion active = activeRegion(values);
    if (columns >= time.size() + kWide + kRegionWidth && active != kPixelRegionNone)
        appendColoured(text.append("  "), titleOf(active), kRegionColours[active], usesColour);
    return text;
}

} // namespace ZorvaTouch::Tools
