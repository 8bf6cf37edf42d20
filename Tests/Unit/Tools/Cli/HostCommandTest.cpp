#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include <gmock/gmock.h>

// The real plug-in, loaded by its file, with a simulated device in virtual time.

namespace ZorvaTouch::Tools {
namespace {

using HostCommand = CliFixture;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::StartsWith;

// An image each 10 ms:
//   tap   in the play/pause region, images 0 to 4, is over with image 5: 50 ms after it began
//   hold  in the volume-up region from image 10 on: 510 ms later it is longer than 500 ms, which is image 61;
//         it is over with image 70
constexpr const char *kTapAndHold = "touch A=300 for 50ms\n"
                                    "idle for 50ms\n"
                                    "touch I=260 J=220 for 600ms\n"
                                    "idle for 50ms\n";

/// Output without its first two lines, which name the service and the device.
std::string withoutHeading(const std::string &output) {
    return output.substr(output.find('\n', output.find('\n') + 1) + 1);
}

TEST_F(HostCommand, AsksForPropertiesWithoutADevice) {
    EXPECT_EQ(outputOf({"host", "--get", "Version", "--get", "Pipeline.DebugInfo"}),
              "Version: [26,0,0]\n"
              "Pipeline.DebugInfo: {\n"
              "  \"DisjointImageCount\": 0,\n"
              "  \"ResetCount\": 0\n"
              "}\n");
}

TEST_F(HostCommand, AsksForPropertiesInLinesOfJson) {
    EXPECT_EQ(
        outputOf({"host", "--json", "--get", "Version", "--get", "Pipeline.DebugInfo"}),
        "{\"property\":\"Version\",\"value\":[26,0,0]}\n"
        "{\"property\":\"Pipeline.DebugInfo\",\"value\":{\"DisjointImageCount\":0,\"ResetCount\":0}}\n");
}

TEST_F(HostCommand, AnUnknownPropertyIsAnErrorAfterWhichTheOthersAreRead) {
    const Run result = run({"host", "--get", "Colour", "--get", "Version"});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "Version: [26,0,0]\n");
    EXPECT_EQ(result.error, "zorvatouch: --get: the service does not have a property \"Colour\"\n");
    const Run json = run({"host", "--json", "--get", "Colour"});
    EXPECT_EQ(json.status, 1);
    EXPECT_EQ(json.output, "{\"property\":\"Colour\",\"value\":null}\n");
    EXPECT_EQ(json.error, result.error);
}

TEST_F(HostCommand, AStateKeyIsCheckedBeforeAnythingStarts) {
    EXPECT_THAT(errorOf({"host", "--set", "Pipeline.Algs.Nonsense=3"}),
                StartsWith("zorvatouch: --set: 'Pipeline.Algs.Nonsense' is not a writable state key; "));
    EXPECT_THAT(
        errorOf({"host", "--set", "HoldTimeoutMilliseconds=3"}),
        StartsWith("zorvatouch: --set: 'HoldTimeoutMilliseconds' is a state key; with its domains it is "
                   "Pipeline.Algs.HoldTimeoutMilliseconds "));
}

TEST_F(HostCommand, AsksTheDeviceForWhatTheServiceDoesNotKnow) {
    EXPECT_THAT(outputOf({"host", "--device", "sim:idle", "--duration", "0.1", "--get", "VendorID", "--get",
                          "FactoryResetHoldDuration", "--get", "FirmwareDebugReports"}),
                EndsWith("VendorID: 4660\n"
                         "FactoryResetHoldDuration: 10000\n"
                         "FirmwareDebugReports: {\n"
                         "  \"0x04\": \"04 01 02 03 04 \",\n"
                         "  \"0x10\": \"10 01 02 03 04 \",\n"
                         "  \"0x11\": \"11 01 02 03 04 \",\n"
                         "  \"0x12\": \"Failed to get report ID 0x12: 0xe00002c7\",\n"
                         "  \"0x13\": \"13 01 02 03 04 \",\n"
                         "  \"0x1d\": \"1d 01 02 03 04 \",\n"
                         "  \"0x32\": \"32 01 02 03 04 \",\n"
                         "  \"0x3b\": \"Failed to get report ID 0x3b: 0xe00002c7\",\n"
                         "  \"0x3c\": \"3c 01 02 03 04 \",\n"
                         "  \"0x3f\": \"3f 01 02 03 04 \"\n"
                         "}\n"));
}

TEST_F(HostCommand, PlaysARecordingAndSaysWhatAHostDoes) {
    makeRecording("a.json", kTapAndHold);
    const std::string output = outputOf({"host", "--device", "recording:" + path("a.json")});
    EXPECT_THAT(output, StartsWith("ZorvaTouchHIDService.so, service version 26.0.0\nrecording @a.json\n"));
    EXPECT_EQ(withoutHeading(output),
              "   time s  gesture         region         ms  host does\n"
              "    0.050  tap             play/pause     50  play/pause\n"
              "    0.610  hold            volume up     510  volume up ...\n"
              "    0.700  hold ends       volume up     600  stop\n"
              "  events        may-begin 2, hold-start 1, hold-end 1, tap 1\n"
              "  recognized    taps 1, taps play/pause 1, holds begun 1, holds ended 1,\n"
              "                frames of holds 8, frames of holds volume up 9\n");
}

TEST_F(HostCommand, PlaysARecordingInLinesOfJson) {
    makeRecording("a.json", kTapAndHold);
    EXPECT_EQ(
        outputOf({"host", "--json", "--device", "recording:" + path("a.json")}),
        "{\"gesture\":\"tap\",\"region\":\"play/pause\",\"timeNs\":50000000,\"action\":\"play/pause\"}\n"
        "{\"gesture\":\"hold-start\",\"region\":\"volume-up\",\"timeNs\":610000000,"
        "\"action\":\"volume-up-repeat\"}\n"
        "{\"gesture\":\"hold-end\",\"region\":\"volume-up\",\"timeNs\":700000000,\"action\":\"stop\"}\n");
}

TEST_F(HostCommand, SaysThatAResetHasNeitherRegionNorAction) {
    makeRecording("a.json", "touch A=300 for 50ms\nreset\n");
    EXPECT_EQ(outputOf({"host", "--json", "--device", "recording:" + path("a.json")}),
              "{\"gesture\":\"cancel\",\"region\":null,\"timeNs\":50000000,\"action\":\"none\"}\n"
              "{\"gesture\":\"reset\",\"region\":null,\"timeNs\":50000000,\"action\":\"none\"}\n");
}

TEST_F(HostCommand, WritesPropertiesBeforeItPlays) {
    makeRecording("a.json", kTapAndHold);
    // With their gains of 1.9, 1.5 and 1.5 the electrodes come to 576, 386 and 330: all are below 600.
    EXPECT_EQ(outputOf({"host", "--json", "--device", "recording:" + path("a.json"), "--set",
                        "Pipeline.Algs.ActivationThreshold=600"}),
              "");
    EXPECT_THAT(outputOf({"host", "--json", "--device", "recording:" + path("a.json"), "--set",
                          "Pipeline.Algs.ActivationThreshold=600", "--get",
                          "Pipeline.Algs.ActivationThreshold", "--set", "Mood=fine", "--get", "Mood"}),
                EndsWith("{\"property\":\"Pipeline.Algs.ActivationThreshold\",\"value\":600.0}\n"
                         "{\"property\":\"Mood\",\"value\":\"fine\"}\n"));
}

TEST_F(HostCommand, MakesTheWritesThatARecordingHolds) {
    makeRecording("a.json", std::string("state Algs.ActivationThreshold 600\n") + kTapAndHold);
    EXPECT_EQ(outputOf({"host", "--json", "--device", "recording:" + path("a.json")}), "");
}

TEST_F(HostCommand, ARefusedPropertyIsAFailedCheckAndNothingIsPlayed) {
    const Run result = run({"host", "--device", "sim:taps", "--set", "VendorID=1"});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.error, "zorvatouch: --set: the service refuses \"VendorID\"\n");
    EXPECT_EQ(run({"host", "--set", "Mood=fine"}).status, 1); // there is no device to take it
}

TEST_F(HostCommand, SavesWhatTheServiceHasRecorded) {
    makeRecording("a.json", kTapAndHold);
    EXPECT_THAT(outputOf({"host", "--device", "recording:" + path("a.json"), "--save", "@b.json"}),
                EndsWith("\n  recording     @b.json, 75 reports\n"));
    EXPECT_EQ(readFile("b.json"), readFile("a.json")); // virtual time: to the nanosecond
    EXPECT_EQ(outputOf({"host", "--json", "--device", "recording:" + path("a.json"), "--save", "@b.json"}),
              outputOf({"host", "--json", "--device", "recording:" + path("a.json")}) +
                  "{\"recording\":\"@b.json\",\"reports\":75}\n");
    EXPECT_EQ(outputOf({"host", "--save", "-"}), "{\"Version\":2,\"Frames\":[]}");
}

TEST_F(HostCommand, TheSameSeedGivesTheSameGestures) {
    const auto gestures = [this](const std::string &seed) {
        return outputOf({"host", "--json", "--device", "sim:taps", "--duration", "5", "--seed", seed});
    };
    const std::string first = gestures("7");
    EXPECT_THAT(first, HasSubstr("{\"gesture\":\"tap\","));
    EXPECT_EQ(gestures("7"), first);
    EXPECT_NE(gestures("8"), first);
}

TEST_F(HostCommand, PlaysAtAPaceToo) {
    makeRecording("a.json", kTapAndHold);
    // A thousand times as fast; the sensor's own clock tells taps from holds, so the gestures are the same.
    const std::string output =
        outputOf({"host", "--device", "recording:" + path("a.json"), "--speed", "1000"});
    EXPECT_THAT(output, HasSubstr("\n  events        may-begin 2, hold-start 1, hold-end 1, tap 1\n"));
}

TEST_F(HostCommand, LogsFromTheLevelThatIsAskedFor) {
    outputOf({"host", "--get", "Version"});
    EXPECT_EQ(logLevel, Ports::LogLevel::Error);
    outputOf({"host", "--get", "Version", "--log-level", "debug"});
    EXPECT_EQ(logLevel, Ports::LogLevel::Debug);
}

// --- Bad usage, and what cannot be read

TEST_F(HostCommand, NeedsSomethingToDo) {
    EXPECT_EQ(errorOf({"host"}), "zorvatouch: there is nothing to do: --device, --get, --set or --save is "
                                 "required (see zorvatouch host --help)\n");
}

TEST_F(HostCommand, AnUnknownDeviceIsToldWithTheScenarios) {
    const std::string scenarios =
        "idle, taps, double-taps, holds, slides, palms, thumbs, grazes, water, drift, "
        "link-faults, resets, day (see zorvatouch host --help)\n";
    EXPECT_EQ(errorOf({"host", "--device", "usb"}),
              "zorvatouch: --device: 'usb' is neither sim:SCENARIO nor recording:FILE; scenarios are " +
                  scenarios);
    EXPECT_EQ(errorOf({"host", "--device", "sim:swipe"}),
              "zorvatouch: --device: 'swipe' is not a scenario; scenarios are " + scenarios);
}

TEST_F(HostCommand, OptionsOfADeviceNeedIt) {
    const std::string forSim =
        "zorvatouch: --seed and --duration are for --device sim:SCENARIO (see zorvatouch host --help)\n";
    EXPECT_EQ(errorOf({"host", "--get", "Version", "--seed", "1"}), forSim);
    EXPECT_EQ(errorOf({"host", "--device", "recording:a.json", "--duration", "1"}), forSim);
    EXPECT_EQ(errorOf({"host", "--get", "Version", "--speed", "1"}),
              "zorvatouch: --speed is for --device (see zorvatouch host --help)\n");
}

TEST_F(HostCommand, ValuesMustFit) {
    EXPECT_THAT(errorOf({"host", "--device", "sim:taps", "--speed", "0"}),
                HasSubstr("--speed: '0' must be a number > 0 "));
    EXPECT_THAT(errorOf({"host", "--device", "sim:taps", "--seed", "x"}),
                HasSubstr("--seed: 'x' must be an integer >= 0 "));
    EXPECT_THAT(errorOf({"host", "--device", "sim:taps", "--duration", "0"}),
                HasSubstr("--duration: '0' must be a number from 0.1 to 36000 (s) "));
    EXPECT_THAT(errorOf({"host", "--set", "Version"}), HasSubstr("--set: 'Version' must be KEY=VALUE "));
    EXPECT_THAT(errorOf({"host", "--set", "=1"}), HasSubstr("--set: '=1' must be KEY=VALUE "));
    EXPECT_THAT(errorOf({"host", "--get", "V", "--log-level", "loud"}),
                HasSubstr("--log-level: 'loud' must be debug, default or error "));
}

TEST_F(HostCommand, APlugInThatIsNotThereIsAnError) {
    EXPECT_EQ(errorOf({"host", "--get", "Version", "--plugin", "@none.so"}),
              "zorvatouch: cannot open the plug-in @none.so: @none.so: cannot open shared object file: No "
              "such file or directory\n");
}

TEST_F(HostCommand, AFileThatIsNoPlugInIsAnError) {
    writeFile("a.so", "text");
    EXPECT_THAT(errorOf({"host", "--get", "Version", "--plugin", "@a.so"}),
                StartsWith("zorvatouch: cannot open the plug-in @a.so: "));
}

TEST_F(HostCommand, ARecordingThatCannotBeReadIsAnError) {
    EXPECT_EQ(errorOf({"host", "--device", "recording:" + path("none.json")}),
              "zorvatouch: @none.json: cannot open: No such file or directory\n");
}

TEST_F(HostCommand, AFileThatCannotBeWrittenIsAnError) {
    EXPECT_EQ(
        errorOf({"host", "--save", "@none/a.json"}),
        "zorvatouch: @none/a.json: cannot open a temporary file beside it: No such file or directory\n");
}

} // namespace
} // namespace ZorvaTouch::Tools
