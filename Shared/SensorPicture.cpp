#include "Shared/SensorPicture.h"

#include "Shared/Util/Text.h"

#include <algorithm>
#include <array>
#include <string_view>

namespace ZorvaTouch::Util {
namespace {

constexpr std::array<std::string_view, 13> kSensorRows{
    "           HHHH      GGGG           ", "                IIII                ",
    "     BBBB                  AAAA     ", "         JJJJ          JJJJ         ",
    "     FFFF                  EEEE     ", " AAAA                          BBBB ",
    "                KKKK                ", " DDDD                          CCCC ",
    "     EEEE                  FFFF     ", "         LLLL          LLLL         ",
    "     CCCC                  DDDD     ", "                MMMM                ",
    "           NNNN      OOOO           "};

/// Every row is 36 characters of spaces and electrode letters and ends in a space, which closes its last
/// field.
constexpr bool isWellFormed(std::string_view row) {
    return row.size() == 36 && row.back() == ' ' &&
           std::all_of(row.begin(), row.end(), [](char c) { return c == ' ' || (c >= 'A' && c <= 'O'); });
}
static_assert(std::all_of(kSensorRows.begin(), kSensorRows.end(), isWellFormed));

/// Puts a value into a field of `width` characters: right-aligned in its left half, then blanks. A value
/// longer than the field is followed by as many blanks as it is too long, which keeps it apart from its
/// neighbour.
void appendField(std::string &text, std::int64_t value, std::size_t width) {
    const std::size_t before = text.size();
    appendInteger(text, value, width / 2);
    const std::size_t length = text.size() - before;
    text.append(length > width ? length - width : width - length, ' ');
}

void appendRow(std::string &text, std::string_view row, const InputReport::Image &image, bool raw) {
    std::size_t at = 0;
    while (at < row.size()) {
        if (row[at] == ' ') {
            text.push_back(' ');
            ++at;
            continue;
        }
        const std::size_t end = row.find(' ', at);
        const auto electrode = static_cast<std::size_t>(row[at] - 'A');
        appendField(text, raw ? image.rawCounts[electrode] : image.signals[electrode], end - at);
        at = end + 1; // the field stands for its letters and the space after them
    }
    text.push_back('\n');
}

} // namespace

std::span<const std::string_view> sensorRows() noexcept { return kSensorRows; }

std::string stringFromImage(const InputReport::Image &image, bool raw) {
    std::string text = "# Image frame ";
    appendUnsigned(text, image.frameNumber);
    text.append("    time ");
    appendUnsigned(text, image.timeMs);
    text.append(" ms\n\n");
    for (const std::string_view row : kSensorRows)
        appendRow(text, row, image, raw);
    return text;
}

} // namespace ZorvaTouch::Util
