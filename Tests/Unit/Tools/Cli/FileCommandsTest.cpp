#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

#include <filesystem>

// convert, trim and make: commands that write a recording.

namespace ZorvaTouch::Tools {
namespace {

using FileCommands = CliFixture;

TEST_F(FileCommands, ConvertReadsVersionZero) {
    writeFile("old.json", R"({"Version":0,"Reports":[{"Timestamp":5,"ReportData":"01 02"}]})");
    EXPECT_EQ(outputOf({"convert", "@old.json", "@new.json"}), "");
    EXPECT_EQ(readFile("new.json"),
              R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":5,"Data":"01 02 "}]})");
}

TEST_F(FileCommands, ConvertReadsVersionOne) {
    writeFile("old.json", R"({"Version":1,"Frames":[{"Type":"State","Timestamp":7,"Key":"a","Value":1.5},)"
                          R"({"Type":"InputReport","Timestamp":5,"Report":"FF"}]})");
    EXPECT_EQ(outputOf({"convert", "@old.json", "@new.json"}), "");
    // The frames keep their order, although the second one is earlier.
    EXPECT_EQ(readFile("new.json"),
              R"({"Version":2,"Frames":[{"Type":"State","Timestamp":7,"Key":"a","Value":1.5},)"
              R"({"Type":"InputReport","Timestamp":5,"Data":"ff "}]})");
}

TEST_F(FileCommands, ConvertLeavesVersionTwoAsItIs) {
    const std::string text =
        R"({"Version":2,"Frames":[{"Type":"Metadata","Timestamp":1,"Key":"a","Value":[true]}]})";
    writeFile("same.json", text);
    EXPECT_EQ(outputOf({"convert", "@same.json", "@same.json"}), "");
    EXPECT_EQ(readFile("same.json"), text);
}

TEST_F(FileCommands, ConvertGoesFromStandardInputToStandardOutput) {
    input = R"({"Version":1,"Frames":[]})";
    EXPECT_EQ(outputOf({"convert", "-", "-"}), R"({"Version":2,"Frames":[]})");
}

TEST_F(FileCommands, TrimKeepsTheNewestFramesAndTheStatesTheyNeed) {
    makeRecording("long.json", "state a 1\nraw 01\nstate a 2\nstate a 3\nraw 02\nraw 03\n");
    EXPECT_EQ(outputOf({"trim", "@long.json", "@short.json", "--max", "2"}), "");
    EXPECT_EQ(readFile("short.json"),
              R"({"Version":2,"Frames":[{"Type":"State","Timestamp":1000000000,"Key":"a","Value":3},)"
              R"({"Type":"InputReport","Timestamp":1000000000,"Data":"02 "},)"
              R"({"Type":"InputReport","Timestamp":1000000000,"Data":"03 "}]})");
}

TEST_F(FileCommands, TrimGoesToStandardOutput) {
    makeRecording("long.json", "raw 01\nraw 02\n");
    EXPECT_EQ(outputOf({"trim", "--max", "1", "@long.json", "-"}),
              R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1000000000,"Data":"02 "}]})");
}

TEST_F(FileCommands, MakeWritesARecording) {
    writeFile("text.txt", "meta Place bench\nwait 1ms\nraw 0a # any\n");
    EXPECT_EQ(outputOf({"make", "@text.txt", "@made.json"}), "");
    EXPECT_EQ(
        readFile("made.json"),
        R"({"Version":2,"Frames":[{"Type":"Metadata","Timestamp":1000000000,"Key":"Place","Value":"bench"},)"
        R"({"Type":"InputReport","Timestamp":1001000000,"Data":"0a "}]})");
}

TEST_F(FileCommands, MakeReportsWhatIsNotAsExpected) {
    writeFile("good.txt", "touch A=300 for 120ms\nidle for 50ms\n\n"
                          "frame 1 @0ms may-begin play/pause\nframe 13 @120ms tap play/pause\n");
    EXPECT_EQ(outputOf({"make", "@good.txt", "@made.json"}), "");
    writeFile("bad.txt", "touch A=300 for 120ms\nidle for 50ms\n\n"
                         "frame 1 @0ms may-begin play/pause\nframe 13 @120ms tap volume-up\n");
    const Run result = run({"make", "@bad.txt", "@bad.json"});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.error, "zorvatouch: " + path("bad.txt") +
                                ": the replay differs from the expected lines (- expected, + replayed)\n"
                                "  frame 1 @0ms may-begin play/pause\n"
                                "- frame 13 @120ms tap volume-up\n"
                                "+ frame 13 @120ms tap play/pause\n");
    EXPECT_EQ(readFile("bad.json"), readFile("made.json")) << "the recording is written all the same";
}

TEST_F(FileCommands, MakeGoesFromStandardInputToStandardOutput) {
    input = "raw";
    EXPECT_EQ(outputOf({"make", "-", "-"}),
              R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1000000000,"Data":""}]})");
}

TEST_F(FileCommands, MakeSaysWhichLineIsWrong) {
    writeFile("text.txt", "idle\ntouch P=3\n");
    EXPECT_EQ(errorOf({"make", "@text.txt", "@made.json"}),
              "zorvatouch: @text.txt: line 2: unknown electrode 'P'\n");
    input = "\nfoo";
    EXPECT_EQ(errorOf({"make", "-", "@made.json"}),
              "zorvatouch: standard input: line 2: unknown directive 'foo'\n");
    EXPECT_EQ(fileNames(), "text.txt ");
}

TEST_F(FileCommands, AnErrorLeavesTheOldFileAlone) {
    writeFile("out.json", "precious");
    writeFile("bad.json", "{");
    EXPECT_EQ(run({"convert", "@bad.json", "@out.json"}).status, 2);
    EXPECT_EQ(run({"trim", "@bad.json", "@out.json", "--max", "1"}).status, 2);
    EXPECT_EQ(readFile("out.json"), "precious");
}

TEST_F(FileCommands, AFolderThatIsNotThereIsAnError) {
    makeRecording("a.json", "raw");
    EXPECT_EQ(errorOf({"convert", "@a.json", "@no/b.json"}),
              "zorvatouch: @no/b.json: cannot open a temporary file beside it: No such file or directory\n");
}

TEST_F(FileCommands, WriteErrorsAreReported) {
    makeRecording("a.json", "raw");
    outputSink.isFull = true;
    EXPECT_EQ(errorOf({"convert", "@a.json", "-"}),
              "zorvatouch: standard output: cannot write: No space left on device\n");
    EXPECT_EQ(errorOf({"replay", "@a.json"}),
              "zorvatouch: standard output: cannot write: No space left on device\n");
    EXPECT_EQ(errorOf({"--version"}), "zorvatouch: standard output: cannot write: No space left on device\n");
}

} // namespace
} // namespace ZorvaTouch::Tools
