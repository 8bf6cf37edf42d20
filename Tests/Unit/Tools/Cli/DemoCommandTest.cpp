#include "Tests/Unit/Tools/Cli/CliFixture.h"
#include "Tools/Cli/Layout.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <sstream>
#include <string>

// The demo through the real plug-in, in virtual time unless said.

namespace ZorvaTouch::Tools {
namespace {

using DemoCommand = CliFixture;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::Not;
using ::testing::StartsWith;

TEST_F(DemoCommand, ShowsGesturesBesideWhatTheFingerDid) {
    // Of the synthetic finger's labels: a tap that ends 0.685 s after the beginning, a hold from 1.817 s to
    // 3.164 s, a graze that ends at 3.898 s.
    EXPECT_EQ(outputOf({"demo", "--speed", "inf", "--duration", "4.5", "--save", "@a.json"}),
              "ZorvaTouchHIDService.so, service version 26.0.0\n"
              "simulated finger, scenario day, seed 1811, 4.5 s\n"
              "ms: since the touch began. touch withdrawn: it is neither tap nor hold.\n"
              "volume up ...: repeats until the hold ends. (missed): should be a gesture.\n"
              "   time s  gesture         region         ms  host does       finger did\n"
              "    0.670  tap             play/pause    340  play/pause      tap play/pause\n"
              "    2.360  hold            play/pause    510  assistant       hold play/pause\n"
              "    3.150  hold ends       play/pause   1300  stop\n"
              "    3.840  tap             play/pause     20  play/pause      graze\n"
              "  events        may-begin 3, hold-start 1, hold-end 1, tap 2\n"
              "  recognized    taps 2, taps play/pause 2, holds begun 1,\n"
              "                holds begun play/pause 1, holds ended 1, frames of holds 78,\n"
              "                frames of holds play/pause 78\n"
              "  reports       449 handled, 0 lost on the way\n"
              "  recording     @a.json\n"
              "  replayed      449 reports: the same 7 events\n");
    EXPECT_EQ(fileNames(), "a.json ");
}

TEST_F(DemoCommand, TheDefaultsShowOneOfEverything) {
    const std::string output = outputOf({"demo", "--speed", "inf"});
    EXPECT_THAT(output, HasSubstr("  tap             volume up     280  volume up       tap volume up\n"));
    EXPECT_THAT(output, HasSubstr("  tap             volume down    80  volume down     tap volume down\n"));
    EXPECT_THAT(output, HasSubstr("  hold moves      volume up    2290  volume up ...   slide volume up\n"));
    EXPECT_THAT(output, HasSubstr("  touch withdrawn              1430  nothing         palm\n"));
    EXPECT_THAT(output, HasSubstr("  no gesture                         (missed)        slide play/pause\n"));
    EXPECT_THAT(output, EndsWith("  recording     @state/zorvatouch-demo.json\n"
                                 "  replayed      1999 reports: the same 40 events\n"));
    EXPECT_THAT(readFile("state/zorvatouch-demo.json"), StartsWith("{\"Version\":2,"));
}

TEST_F(DemoCommand, NoLineIsWiderThanAScreen) {
    std::istringstream output(outputOf({"demo", "--speed", "inf"}));
    std::string line;
    std::size_t widest = 0;
    while (std::getline(output, line))
        widest = std::max(widest, widthOf(line));
    EXPECT_LE(widest, 80u);
}

TEST_F(DemoCommand, ShowsTheElectrodesAtTheirPlacesOnAScreenOf80By24) {
    screenColumns = 80;
    screenRows = 24;
    const std::string output = outputOf({"demo", "--speed", "inf", "--duration", "1", "--save", "@a.json"});
    EXPECT_THAT(output, HasSubstr("           H         G   "));
    EXPECT_THAT(output, HasSubstr("A to O  electrodes at their places"));
    EXPECT_THAT(output, HasSubstr("\r\x1b[12A\x1b[J   time s  gesture ")) << "makes room for a row";
    EXPECT_THAT(output.substr(output.rfind("\x1b[")), StartsWith("\x1b[J  events "))
        << "and is gone in the end";
    std::istringstream lines(output);
    for (std::string line; std::getline(lines, line);)
        EXPECT_LT(widthOf(line.substr(line.rfind('J') + 1)), 80u) << line;
    screenRows = 18; // too low for the picture and some rows
    EXPECT_THAT(outputOf({"demo", "--speed", "inf", "--duration", "1", "--save", "@a.json"}),
                HasSubstr("\r\x1b[K   0.50 s  A  B  C  D  E"));
}

TEST_F(DemoCommand, AScreenOf40ColumnsGetsTheFirstColumns) {
    screenColumns = 40;
    screenRows = 24;
    const std::string output = outputOf({"demo", "--speed", "inf", "--duration", "1", "--save", "@a.json"});
    EXPECT_THAT(output, HasSubstr("    0.670  tap             play/pause\n"));
    EXPECT_THAT(output, Not(HasSubstr("A to O")));
    EXPECT_THAT(output, HasSubstr("\x1b[12A\x1b[J"));
}

TEST_F(DemoCommand, QuietSaysOnlyTheEnd) {
    EXPECT_THAT(outputOf({"demo", "--speed", "inf", "--duration", "1", "--quiet", "--save", "@a.json"}),
                StartsWith("  events        may-begin 1, tap 1\n"));
}

TEST_F(DemoCommand, WritesLinesOfJson) {
    EXPECT_EQ(
        outputOf({"demo", "--json", "--speed", "inf", "--duration", "1", "--save", "@a.json"}),
        "{\"gesture\":\"tap\",\"region\":\"play/pause\",\"timeNs\":670533000,\"action\":\"play/pause\"}\n"
        "{\"summary\":{\"plugin\":\"" ZORVA_TEST_PLUGIN "\",\"version\":\"26.0.0\",\"scenario\":\"day\","
        "\"seed\":1811,\"handled\":100,\"dropped\":0,\"events\":{\"may-begin\":1,\"hold-start\":0,"
        "\"hold-change\":0,\"hold-end\":0,\"tap\":1,\"cancel\":0,\"reset\":0},\"EventStats\":{\"Dispatched\":"
        "{"
        "\"numBeginHold\":0,\"numEndHold\":0,\"numHolding2Suppressed\":0,\"numIncrementHold\":0,"
        "\"numKeloCall\":0,\"numKeloCallIncrement\":0,\"numPlayPause\":1,\"numTaps\":1,"
        "\"numVolumeDecrement\":0,\"numVolumeDown\":0,\"numVolumeIncrement\":0,\"numVolumeUp\":0},"
        "\"Rejected\":{\"numRejectedBeginHold\":0,\"numRejectedEndHold\":0,\"numRejectedIncrementHold\":0,"
        "\"numRejectedKeloCall\":0,\"numRejectedKeloCallIncrement\":0,\"numRejectedPlayPause\":0,"
        "\"numRejectedTap\":0,\"numRejectedVolumeDecrement\":0,\"numRejectedVolumeDown\":0,"
        "\"numRejectedVolumeIncrement\":0,\"numRejectedVolumeUp\":0,\"numSuppressed2Holding\":0}},"
        "\"ResetCount\":0,\"DisjointImageCount\":0,\"recording\":\"@a.json\","
        "\"replay\":{\"reports\":100,\"events\":2,\"same\":true,\"fromTimeNs\":null}}}\n");
}

TEST_F(DemoCommand, AfterATrimItComparesWhatIsLeft) {
    // 60 s are 6000 images and the accelerometer's notes: more than the 4350 frames that are kept.
    const std::string output = outputOf({"demo", "--speed", "inf", "--quiet", "--scenario", "taps", "--seed",
                                         "1", "--duration", "70", "--save", "@a.json"});
    EXPECT_THAT(output, EndsWith("  replayed      2176 reports: the same 48 events\n"
                                 "                from 48.410 s on; older reports are trimmed\n"));
}

TEST_F(DemoCommand, GoesOnUntilItIsStopped) {
    outputSink.onWrite = [this](const std::string &text) {
        if (text.find("graze") != std::string::npos)
            stop();
    };
    const std::string output = outputOf({"demo", "--forever", "--speed", "inf", "--save", "@a.json"});
    EXPECT_THAT(output, StartsWith("ZorvaTouchHIDService.so, service version 26.0.0\n"
                                   "simulated finger, scenario day, seed 1811, until Ctrl-C\n"));
    EXPECT_THAT(output, HasSubstr("graze\n  events        may-begin 3, hold-start 1, hold-end 1, tap 2\n"));
    EXPECT_THAT(output, EndsWith(": the same 7 events\n"));
}

TEST_F(DemoCommand, DrawsTheElectrodesOnAScreenAndWipesThemOff) {
    screenColumns = 80;
    const std::string output = outputOf({"demo", "--speed", "inf", "--duration", "1", "--save", "@a.json"});
    EXPECT_THAT(output, HasSubstr("\r\x1b[K   0.50 s  A  B  C  D  E  F  G  H  I  J  K"));
    const std::size_t end = output.rfind("\r\x1b[K");
    EXPECT_THAT(output.substr(end), StartsWith("\r\x1b[K  events        may-begin 1, tap 1\n"));
    EXPECT_THAT(output, Not(HasSubstr("\x1b[?25l"))); // the cursor stays
}

TEST_F(DemoCommand, WritesNoControlSequencesElsewhere) {
    EXPECT_THAT(outputOf({"demo", "--speed", "inf", "--duration", "1", "--save", "@a.json"}),
                Not(HasSubstr("\x1b")));
}

TEST_F(DemoCommand, PlaysLive) {
    // A fast clock of its own: what a person sees in a second takes a fiftieth of it.
    const std::string output = outputOf({"demo", "--speed", "50", "--duration", "1", "--save", "@a.json"});
    EXPECT_THAT(output, HasSubstr("  tap             play/pause "));
    EXPECT_THAT(output, HasSubstr(": the same 2 events\n"));
}

// --- Bad usage

TEST_F(DemoCommand, ValuesMustFit) {
    EXPECT_EQ(errorOf({"demo", "--forever", "--duration", "1"}),
              "zorvatouch: --forever and --duration exclude each other (see zorvatouch demo --help)\n");
    EXPECT_THAT(errorOf({"demo", "--scenario", "tap"}),
                StartsWith("zorvatouch: --scenario: 'tap' is not a scenario; did you mean 'taps'?"));
    EXPECT_THAT(errorOf({"demo", "--speed", "fast"}), HasSubstr("--speed: 'fast' must be a number > 0 "));
    EXPECT_THAT(errorOf({"demo", "a.json"}),
                HasSubstr("unexpected argument 'a.json' (see zorvatouch demo --help)"));
}

TEST_F(DemoCommand, APlaceWhereNothingCanBeSavedIsToldAtOnce) {
    EXPECT_EQ(errorOf({"demo", "--save", "@none/a.json"}),
              "zorvatouch: @none/a.json: there is no such folder to save in\n");
    writeFile("state", "a file where the folder would be");
    EXPECT_EQ(errorOf({"demo"}),
              "zorvatouch: @state: cannot create the folder: Not a directory (--save takes "
              "another place)\n");
}

TEST_F(DemoCommand, StandardOutputThatFailsEndsIt) {
    outputSink.isFull = true;
    const Run result = run({"demo", "--save", "@a.json"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.error, "zorvatouch: standard output: cannot write: No space left on device\n");
}

} // namespace
} // namespace ZorvaTouch::Tools
