#include "Tools/Cli/ElectrodeLine.h"

#include "Tools/Cli/Layout.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

using ::testing::EndsWith;
using ::testing::HasSubstr;

constexpr std::uint64_t kTimeNs = 3'209'999'999; // cut to 3.20 s

/// Signals of electrode I, whose gain is 1.4851, and of H, whose gain is 1.
InputReport::Image imageOf(std::int16_t i, std::int16_t h) {
    InputReport::Image image{};
    image.signals[8] = i;
    image.signals[7] = h;
    return image;
}

TEST(ElectrodeLine, HasTimeElectrodesAndTheRegionThatIsTouched) {
    // 404 counts times 1.4851 are 599.9, 600 steps of 75 are 8; 100 counts are 1.
    EXPECT_EQ(electrodeLine(imageOf(404, 100), kTimeNs, 79, false),
              "   3.20 s  A  B  C  D  E  F  G  H▁ I█ J  K  L  M  N  O   volume up");
}

TEST(ElectrodeLine, BarsAreRoundedToEighthsAndEndAtTheLast) {
    const auto barOfH = [](std::int16_t signal) {
        const std::string line = electrodeLine(imageOf(0, signal), 0, 30, false);
        const std::size_t at = line.find('H') + 1;
        return line.substr(at, line.find('I') - at);
    };
    EXPECT_EQ(barOfH(0), " ");
    EXPECT_EQ(barOfH(37), " "); // half of 75, rounded down to 37, is the first that shows with 38
    EXPECT_EQ(barOfH(38), "▁");
    EXPECT_EQ(barOfH(113), "▂");
    EXPECT_EQ(barOfH(600), "█");
    EXPECT_EQ(barOfH(32767), "█");
    EXPECT_EQ(barOfH(-300), " ");
}

TEST(ElectrodeLine, ARegionIsTouchedAboveTheThreshold) {
    EXPECT_THAT(electrodeLine(imageOf(0, 200), 0, 79, false), EndsWith("O "));
    EXPECT_THAT(electrodeLine(imageOf(0, 201), 0, 79, false), EndsWith("O   volume up"));
}

TEST(ElectrodeLine, NarrowScreensGetLess) {
    const auto lineIn = [](std::size_t columns) {
        return electrodeLine(imageOf(404, 0), kTimeNs, columns, false);
    };
    const std::string wide = "A  B  C  D  E  F  G  H  I█ J  K  L  M  N  O ";
    EXPECT_EQ(lineIn(68), "   3.20 s  " + wide + "  volume up");
    EXPECT_EQ(lineIn(67), "   3.20 s  " + wide);
    EXPECT_EQ(lineIn(55), "   3.20 s  " + wide);
    EXPECT_EQ(lineIn(54), wide);
    EXPECT_EQ(lineIn(44), wide);
    EXPECT_EQ(lineIn(43), "A B C D E F G H I█J K L M N O ");
    EXPECT_EQ(lineIn(30), "A B C D E F G H I█J K L M N O ");
    EXPECT_EQ(lineIn(29), "");
    EXPECT_EQ(lineIn(0), "");
}

TEST(ElectrodeLine, NeverTakesMoreColumnsThanThereAre) {
    for (std::size_t columns = 0; columns <= 100; ++columns)
        EXPECT_LE(widthOf(electrodeLine(imageOf(404, 404), 35'999'000'000'000, columns, false)), columns);
}

TEST(ElectrodeLine, TheTouchedRegionHasItsColour) {
    const std::string line = electrodeLine(imageOf(404, 0), 0, 79, true);
    EXPECT_THAT(line, HasSubstr("\x1b[36mG \x1b[0m")); // untouched, but of the region
    EXPECT_THAT(line, HasSubstr("\x1b[36mI█\x1b[0m"));
    EXPECT_THAT(line, HasSubstr("\x1b[2mK \x1b[0m"));
    EXPECT_THAT(line, EndsWith("\x1b[36mvolume up\x1b[0m"));
}

TEST(ElectrodePicture, ShowsEachElectrodeAtItsPlaceBesideALegend) {
    EXPECT_EQ(electrodePicture(imageOf(404, 100), kTimeNs, 79, false),
              "           H▁▁▁      G              \n"
              "                I███                     3.20 s  \n"
              "     B                     A          volume up\n"
              "         J             J            \n"
              "     F                     E        \n"
              " A                             B      A to O  electrodes at their places\n"
              "                K                     ▁ to █  weak to firm touch\n"
              " D                             C      colour  the touched region:\n"
              "     E                     F          play/pause  volume down  volume up\n"
              "         L             L            \n"
              "     C                     D        \n"
              "                M                   \n"
              "           N         O              ");
}

TEST(ElectrodePicture, NarrowScreensGetNoLegendAndThenNothing) {
    const auto columnsOf = [](std::size_t columns) {
        const std::string picture = electrodePicture(imageOf(404, 100), kTimeNs, columns, false);
        std::size_t widest = 0;
        for (std::size_t at = 0; at < picture.size();) {
            const std::size_t end = std::min(picture.find('\n', at), picture.size());
            widest = std::max(widest, widthOf(std::string_view(picture).substr(at, end - at)));
            at = end + 1;
        }
        return widest;
    };
    EXPECT_EQ(columnsOf(76), 72u);
    EXPECT_EQ(columnsOf(75), 36u);
    EXPECT_EQ(columnsOf(36), 36u);
    EXPECT_EQ(columnsOf(35), 0u);
}

TEST(ElectrodePicture, TheTouchedRegionHasItsColour) {
    const std::string picture = electrodePicture(imageOf(404, 0), 0, 79, true);
    EXPECT_THAT(picture, HasSubstr("\x1b[36mI███\x1b[0m"));
    EXPECT_THAT(picture, HasSubstr("\x1b[2mK   \x1b[0m"));
}

} // namespace
} // namespace ZorvaTouch::Tools
