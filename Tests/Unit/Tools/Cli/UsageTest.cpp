#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

// How the command line answers to what it is given: help, usage errors, files that cannot be read.

namespace ZorvaTouch::Tools {
namespace {

using Usage = CliFixture;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::MatchesRegex;
using ::testing::Not;
using ::testing::StartsWith;

TEST_F(Usage, VersionIsOneLine) {
    EXPECT_THAT(outputOf({"--version"}), MatchesRegex("zorvatouch [0-9]+\\.[0-9]+\\.[0-9]+\n"));
}

TEST_F(Usage, HelpNamesTheCommandsAndGivesExamples) {
    const std::string help = outputOf({"--help"});
    for (const char *command :
         {"replay", "info", "show", "convert", "trim", "make", "synth", "host", "demo", "help"})
        EXPECT_THAT(help, HasSubstr(std::string("\n  ") + command + " ")) << command;
    EXPECT_THAT(help, HasSubstr("Usage: zorvatouch [OPTIONS] [COMMAND]\n"));
    EXPECT_THAT(help, HasSubstr("\nExamples:\n  zorvatouch replay touch.json\n"));
    EXPECT_THAT(help, HasSubstr("\nExit status:\n  0    done\n"));
    EXPECT_THAT(help, HasSubstr("\nEnvironment:\n  NO_COLOR "));
    EXPECT_EQ(outputOf({"-h"}), help);
    EXPECT_EQ(outputOf({"help"}), help);
}

TEST_F(Usage, HelpOfACommandIsAskedForInTwoWays) {
    EXPECT_EQ(outputOf({"help", "replay"}), outputOf({"replay", "--help"}));
    EXPECT_EQ(outputOf({"help", "help"}), outputOf({"help", "-h"}));
    EXPECT_EQ(errorOf({"help", "replya"}),
              "zorvatouch: 'replya' is not a command; did you mean 'replay'? (see zorvatouch help --help)\n");
}

TEST_F(Usage, WithoutArgumentsTheShortHelpIsShown) {
    const Run result = run({});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(result.error, HasSubstr("Usage: zorvatouch [OPTIONS] [COMMAND]\n"));
    EXPECT_THAT(result.error, HasSubstr("\n  demo "));
    EXPECT_THAT(result.error, HasSubstr("try \"zorvatouch demo\""));
    EXPECT_THAT(result.error, Not(HasSubstr("Exit status")));
}

TEST_F(Usage, RequiredOptionsAreMarked) {
    const std::string help = outputOf({"trim", "--help"});
    EXPECT_THAT(help, HasSubstr("Usage: zorvatouch trim [OPTIONS] --max N IN OUT\n"));
    EXPECT_THAT(help,
                HasSubstr("  --max N               Frames to keep, state writes not counted (required)\n"));
}

TEST_F(Usage, AClosedPipeEndsTheProgramWithoutAMessage) {
    makeRecording("a.json", "raw");
    outputSink.isClosed = true;
    const Run result = run({"replay", "--json", "@a.json"});
    EXPECT_EQ(result.status, 141);
    EXPECT_EQ(result.error, "");
    EXPECT_EQ(run({"--help"}).error, "");
    EXPECT_EQ(run({"convert", "@a.json", "-"}).status, 141);
}

TEST_F(Usage, EveryCommandHasHelpWithExamples) {
    for (const std::string command : {"replay", "info", "show", "convert", "trim", "make", "synth"}) {
        const std::string help = outputOf({command, "--help"});
        EXPECT_THAT(help, HasSubstr("Usage: zorvatouch " + command + " [OPTIONS]"));
        EXPECT_THAT(help, HasSubstr("\nExamples:\n"));
        EXPECT_THAT(help, HasSubstr("  zorvatouch " + command + " "));
    }
}

TEST_F(Usage, ErrorsAreOneLineThatSaysWhereHelpIs) {
    EXPECT_EQ(errorOf({"record"}), "zorvatouch: 'record' is not a command (see zorvatouch --help)\n");
    EXPECT_EQ(errorOf({"record", "a.json"}),
              "zorvatouch: 'record' is not a command (see zorvatouch --help)\n");
    EXPECT_EQ(errorOf({"--loud"}), "zorvatouch: unknown option '--loud' (see zorvatouch --help)\n");
}

TEST_F(Usage, AMisspeltNameGetsASuggestion) {
    const auto problem = [this](std::initializer_list<std::string> arguments) {
        const std::string text = errorOf(arguments);
        return text.substr(12, text.find(" (see ") - 12);
    };
    EXPECT_EQ(problem({"replya", "a"}), "'replya' is not a command; did you mean 'replay'?");
    EXPECT_EQ(problem({"synth", "--tremour", "3"}), "unknown option '--tremour'; did you mean '--tremor'?");
    EXPECT_EQ(problem({"trim", "a", "b", "--mxa=3"}), "unknown option '--mxa'; did you mean '--max'?");
    EXPECT_EQ(problem({"info", "-x.json"}),
              "unknown option '-x.json'; a file whose name begins with '-' is written as ./-NAME");
    EXPECT_EQ(problem({"host", "--device", "sim:tabs"}),
              "--device: 'tabs' is not a scenario; did you mean 'taps'?");
    EXPECT_EQ(problem({"synth", "--scenario", "dya", "-o", "a"}),
              "--scenario: 'dya' is not a scenario; did you mean 'day'?");
    EXPECT_EQ(problem({"replay", "a", "--set", "ActivationTreshold=1"}),
              "--set: 'ActivationTreshold' is not a writable state key; did you mean 'ActivationThreshold'?");
}

TEST_F(Usage, CommandsNeedTheirArguments) {
    EXPECT_EQ(errorOf({"replay"}), "zorvatouch: FILE is required (see zorvatouch replay --help)\n");
    EXPECT_EQ(errorOf({"info"}), "zorvatouch: FILE is required (see zorvatouch info --help)\n");
    EXPECT_EQ(errorOf({"show", "--raw"}), "zorvatouch: FILE is required (see zorvatouch show --help)\n");
    EXPECT_EQ(errorOf({"convert", "a"}), "zorvatouch: OUT is required (see zorvatouch convert --help)\n");
    EXPECT_EQ(errorOf({"trim", "a", "b"}), "zorvatouch: --max is required (see zorvatouch trim --help)\n");
    EXPECT_EQ(errorOf({"make", "a"}), "zorvatouch: OUT is required (see zorvatouch make --help)\n");
}

TEST_F(Usage, CommandsTakeNoOtherArguments) {
    EXPECT_THAT(errorOf({"replay", "a", "--frame", "1"}),
                HasSubstr(": unknown option '--frame' (see zorvatouch replay --help)\n"));
    EXPECT_THAT(errorOf({"show", "a", "b"}),
                EndsWith(": unexpected argument 'b' (see zorvatouch show --help)\n"));
    EXPECT_THAT(errorOf({"make", "a", "b", "c"}),
                EndsWith(": unexpected argument 'c' (see zorvatouch make --help)\n"));
}

TEST_F(Usage, ValuesMustFit) {
    const std::string kWritable = "; writable are EnableHoldSuppression, EnableTapSuppression, "
                                  "ActivationThreshold, HoldTimeoutMilliseconds, "
                                  "VirtualNormalizationFactors.0 to .22, ResetEventStats";
    const auto problem = [this](std::initializer_list<std::string> arguments) {
        const std::string text = errorOf(arguments);
        return text.substr(12, text.find(" (see ") - 12);
    };
    EXPECT_EQ(problem({"replay", "a", "--speed", "0"}), "--speed: '0' must be a number > 0");
    EXPECT_EQ(problem({"replay", "a", "--speed", "-1"}), "--speed: '-1' must be a number > 0");
    EXPECT_EQ(problem({"replay", "a", "--speed", "nan"}), "--speed: 'nan' must be a number > 0");
    EXPECT_EQ(problem({"replay", "a", "--speed", "2x"}), "--speed: '2x' must be a number > 0");
    EXPECT_EQ(problem({"replay", "a", "--speed", "1e99"}), "--speed: '1e99' must be a number > 0");
    EXPECT_EQ(problem({"replay", "a", "--log-level", "info"}),
              "--log-level: 'info' must be debug, default or error");
    EXPECT_EQ(problem({"replay", "a", "--set", "ActivationThreshold"}),
              "--set: 'ActivationThreshold' must be KEY=VALUE");
    EXPECT_EQ(problem({"replay", "a", "--set", "Threshold=1"}),
              "--set: 'Threshold' is not a writable state key" + kWritable);
    EXPECT_EQ(problem({"replay", "a", "--set", "=1"}), "--set: '' is not a writable state key" + kWritable);
    EXPECT_EQ(problem({"replay", "a", "--set", "EventStats=1"}),
              "--set: 'EventStats' is not a writable state key" + kWritable);
    EXPECT_EQ(problem({"replay", "a", "--set", "Algs.Pipeline.ActivationThreshold=1"}),
              "--set: 'Algs.Pipeline.ActivationThreshold' is not a writable state key" + kWritable);
    EXPECT_EQ(problem({"replay", "a", "--set", "VirtualNormalizationFactors.23=1"}),
              "--set: 'VirtualNormalizationFactors.23' is not a writable state key; "
              "did you mean 'VirtualNormalizationFactors.0 to .22'?");
    EXPECT_EQ(problem({"trim", "a", "b", "--max", "0"}), "--max: '0' must be an integer >= 1");
    EXPECT_EQ(problem({"trim", "a", "b", "--max", "0x10"}), "--max: '0x10' must be an integer >= 1");
    EXPECT_EQ(problem({"show", "a", "--frame", "-1"}), "--frame: '-1' must be an integer >= 0");
    EXPECT_EQ(problem({"show", "a", "--frame", "1.5"}), "--frame: '1.5' must be an integer >= 0");
    EXPECT_EQ(problem({"show", "a", "--frame", "18446744073709551616"}),
              "--frame: '18446744073709551616' must be an integer >= 0");
    EXPECT_EQ(problem({"show", "a", "--frame", ""}), "--frame: '' must be an integer >= 0");
    EXPECT_THAT(problem({"replay", "a", "--speed"}), HasSubstr("--speed"));
}

TEST_F(Usage, StateValuesMustBeInTheirRange) {
    const auto problem = [this](const std::string &setting) {
        const std::string text = errorOf({"replay", "a", "--set", setting});
        const std::string live = errorOf({"host", "--set", "Pipeline.Algs." + setting});
        EXPECT_THAT(
            live, StartsWith("zorvatouch: --set Pipeline.Algs." + text.substr(18, text.find(" (see ") - 18)));
        return text.substr(18, text.find(" (see ") - 18);
    };
    EXPECT_EQ(problem("HoldTimeoutMilliseconds=abc"),
              "HoldTimeoutMilliseconds: 'abc' must be an integer from 0 to 4294967295");
    EXPECT_EQ(problem("HoldTimeoutMilliseconds=-5"),
              "HoldTimeoutMilliseconds: '-5' must be an integer from 0 to 4294967295");
    EXPECT_EQ(problem("HoldTimeoutMilliseconds=0.5"),
              "HoldTimeoutMilliseconds: '0.5' must be an integer from 0 to 4294967295");
    EXPECT_EQ(problem("HoldTimeoutMilliseconds=4294967296"),
              "HoldTimeoutMilliseconds: '4294967296' must be an integer from 0 to 4294967295");
    EXPECT_EQ(problem("ActivationThreshold=-1"),
              "ActivationThreshold: '-1' must be a number from 0 to 100000");
    EXPECT_EQ(problem("ActivationThreshold=true"),
              "ActivationThreshold: 'true' must be a number from 0 to 100000");
    EXPECT_EQ(problem("EnableTapSuppression=off"), "EnableTapSuppression: 'off' must be true or false");
    EXPECT_EQ(problem("EnableHoldSuppression=2"), "EnableHoldSuppression: '2' must be true or false");
    EXPECT_EQ(problem("VirtualNormalizationFactors.3=[1]"),
              "VirtualNormalizationFactors.3: '[1]' must be a number from 0 to 1000");
}

TEST_F(Usage, StateValuesInTheirRangeAreTaken) {
    makeRecording("a.json", "raw");
    for (const std::string setting :
         {"HoldTimeoutMilliseconds=0", "HoldTimeoutMilliseconds=4294967295", "HoldTimeoutMilliseconds=7e2",
          "ActivationThreshold=250", "ActivationThreshold=0.5", "EnableTapSuppression=false",
          "EnableHoldSuppression=1", "VirtualNormalizationFactors.22=1.5", "ResetEventStats=anything"})
        EXPECT_EQ(run({"replay", "@a.json", "--set", setting}).status, 0) << setting;
}

TEST_F(Usage, StandardInputCanBeReadOnce) {
    const std::string message = "standard input can be read only once";
    EXPECT_THAT(errorOf({"replay", "-", "-"}), HasSubstr(message));
    EXPECT_THAT(errorOf({"replay", "-", "--expect", "-"}), HasSubstr(message));
    EXPECT_THAT(errorOf({"info", "-", "a", "-"}), HasSubstr(message));
}

TEST_F(Usage, FilesMayHaveAnyName) {
    makeRecording("replay", "raw");
    makeRecording("[a,b]", "raw");
    makeRecording("-x", "raw");
    std::filesystem::current_path(path(""));
    EXPECT_THAT(outputOf({"info", "replay"}), StartsWith("replay\n"));
    EXPECT_THAT(outputOf({"info", "[a,b]"}), StartsWith("./[a,b]\n"));
    EXPECT_THAT(outputOf({"info", "--", "-x"}), StartsWith("-x\n"));
    std::filesystem::current_path(std::filesystem::temp_directory_path());
}

// --- Files that cannot be read
// -------------------------------------------------------------------------------------

TEST_F(Usage, AFileThatIsNotThereIsAnError) {
    for (const std::string command : {"replay", "info", "show"})
        EXPECT_EQ(errorOf({command, "@a.json"}),
                  "zorvatouch: @a.json: cannot open: No such file or directory\n");
    EXPECT_EQ(errorOf({"replay", ""}), "zorvatouch: '': cannot open: No such file or directory\n");
}

TEST_F(Usage, AFolderIsNoFile) {
    std::filesystem::create_directory(path("folder"));
    EXPECT_EQ(errorOf({"replay", "@folder"}), "zorvatouch: @folder: cannot read: Is a directory\n");
}

TEST_F(Usage, AForeignFileIsNamedAsOneWithReasonAndPlace) {
    const auto problem = [this](const std::string &text) {
        writeFile("a.json", text);
        const std::string line = errorOf({"info", "@a.json"});
        EXPECT_THAT(line, StartsWith("zorvatouch: @a.json: "));
        return line.substr(21, line.size() - 22);
    };
    EXPECT_EQ(problem(""), "not a ZorvaTouch recording (the text is empty, byte 0)");
    EXPECT_EQ(problem("hello"), "not a ZorvaTouch recording (not JSON, byte 0)");
    EXPECT_EQ(problem(R"({"Version":2,"Frames":[)"),
              "not a ZorvaTouch recording (the text ends early, byte 23)");
    EXPECT_EQ(problem("[]"), "not a ZorvaTouch recording (invalid container)");
    EXPECT_EQ(problem(R"({"Frames":[]})"), "not a ZorvaTouch recording (invalid version)");
    EXPECT_EQ(problem(R"({"Version":3})"), "not a ZorvaTouch recording (invalid container version: 3)");
    EXPECT_EQ(problem(R"({"Version":2})"), "not a ZorvaTouch recording (invalid frames)");
    EXPECT_EQ(problem(R"({"Version":0,"Reports":[{"Timestamp":1}]})"), "frame 0: frame lacks ReportData");
    input = "[}";
    EXPECT_EQ(errorOf({"replay", "-"}),
              "zorvatouch: standard input: not a ZorvaTouch recording (not JSON, byte 0)\n");
}

TEST_F(Usage, AFrameThatIsWrongIsNamed) {
    writeFile("a.json",
              R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1,"Data":""},{"Type":"Image"}]})");
    EXPECT_EQ(errorOf({"replay", "@a.json"}), "zorvatouch: @a.json: frame 1: invalid frame type\n");
    writeFile("a.json", R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1,"Data":"100"}]})");
    EXPECT_EQ(errorOf({"replay", "@a.json"}), "zorvatouch: @a.json: frame 0: invalid hex string\n");
}

TEST_F(Usage, WhatWasDoneBeforeAnErrorIsShown) {
    makeRecording("a.json", "raw");
    const Run result = run({"replay", "--json", "@a.json", "@b.json"});
    EXPECT_EQ(result.status, 2);
    EXPECT_THAT(result.output, StartsWith("{\"type\":\"unhandled\",\"n\":0}\n{\"type\":\"end\","));
    EXPECT_THAT(result.error, EndsWith("b.json: cannot open: No such file or directory\n"));
}

TEST_F(Usage, AnErrorStaysInOneLineWhateverTheNameHolds) {
    EXPECT_EQ(errorOf({"replay", "@a\nb\x1b[1m"}),
              "zorvatouch: @a\\nb\\x1b[1m: cannot open: No such file or directory\n");
    EXPECT_EQ(errorOf({"replay", "@a\xff"}),
              "zorvatouch: @a\xEF\xBF\xBD: cannot open: No such file or directory\n");
}

} // namespace
} // namespace ZorvaTouch::Tools
