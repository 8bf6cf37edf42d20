#include "Shared/PipelineRecording.h"
#include "Tests/Support/RecordingFakes.h"
#include "Tools/Stimulus/Golden.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>
#include <vector>

// The recordings of Tests/Data are what its README says.

namespace ZorvaTouch {
namespace {

namespace fs = std::filesystem;
using ::testing::ElementsAre;

std::string dataText(const std::string &name) {
    std::ifstream stream(fs::path(ZORVA_TEST_DIR "/Data") / (name + ".json"), std::ios::binary);
    EXPECT_TRUE(stream.is_open()) << name;
    return {std::istreambuf_iterator<char>(stream), {}};
}

/// A recording read and written again.
std::string rewritten(const std::string &name) {
    Scripted::FakeClock clock;
    return PipelineRecording(dataText(name), clock).json();
}

TEST(RecordingData, Version1ReadsToTheFramesOfVersion2) {
    EXPECT_EQ(rewritten("Version1"), rewritten("Version2"));
}

TEST(RecordingData, Version0ReadsToTheReportsOfVersion2) {
    Scripted::FakeClock clock;
    const PipelineRecording newer(dataText("Version2"), clock);
    std::vector<Frame> reports = Scripted::framesOf(newer.frames());
    std::erase_if(reports, [](const Frame &frame) { return frame.type != FrameType::InputReport; });
    EXPECT_EQ(reports.size(), 7u);
    EXPECT_EQ(Scripted::framesOf(PipelineRecording(dataText("Version0"), clock).frames()), reports);
}

TEST(RecordingData, DisorderIsGoneOnceWritten) {
    EXPECT_EQ(rewritten("Version2Unsorted"), rewritten("Version2"));
}

TEST(RecordingData, AnEmptyRecordingIsWrittenAsItWasRead) {
    EXPECT_EQ(rewritten("Version2Empty"), R"({"Version":2,"Frames":[]})");
}

/// The events of a recording, as the golden cases write them.
std::vector<std::string> replayed(const std::string &name) {
    Scripted::FakeClock clock;
    return Tools::replayLines(PipelineRecording(dataText(name), clock).frames(), {});
}

TEST(RecordingData, Version2ReplaysAsAHold) {
    EXPECT_THAT(replayed("Version2"),
                ElementsAre("frame 2 @10ms may-begin play/pause", "frame 5 @40ms hold-start play/pause",
                            "frame 6 @50ms hold-end play/pause"));
}

TEST(RecordingData, Version0WithoutStateWritesReplaysAsATap) {
    EXPECT_THAT(replayed("Version0"),
                ElementsAre("frame 2 @10ms may-begin play/pause", "frame 6 @50ms tap play/pause"));
}

TEST(RecordingData, SixtyFourLevelsAreRead) { EXPECT_NO_THROW(rewritten("Version2DeepestNesting")); }

// --- Broken
// --------------------------------------------------------------------------------------------------------

struct BrokenRecording {
    const char *name;
    const char *message;
};

constexpr const char *kInvalidContainer = "migrateSerializedContainer failed: invalid container";
constexpr const char *kInvalidVersion = "migrateSerializedContainer failed: invalid version";

const std::vector<BrokenRecording> kBrokenRecordings{
    {"Empty", kInvalidContainer},
    {"NotJson", kInvalidContainer},
    {"CutShort", kInvalidContainer},
    {"TextAfterTheValue", kInvalidContainer},
    {"ByteOrderMark", kInvalidContainer},
    {"InvalidUtf8", kInvalidContainer},
    {"UnpairedSurrogate", kInvalidContainer},
    {"NumberOutOfRange", kInvalidContainer},
    {"NestedTooDeep", kInvalidContainer},
    {"TopLevelArray", kInvalidContainer},
    {"VersionMissing", kInvalidVersion},
    {"VersionNotANumber", kInvalidVersion},
    {"VersionUnknown", "migrateSerializedContainer failed: invalid container version: 3"},
    {"Version0ReportWithoutTimestamp", "migrateSerializedContainer failed: frame lacks Timestamp"},
    {"Version0ReportWithoutReportData", "migrateSerializedContainer failed: frame lacks ReportData"},
    {"Version1FrameWithoutType", "migrateSerializedContainer failed: frame lacks Type"},
    {"Version1FrameTypeNotAString", "migrateSerializedContainer failed: frame Type isn't a string"},
    {"Version1ReportWithoutReport", "migrateSerializedContainer failed: frame lacks Report"},
    {"FramesMissing", "invalid frames"},
    {"FramesNotAnArray", "invalid frames"},
    {"FrameNotAnObject", "invalid frame type"},
    {"FrameTypeUnknown", "invalid frame type"},
    {"FrameTimestampMissing", "invalid frame timestamp"},
    {"FrameTimestampNotANumber", "invalid frame timestamp"},
    {"ReportWithoutData", "invalid report"},
    {"ReportDataNotAString", "invalid report"},
    {"ReportDataBeyondAByte", "invalid hex string"},
    {"StateWithoutKey", "invalid state key"},
    {"StateWithoutValue", "invalid state value class"},
    {"MetadataKeyNotAString", "invalid metadata key"},
    {"MetadataWithoutValue", "invalid metadata value class"},
};

/// The message with which a text is refused; empty if it can be read.
std::string refusal(std::string_view text) try {
    Scripted::FakeClock clock;
    const PipelineRecording recording(text, clock);
    return {};
} catch (const std::exception &error) {
    return error.what();
}

TEST(BrokenRecordings, AreRefusedWithTheirMessages) {
    for (const auto &[name, message] : kBrokenRecordings)
        EXPECT_EQ(refusal(dataText(std::string("Broken/") + name)), message) << name;
}

TEST(BrokenRecordings, AreAllOfTheFolder) {
    std::vector<std::string> present, known;
    for (const auto &entry : fs::directory_iterator(ZORVA_TEST_DIR "/Data/Broken"))
        present.push_back(entry.path().stem().string());
    for (const BrokenRecording &broken : kBrokenRecordings)
        known.emplace_back(broken.name);
    std::sort(present.begin(), present.end());
    std::sort(known.begin(), known.end());
    EXPECT_EQ(present, known);
}

} // namespace
} // namespace ZorvaTouch
