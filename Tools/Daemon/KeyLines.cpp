#include "Tools/Daemon/KeyLines.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/GestureLook.h"
#include "Tools/Cli/Layout.h"

namespace ZorvaTouch::Tools {
namespace {

// Columns, in characters; each stands two blanks from the next.
constexpr std::size_t kTimeWidth = 11;
constexpr std::size_t kRegionWidth = 11;
constexpr std::size_t kGestureWidth = 15;
constexpr std::size_t kKeyWidth = 18;
constexpr std::size_t kChangeWidth = 4;
constexpr std::string_view kGap = "  ";

constexpr std::int64_t kSecond = 1'000'000'000;

std::string left(std::string_view content, std::size_t width) {
    std::string text;
    appendLeft(text, content, width);
    return text.append(kGap);
}

std::string right(std::string_view content, std::size_t width) {
    std::string text;
    appendRight(text, content, width);
    return text.append(kGap);
}

std::string keyTitle(KeyCode code) {
    const std::string_view name = nameOfKey(code);
    return name.empty() ? "key " + std::to_string(code) : std::string(name);
}

/// Adds the line break instead of blanks at the end.
std::string finished(std::string line) {
    line.erase(line.find_last_not_of(' ') + 1);
    return line.append("\n");
}

} // namespace

std::string keyHeading(bool usesColour) {
    std::string line = right("time", kTimeWidth) + left("region", kRegionWidth) +
                       left("gesture", kGestureWidth) + left("key", kKeyWidth) + "is";
    std::string text;
    appendColoured(text, line, Colour::Dim, usesColour);
    return text.append("\n");
}

std::string keyLine(const ShownKey &shown, bool usesColour) {
    const GestureLook look = shown.gesture ? lookOf(*shown.gesture) : GestureLook{"", Colour::None};
    std::string line =
        right(fixedPointText(static_cast<std::int64_t>(shown.timeNs), kSecond) + " s", kTimeWidth);
    line.append(left(shown.region == kPixelRegionNone ? "" : titleOf(shown.region), kRegionWidth));
    appendColoured(line, left(look.name, kGestureWidth), look.colour, usesColour);
    line.append(left(keyTitle(shown.change.code), kKeyWidth));
    const std::string_view change = shown.change.isPressed ? "down" : "up";
    appendColoured(line, change, shown.change.isPressed ? Colour::Bold : Colour::Dim, usesColour);
    if (!shown.surface.empty())
        line.append(left("", kChangeWidth - change.size())).append(Util::printable(shown.surface));
    return finished(std::move(line));
}

std::string droppedKeyLine(std::uint64_t lines) {
    return right("", kTimeWidth) + "(" + std::to_string(lines) + (lines == 1 ? " line" : " lines") +
           " not shown)\n";
}

} // namespace ZorvaTouch::Tools
