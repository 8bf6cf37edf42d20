#include "Tests/Unit/Synth/Recognition.h"

#include "Host/Runtime/Files.h"
#include "Shared/RecordingContainer.h"
#include "Synth/Stream.h"
#include "Tools/Stimulus/StimulusText.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

// How well the recognizer does on synthetic contacts, and that Docs/Synth.md tells it as it is.

namespace ZorvaTouch::Test {
namespace {

constexpr std::uint64_t kSeed = 1;
constexpr double kSeconds = 1200;
constexpr double kDaySeconds = 3600;

using Rows = std::vector<std::string>;

std::string cell(std::size_t value) { return " " + std::to_string(value) + " |"; }

/// The scenario's rows of the table.
Rows rowsOf(const Synth::Scenario &scenario, const Recognition &result) {
    const std::string name = "| " + std::string(scenario.name) + " | ";
    Rows rows;
    for (const auto &[kind, outcomes] : result.byKind)
        rows.push_back(name + kind + " |" + cell(outcomes.labels) + cell(outcomes.right) +
                       cell(outcomes.wrongRegion) + cell(outcomes.wrongGesture) + cell(outcomes.nothing));
    if (result.stray > 0)
        rows.push_back(name + "stray gestures |" + cell(result.stray) + " | | | |");
    return rows;
}

Rows documentedRows(const Synth::Scenario &scenario) {
    std::istringstream page(Host::readFile(ZORVA_TEST_DIR "/../Docs/Synth.md"));
    const std::string begins = "| " + std::string(scenario.name) + " | ";
    Rows rows;
    for (std::string line; std::getline(page, line);)
        if (line.starts_with(begins))
            rows.push_back(line);
    return rows;
}

class SynthRecognition : public ::testing::TestWithParam<std::string> {};

TEST_P(SynthRecognition, IsAsThePageSays) {
    const Synth::Scenario &scenario = *Synth::scenarioNamed(GetParam());
    const double seconds = scenario.name == "day" ? kDaySeconds : kSeconds;
    const FrameList frames = Synth::synthesize(scenario, Synth::parametersOf(scenario), kSeed, seconds);
    const Rows rows = rowsOf(scenario, recognize(frames));
    std::string table;
    for (const std::string &row : rows)
        table += row + "\n";
    EXPECT_EQ(rows, documentedRows(scenario)) << "It is now:\n" << table;
}

std::vector<std::string> scenarioNames() {
    std::vector<std::string> names;
    for (const Synth::Scenario &scenario : Synth::scenarios())
        names.emplace_back(scenario.name);
    return names;
}

std::string testName(const ::testing::TestParamInfo<std::string> &info) {
    std::string name = info.param;
    std::erase(name, '-');
    return name;
}

INSTANTIATE_TEST_SUITE_P(All, SynthRecognition, ::testing::ValuesIn(scenarioNames()), testName);

// --- The matching of labels and gestures
// ---------------------------------------------------------------------------

/// A tap on A of 120 ms whose image goes up at 100 ms, and a label of that kind and region.
Recognition recognizeTapLabelled(const std::string &kind, std::uint32_t region, std::uint32_t startMs,
                                 std::uint32_t endMs) {
    FrameList frames = Tools::parseStimulus("idle for 100ms\ntouch A=300 for 120ms\nidle for 100ms\n").frames;
    Frame label;
    label.type = FrameType::Metadata;
    label.key = "Label";
    label.value =
        PropertyValue::Dictionary{{"Kind", kind}, {"Region", region}, {"StartMs", startMs}, {"EndMs", endMs}};
    frames.append(label);
    return recognize(frames);
}

TEST(SynthRecognitionMatch, ATapInItsRegionIsRight) {
    const Recognition result = recognizeTapLabelled("Tap", 1, 90, 230);
    EXPECT_EQ(result.byKind.at("Tap").labels, 1u);
    EXPECT_EQ(result.byKind.at("Tap").right, 1u);
    EXPECT_EQ(result.stray, 0u);
}

TEST(SynthRecognitionMatch, ATapElsewhereIsInTheWrongRegion) {
    EXPECT_EQ(recognizeTapLabelled("Tap", 3, 90, 230).byKind.at("Tap").wrongRegion, 1u);
}

TEST(SynthRecognitionMatch, ATapForAHoldIsTheWrongGesture) {
    EXPECT_EQ(recognizeTapLabelled("Hold", 1, 90, 230).byKind.at("Hold").wrongGesture, 1u);
}

TEST(SynthRecognitionMatch, ATapIsNoSlide) {
    const Recognition result = recognizeTapLabelled("Slide", 1, 90, 230);
    EXPECT_EQ(result.byKind.at("Slide").nothing, 1u);
    EXPECT_EQ(result.stray, 1u);
}

TEST(SynthRecognitionMatch, AnAccidentThatTapsIsAWrongGesture) {
    const Recognition result = recognizeTapLabelled("Palm", 0, 90, 230);
    EXPECT_EQ(result.byKind.at("Palm").wrongGesture, 1u);
    EXPECT_EQ(result.stray, 0u);
}

TEST(SynthRecognitionMatch, ATapAtAnotherTimeIsStray) {
    const Recognition result = recognizeTapLabelled("Tap", 1, 20, 80);
    EXPECT_EQ(result.byKind.at("Tap").nothing, 1u);
    EXPECT_EQ(result.stray, 1u);
}

TEST(SynthRecognitionMatch, AnAccidentWithoutAGestureIsRight) {
    EXPECT_EQ(recognizeTapLabelled("Palm", 0, 20, 80).byKind.at("Palm").right, 1u);
}

} // namespace
} // namespace ZorvaTouch::Test
