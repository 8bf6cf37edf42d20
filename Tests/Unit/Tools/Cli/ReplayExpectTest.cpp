#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

namespace ZorvaTouch::Tools {
namespace {

using ::testing::EndsWith;
using ::testing::StartsWith;

class ReplayExpect : public CliFixture {
protected:
    void SetUp() override {
        CliFixture::SetUp();
        makeRecording("tap.json", "meta a 1\ntouch A=300 for 20ms\nidle for 20ms\n");
        saved = outputOf({"replay", "--json", "@tap.json"}); // four images and the end
    }

    /// Compares with these lines.
    Run compareWith(const std::string &lines) {
        writeFile("saved.jsonl", lines);
        return run({"replay", "@tap.json", "--expect", "@saved.jsonl"});
    }

    /// Where the difference is, as the first line says, from "frame" or so on.
    static std::string placeIn(const Run &result) {
        const std::string line = result.output.substr(0, result.output.find('\n'));
        return line.substr(line.find("tap.json: ") + 10);
    }

    std::string saved;
};

TEST_F(ReplayExpect, IsSilentWhenAllIsTheSame) {
    const Run result = compareWith(saved);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.error, "");
}

TEST_F(ReplayExpect, TheLastNewlineMayBeMissing) {
    saved.pop_back();
    EXPECT_EQ(compareWith(saved).status, 0);
}

TEST_F(ReplayExpect, TellsTheFirstFrameThatDiffers) {
    const std::string line = "{\"type\":\"image\",\"n\":2,\"frameNumber\":2,\"timeMs\":10,\"events\":[]}";
    const std::string other = "{\"type\":\"image\",\"n\":2,\"frameNumber\":2,\"timeMs\":11,\"events\":[]}";
    saved.replace(saved.find(line), line.size(), other);
    const Run result = compareWith(saved);
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.error, "");
    EXPECT_EQ(result.output, path("tap.json") + ": frame 2 differs from " + path("saved.jsonl") +
                                 ", line 2\n" + "expected: " + other + "\nactual:   " + line + "\n");
}

TEST_F(ReplayExpect, TellsALineThatIsMissing) {
    const Run result = compareWith(saved.substr(0, saved.find('\n') + 1));
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(placeIn(result), EndsWith("saved.jsonl, line 2"));
    EXPECT_THAT(result.output, EndsWith("\nexpected: (nothing more)\nactual:   {\"type\":\"image\",\"n\":2,"
                                        "\"frameNumber\":2,\"timeMs\":10,\"events\":[]}\n"));
}

TEST_F(ReplayExpect, TellsThatTheEndIsMissing) {
    const Run result = compareWith(saved.substr(0, saved.find("{\"type\":\"end\"")));
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(placeIn(result), StartsWith("the end differs from "));
}

TEST_F(ReplayExpect, TellsALineTooMany) {
    const Run result = compareWith(saved + "{}\n");
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(placeIn(result), EndsWith("saved.jsonl, line 6"));
    EXPECT_THAT(result.output, EndsWith("\nexpected: {}\nactual:   (nothing more)\n"));
}

TEST_F(ReplayExpect, NothingAtAllDiffersAtTheFirstLine) {
    const Run result = compareWith("");
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(placeIn(result), StartsWith("frame 1 differs from "));
}

TEST_F(ReplayExpect, ComparesDescriptionsToo) {
    writeFile("described.jsonl", outputOf({"replay", "--json", "--describe", "@tap.json"}));
    EXPECT_EQ(run({"replay", "--describe", "@tap.json", "--expect", "@described.jsonl"}).status, 0);
    EXPECT_EQ(run({"replay", "@tap.json", "--expect", "@described.jsonl"}).status, 1);
    // The factor of ABE, which A is a part of: another value and the same events.
    EXPECT_EQ(run({"replay", "--describe", "@tap.json", "--set", "VirtualNormalizationFactors.0=0.5",
                   "--expect", "@described.jsonl"})
                  .status,
              1);
}

TEST_F(ReplayExpect, ReadsTheSavedLinesFromStandardInput) {
    input = saved;
    EXPECT_EQ(run({"replay", "@tap.json", "--expect", "-"}).status, 0);
}

TEST_F(ReplayExpect, TakesExactlyOneRecording) {
    EXPECT_EQ(errorOf({"replay", "@tap.json", "@tap.json", "--expect", "@saved.jsonl"}),
              "zorvatouch: --expect takes exactly one recording (see zorvatouch replay --help)\n");
}

TEST_F(ReplayExpect, CannotCompareWithAFileThatIsNotThere) {
    EXPECT_EQ(errorOf({"replay", "@tap.json", "--expect", "@nothing.jsonl"}),
              "zorvatouch: @nothing.jsonl: cannot open: No such file or directory\n");
}

} // namespace
} // namespace ZorvaTouch::Tools
