#include "Tools/Stimulus/Golden.h"

#include "Tools/Stimulus/EventNames.h"
#include "Tools/Stimulus/StimulusText.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

// The cases are the texts beside this file. What a case expects, and why, is in its comments.

namespace ZorvaTouch::Tools {
namespace {

namespace fs = std::filesystem;
using ::testing::IsSupersetOf;
using ::testing::StartsWith;

const fs::path kFolder = ZORVA_TEST_DIR "/Golden";

/// Names of the cases, in order: the files' without extension.
std::vector<std::string> goldenCases() {
    std::vector<std::string> names;
    for (const auto &entry : fs::directory_iterator(kFolder))
        if (entry.path().extension() == ".txt")
            names.push_back(entry.path().stem().string());
    std::sort(names.begin(), names.end());
    return names;
}

std::string textOf(const std::string &name) {
    std::ifstream stream(kFolder / (name + ".txt"), std::ios::binary);
    EXPECT_TRUE(stream.is_open()) << name;
    return {std::istreambuf_iterator<char>(stream), {}};
}

/// A test's name may have letters and digits only.
std::string testNameOf(const ::testing::TestParamInfo<std::string> &info) {
    std::string name = info.param;
    std::replace_if(
        name.begin(), name.end(), [](unsigned char c) { return std::isalnum(c) == 0; }, '_');
    return name;
}

class GoldenCase : public ::testing::TestWithParam<std::string> {};

TEST_P(GoldenCase, ReplaysAsExpected) { EXPECT_EQ(compareGolden(textOf(GetParam())), ""); }

INSTANTIATE_TEST_SUITE_P(Files, GoldenCase, ::testing::ValuesIn(goldenCases()), testNameOf);

/// "tap volume-up" of "frame 8 @70ms tap volume-up", "reset" of "reset".
std::string gestureAndRegion(const std::string &eventLine) {
    const std::size_t time = eventLine.find('@');
    return time == std::string::npos ? eventLine : eventLine.substr(eventLine.find(' ', time) + 1);
}

std::vector<std::string> expectedGestures() {
    std::vector<std::string> gestures;
    for (const std::string &name : goldenCases())
        for (const ExpectedLine &line : parseStimulus(textOf(name)).expected)
            if (line.kind == ExpectedLine::Kind::Event)
                gestures.push_back(gestureAndRegion(line.text));
    return gestures;
}

/// As the text form writes them: a reset is alone, a cancel has no region, every other gesture has all three.
std::vector<std::string> everyGestureInEveryRegion() {
    std::vector<std::string> gestures{"reset", "cancel none"};
    for (const Gesture gesture : kGestures)
        if (gesture != Gesture::Reset && gesture != Gesture::Cancel)
            for (const auto region : {kPixelRegionPlayPause, kPixelRegionVolumeDown, kPixelRegionVolumeUp})
                gestures.push_back(std::string(nameOf(gesture)).append(" ").append(nameOf(region)));
    return gestures;
}

TEST(GoldenSet, HasEveryGestureInEveryRegion) {
    const auto all = everyGestureInEveryRegion();
    EXPECT_EQ(all.size(), 17u); // 5 gestures in 3 regions, cancel, reset
    EXPECT_THAT(expectedGestures(), IsSupersetOf(all));
}

TEST(GoldenSet, EveryCaseSaysFirstWhatItShows) {
    for (const std::string &name : goldenCases())
        EXPECT_THAT(textOf(name), StartsWith("# ")) << name;
}

} // namespace
} // namespace ZorvaTouch::Tools
