#include "Shared/SensorPicture.h"

#include <sstream>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

InputReport::Image emptyImage() { return InputReport::Image{}; }

InputReport::Image imageWithSignal(char letter, std::int16_t signal) {
    InputReport::Image image = emptyImage();
    image.signals.at(static_cast<std::size_t>(letter - 'A')) = signal;
    return image;
}

/// One line of a picture, counting from the heading as line 0; the empty line is 1 and the rows begin at 2.
std::string lineOf(const std::string &picture, std::size_t number) {
    std::istringstream lines(picture);
    std::string line;
    for (std::size_t i = 0; i <= number; ++i)
        std::getline(lines, line);
    return line;
}

// Each field is four characters wide, its value right-aligned in the left two; a field takes the place of its
// letters and of the blank after them, so every field makes its row one character shorter than the 36 of the
// drawing.
TEST(SensorPicture, DrawsEverySignalAtItsPlaces) {
    InputReport::Image image = emptyImage();
    image.frameNumber = 12;
    image.timeMs = 3456;
    image.signals = {10, 11, 12, 13, 14, 15, 16, 17, 18, 19, 20, 21, 22, 23, 24};
    image.rawCounts.fill(99);
    EXPECT_EQ(Util::stringFromImage(image, false), "# Image frame 12    time 3456 ms\n"
                                                   "\n"
                                                   "           17       16            \n"
                                                   "                18                 \n"
                                                   "     11                   10      \n"
                                                   "         19           19          \n"
                                                   "     15                   14      \n"
                                                   " 10                           11  \n"
                                                   "                20                 \n"
                                                   " 13                           12  \n"
                                                   "     14                   15      \n"
                                                   "         21           21          \n"
                                                   "     12                   13      \n"
                                                   "                22                 \n"
                                                   "           23       24            \n");
}

TEST(SensorPicture, DrawsRawCountsWhenAsked) {
    InputReport::Image image = emptyImage();
    image.rawCounts = {10, 11, 12, 13, 14, 15, 16, 17, 18, 19, 20, 21, 22, 23, 24};
    image.signals.fill(-5);
    EXPECT_EQ(Util::stringFromImage(image, true), "# Image frame 0    time 0 ms\n"
                                                  "\n"
                                                  "           17       16            \n"
                                                  "                18                 \n"
                                                  "     11                   10      \n"
                                                  "         19           19          \n"
                                                  "     15                   14      \n"
                                                  " 10                           11  \n"
                                                  "                20                 \n"
                                                  " 13                           12  \n"
                                                  "     14                   15      \n"
                                                  "         21           21          \n"
                                                  "     12                   13      \n"
                                                  "                22                 \n"
                                                  "           23       24            \n");
}

TEST(SensorPicture, OneDigitIsRightAlignedInHalfTheField) {
    const std::string picture = Util::stringFromImage(imageWithSignal('A', 7), false);
    // Electrode A lies at the right of the third row and at the left of the sixth: " 7" and two blanks.
    EXPECT_EQ(lineOf(picture, 4), "     "
                                  " 0  "
                                  "                 "
                                  " 7  "
                                  "    ");
    EXPECT_EQ(lineOf(picture, 7), " "
                                  " 7  "
                                  "                         "
                                  " 0  ");
}

TEST(SensorPicture, EveryPlaceOfAnElectrodeShowsItsValue) {
    // Electrodes A to F, J and L lie at two places, the others at one.
    const std::string twice = "ABCDEFJL";
    for (char letter = 'A'; letter <= 'O'; ++letter) {
        const std::string picture = Util::stringFromImage(imageWithSignal(letter, 777), false);
        std::size_t places = 0;
        for (std::size_t at = picture.find("777"); at != std::string::npos; at = picture.find("777", at + 1))
            ++places;
        EXPECT_EQ(places, twice.find(letter) == std::string::npos ? 1u : 2u) << letter;
    }
}

struct FieldCase {
    std::int16_t signal;
    const char *row; ///< row 2 of the drawing: 16 blanks, the field of electrode I, 15 blanks
};

TEST(SensorPicture, FieldsAreFilledUpToFourCharactersAndGrowBeyond) {
    const std::vector<FieldCase> cases{
        {0, "                 0                 "},
        {-7, "                -7                 "},
        {42, "                42                 "},
        {-42, "                -42                "},
        {999, "                999                "},
        {-999, "                -999               "}, // four characters fit exactly
        {1234, "                1234               "},
        {-1000, "                -1000                "}, // five: one blank follows and the row grows by two
        {32767, "                32767                "},
        {-32768, "                -32768                 "}, // six: two blanks follow
    };
    for (const FieldCase &expected : cases)
        EXPECT_EQ(lineOf(Util::stringFromImage(imageWithSignal('I', expected.signal), false), 3),
                  expected.row)
            << expected.signal;
}

TEST(SensorPicture, ALongValuePushesTheRestOfItsRowToTheRight) {
    // The third row: five blanks, B, 17 blanks, A, four blanks.
    EXPECT_EQ(lineOf(Util::stringFromImage(imageWithSignal('B', -12345), false), 4), "     "
                                                                                     "-12345  "
                                                                                     "                 "
                                                                                     " 0  "
                                                                                     "    ");
}

TEST(SensorPicture, RawCountsAreUnsigned) {
    InputReport::Image image = emptyImage();
    image.rawCounts[8] = 65535;
    image.signals[8] = -1;
    EXPECT_EQ(lineOf(Util::stringFromImage(image, true), 3), "                65535                ");
    EXPECT_EQ(lineOf(Util::stringFromImage(image, false), 3), "                -1                 ");
}

TEST(SensorPicture, HeadingShowsFrameNumberAndTimeUnsigned) {
    InputReport::Image image = emptyImage();
    image.frameNumber = 4294967295u;
    image.timeMs = 2147483648u;
    EXPECT_EQ(lineOf(Util::stringFromImage(image, false), 0),
              "# Image frame 4294967295    time 2147483648 ms");
}

TEST(SensorPicture, EveryRowEndsInANewline) {
    const std::string picture = Util::stringFromImage(emptyImage(), false);
    EXPECT_EQ(std::count(picture.begin(), picture.end(), '\n'), 15); // heading, empty line, 13 rows
    EXPECT_EQ(picture.back(), '\n');
    EXPECT_EQ(lineOf(picture, 1), "");
}

} // namespace
} // namespace ZorvaTouch
