#include "Synth/Electrodes.h"

#include "Shared/SensorPicture.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>

namespace ZorvaTouch::Synth {
namespace {

/// The sensor picture with "AAAA" for electrode A: the fields of four characters lose the blank after them,
/// which is put back.
std::vector<std::string> drawnRows() {
    InputReport::Image image{};
    for (std::size_t i = 0; i < kElectrodeCount; ++i)
        image.rawCounts[i] = static_cast<std::uint16_t>(1000 + i); // four digits fill a field
    std::istringstream text(Util::stringFromImage(image, true));
    std::vector<std::string> rows;
    for (std::string row; std::getline(text, row);) {
        for (std::size_t at = row.find('1'); at != std::string::npos; at = row.find('1', at + 5)) {
            const auto letter = static_cast<char>('A' + std::stoi(row.substr(at, 4)) - 1000);
            row.replace(at, 4, std::string(4, letter) + ' ');
        }
        rows.push_back(row);
    }
    rows.erase(rows.begin(), rows.begin() + 2); // heading
    return rows;
}

TEST(SynthElectrodes, LieWhereTheSensorPictureHasThem) {
    std::vector<std::string> rows(13, std::string(36, ' '));
    for (const Pad &pad : pads()) {
        // 0.5 mm a column, 1 mm a row
        const auto left = static_cast<std::size_t>((pad.centre.x - pad.width / 2) / 0.5);
        const auto columns = static_cast<std::size_t>(pad.width / 0.5);
        const auto row = static_cast<std::size_t>(pad.centre.y - pad.height / 2);
        rows.at(row).replace(left, columns, std::string(columns, static_cast<char>('A' + pad.electrode)));
    }
    EXPECT_EQ(rows, drawnRows());
}

TEST(SynthElectrodes, TheSensorIs18By13Millimetres) {
    EXPECT_EQ(kSensorWidthMm, 18);
    EXPECT_EQ(kSensorHeightMm, 13);
}

TEST(SynthElectrodes, PadsAreTwoSquareMillimetres) {
    for (const Pad &pad : pads()) {
        EXPECT_EQ(pad.width, 2);
        EXPECT_EQ(pad.height, 1);
    }
}

TEST(SynthElectrodes, ElectrodesThatNeedMoreGainGiveLess) {
    EXPECT_EQ(sensitivities()[7], 1);                   // H
    EXPECT_NEAR(sensitivities()[10], 0.41401, 0.00001); // K: 1 / 2.4154
    EXPECT_NEAR(sensitivities()[0], 0.52032, 0.00001);  // A: 1 / 1.9219
}

TEST(SynthElectrodes, FingersAimAtTheMiddleOfARegion) {
    // Twelve of the thirteen pads of play/pause lie in pairs around the middle, where the last one, K, is.
    EXPECT_DOUBLE_EQ(centreOf(kPixelRegionPlayPause).x, 9);
    EXPECT_DOUBLE_EQ(centreOf(kPixelRegionPlayPause).y, 6.5);
    // H, G, I and J twice: (6.5 + 11.5 + 9 + 5.5 + 12.5) / 5 and (0.5 + 0.5 + 1.5 + 3.5 + 3.5) / 5
    EXPECT_DOUBLE_EQ(centreOf(kPixelRegionVolumeUp).x, 9);
    EXPECT_DOUBLE_EQ(centreOf(kPixelRegionVolumeUp).y, 1.9);
    EXPECT_DOUBLE_EQ(centreOf(kPixelRegionVolumeDown).x, 9);
    EXPECT_DOUBLE_EQ(centreOf(kPixelRegionVolumeDown).y, 11.1);
}

} // namespace
} // namespace ZorvaTouch::Synth
