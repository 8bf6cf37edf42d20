#include "Tools/Daemon/DaemonOptions.h"

#include "Tools/Cli/CliError.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <initializer_list>
#include <string>
#include <variant>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using Linux::HidId;
using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;
using testing::MatchesRegex;
using testing::StartsWith;

DaemonOptions optionsOf(std::initializer_list<std::string> arguments) {
    const std::vector<std::string> list(arguments);
    return std::get<DaemonOptions>(parseDaemonOptions(list));
}

std::string answerTo(std::initializer_list<std::string> arguments) {
    const std::vector<std::string> list(arguments);
    return std::get<AnswerOptions>(parseDaemonOptions(list)).text;
}

/// What is said about a command line, without where help is; "none" if nothing is.
std::string problemWith(std::initializer_list<std::string> arguments) {
    constexpr std::string_view kHint = " (see zorvatouchd --help)";
    const std::vector<std::string> list(arguments);
    try {
        static_cast<void>(parseDaemonOptions(list));
        return "none";
    } catch (const CliError &error) {
        const std::string text = error.what();
        EXPECT_THAT(text, EndsWith(std::string(kHint)));
        EXPECT_EQ(text.find('\n'), std::string::npos);
        return text.substr(0, text.size() - kHint.size());
    }
}

const std::string kScenarios = "idle, taps, double-taps, holds, slides, palms, thumbs, grazes, water, drift, "
                               "link-faults, resets, day";

// --- What is understood ------------------------------------------------------------------------------------

TEST(DaemonOptions, WithoutAnyItPressesKeysForWhatIsFound) {
    const DaemonOptions options = optionsOf({});
    EXPECT_TRUE(options.devices.empty());
    EXPECT_THAT(options.ids, ElementsAre(HidId{0x1234, 0xABCD}));
    EXPECT_EQ(options.accel, AccelOption{});
    EXPECT_EQ(options.keys, KeyMap());
    EXPECT_TRUE(options.sendsKeys);
    EXPECT_FALSE(options.sendsSimulatedKeys);
    EXPECT_FALSE(options.showsEvents);
    EXPECT_FALSE(options.describe);
    EXPECT_FALSE(options.waits);
    EXPECT_EQ(options.saveFile, std::nullopt);
    EXPECT_EQ(options.saveLimits.count, 16u);
    EXPECT_EQ(options.saveLimits.bytes, 67'108'864u);
    EXPECT_FALSE(options.savesSerial);
    EXPECT_EQ(options.logLevel, Ports::LogLevel::Default);
    EXPECT_EQ(options.plugIn, std::nullopt);
}

TEST(DaemonOptions, DevicesKeepTheirOrder) {
    const DaemonOptions options =
        optionsOf({"--device", "/dev/hidraw1", "--device=sim:taps", "--device", "dev/hidraw0"});
    ASSERT_EQ(options.devices.size(), 3u);
    EXPECT_EQ(std::get<std::string>(options.devices[0]), "/dev/hidraw1");
    EXPECT_EQ(std::get<SimulatedFinger>(options.devices[1]).scenario->name, "taps");
    EXPECT_EQ(std::get<std::string>(options.devices[2]), "dev/hidraw0");
}

TEST(DaemonOptions, ASimulatedFingerHasNoEndUnlessItIsGiven) {
    const auto fingerOf = [](std::initializer_list<std::string> arguments) {
        return std::get<SimulatedFinger>(optionsOf(arguments).devices.at(0));
    };
    EXPECT_EQ(fingerOf({"--device", "sim:day"}).seconds, std::nullopt);
    EXPECT_EQ(fingerOf({"--device", "sim:day"}).seed, 1u);
    const SimulatedFinger finger = fingerOf({"--duration", "2.5", "--seed", "7", "--device", "sim:day"});
    EXPECT_EQ(finger.seconds, 2.5);
    EXPECT_EQ(finger.seed, 7u);
}

TEST(DaemonOptions, SeveralFingersMayTouchSeveralSurfaces) {
    const DaemonOptions options =
        optionsOf({"--device", "sim:taps", "--device", "sim:holds", "--duration", "1"});
    ASSERT_EQ(options.devices.size(), 2u);
    EXPECT_EQ(std::get<SimulatedFinger>(options.devices[1]).seconds, 1.0);
}

TEST(DaemonOptions, GivenMakesTakeThePlaceOfTheUsualOne) {
    EXPECT_THAT(optionsOf({"--id", "5:ef"}).ids, ElementsAre(HidId{0x5, 0xEF}));
    EXPECT_THAT(optionsOf({"--id", "1234:abcd", "--id", "ffff:0000"}).ids,
                ElementsAre(HidId{0x1234, 0xABCD}, HidId{0xFFFF, 0}));
}

TEST(DaemonOptions, OneAccelerometerIsChosen) {
    using Choice = AccelOption::Choice;
    EXPECT_EQ(optionsOf({"--accel", "auto"}).accel, (AccelOption{Choice::Any, ""}));
    EXPECT_EQ(optionsOf({"--accel", "none"}).accel, (AccelOption{Choice::None, ""}));
    EXPECT_EQ(optionsOf({"--accel", "accel_3d"}).accel, (AccelOption{Choice::Named, "accel_3d"}));
    EXPECT_EQ(optionsOf({"--accel", "/dev/iio:device0"}).accel,
              (AccelOption{Choice::Named, "/dev/iio:device0"}));
}

TEST(DaemonOptions, SimulatedSurfacesPressKeysOnlyOnRequest) {
    EXPECT_FALSE(optionsOf({"--device", "sim:day"}).sendsSimulatedKeys);
    const DaemonOptions options = optionsOf({"--device", "sim:day", "--keys"});
    EXPECT_TRUE(options.sendsSimulatedKeys);
    EXPECT_TRUE(options.sendsKeys);
}

TEST(DaemonOptions, TheKeyLimitIsACountOrOff) {
    EXPECT_EQ(optionsOf({}).keyLimit, 20u);
    EXPECT_EQ(optionsOf({"--key-limit", "7"}).keyLimit, 7u);
    EXPECT_EQ(optionsOf({"--key-limit", "0"}).keyLimit, 0u);
    for (const char *limit : {"", "-1", "1001", "2.5", "x"})
        EXPECT_EQ(problemWith({"--key-limit", limit}),
                  "--key-limit: '" + std::string(limit) + "': must be an integer from 0 to 1000");
}

TEST(DaemonOptions, KeysAreMappedOneByOne) {
    KeyMap map;
    map.assign("tap:volume-up=KEY_NEXTSONG");
    map.assign("hold:play-pause=none");
    EXPECT_EQ(optionsOf({"--map", "tap:volume-up=KEY_MUTE", "--map", "hold:play-pause=none", "--map",
                         "tap:volume-up=KEY_NEXTSONG"})
                  .keys,
              map);
}

TEST(DaemonOptions, TheRestIsUnderstoodInAnyOrder) {
    std::vector<std::vector<std::string>> parts{{"--events", "json"},     {"--save", "a.json"},
                                                {"--log-level", "debug"}, {"--no-keys"},
                                                {"--plugin", "p.so"},     {"--device", "sim:day"}};
    std::sort(parts.begin(), parts.end());
    do {
        std::vector<std::string> arguments;
        for (const auto &part : parts)
            arguments.insert(arguments.end(), part.begin(), part.end());
        const auto options = std::get<DaemonOptions>(parseDaemonOptions(arguments));
        EXPECT_TRUE(options.showsEvents);
        EXPECT_EQ(options.saveFile, "a.json");
        EXPECT_EQ(options.logLevel, Ports::LogLevel::Debug);
        EXPECT_FALSE(options.sendsKeys);
        EXPECT_EQ(options.plugIn, "p.so");
        EXPECT_EQ(options.devices.size(), 1u);
    } while (std::next_permutation(parts.begin(), parts.end()));
}

TEST(DaemonOptions, RecordingsHaveLimits) {
    const DaemonOptions options =
        optionsOf({"--save", "a", "--save-count", "3", "--save-bytes", "1000", "--save-serial"});
    EXPECT_EQ(options.saveLimits.count, 3u);
    EXPECT_EQ(options.saveLimits.bytes, 1000u);
    EXPECT_TRUE(options.savesSerial);
    EXPECT_EQ(optionsOf({"--save", "a", "--save-count", "1000"}).saveLimits.count, 1000u);
}

TEST(DaemonOptions, ADescriptionMayBeOfChosenDevices) {
    EXPECT_TRUE(optionsOf({"--wait"}).waits);
    EXPECT_TRUE(optionsOf({"--describe"}).describe);
    EXPECT_TRUE(optionsOf({"--describe", "--id", "1:2", "--accel", "none", "--log-level", "error"}).describe);
    EXPECT_TRUE(optionsOf({"--describe", "--device", "sim:day", "--seed", "3"}).describe);
}

TEST(DaemonOptions, LogLevelsHaveNames) {
    EXPECT_EQ(optionsOf({"--log-level", "error"}).logLevel, Ports::LogLevel::Error);
    EXPECT_EQ(optionsOf({"--log-level", "default"}).logLevel, Ports::LogLevel::Default);
}

// --- Help --------------------------------------------------------------------------------------------------

TEST(DaemonOptions, TheVersionIsOneLine) {
    EXPECT_THAT(answerTo({"--version"}), MatchesRegex("zorvatouchd [0-9]+\\.[0-9]+\\.[0-9]+\n"));
}

TEST(DaemonOptions, HelpSaysWhatItIsAndNamesEveryOption) {
    const std::string help = answerTo({"--help"});
    EXPECT_THAT(help, StartsWith("Turns touches of the touch surface into media keys: "));
    EXPECT_THAT(help, HasSubstr("\nUsage: zorvatouchd [OPTIONS]\n"));
    for (const char *option :
         {"--device", "--seed", "--duration", "--id", "--wait", "--accel", "--map", "--no-keys", "--keys",
          "--key-limit", "--events", "--save", "--save-count", "--save-bytes", "--save-serial", "--log-level",
          "--describe", "--plugin", "--version"})
        EXPECT_THAT(help, HasSubstr(std::string("\n  ") + option + " ")) << option;
    for (const char *group : {"Surfaces", "Keys", "Output", "Other", "Examples", "Signals", "Exit status"})
        EXPECT_THAT(help, HasSubstr(std::string("\n") + group + ":\n")) << group;
    EXPECT_EQ(answerTo({"-h"}), help);
}

TEST(DaemonOptions, HelpFitsAScreenOfEightyColumns) {
    const std::string help = answerTo({"--help"});
    std::size_t begin = 0;
    for (std::size_t end; (end = help.find('\n', begin)) != std::string::npos; begin = end + 1)
        EXPECT_LE(end - begin, 80u) << help.substr(begin, end - begin);
}

TEST(DaemonOptions, HelpNamesEveryScenario) {
    std::string help = answerTo({"--help"});
    for (const Synth::Scenario &scenario : Synth::scenarios())
        EXPECT_THAT(help, HasSubstr(" " + std::string(scenario.name))) << scenario.name;
}

// --- What is refused ---------------------------------------------------------------------------------------

TEST(DaemonOptions, UnknownWordsAreRefused) {
    EXPECT_EQ(problemWith({"run"}), "unexpected argument 'run'");
    EXPECT_EQ(problemWith({"--loud"}), "unknown option '--loud'");
    EXPECT_EQ(problemWith({"--acc", "none"}), "unknown option '--acc'");
    EXPECT_EQ(problemWith({"--speed", "2"}), "unknown option '--speed'; did you mean '--seed'?");
    EXPECT_EQ(problemWith({"a\nb\xFF"}), "unexpected argument 'a\\nb\xEF\xBF\xBD'");
}

TEST(DaemonOptions, ValuesMustBeThere) {
    EXPECT_EQ(problemWith({"--device"}), "--device: 1 required DEVICE missing");
    EXPECT_EQ(problemWith({"--id"}), "--id: 1 required VENDOR:PRODUCT missing");
    EXPECT_EQ(problemWith({"--save"}), "--save: 1 required FILE missing");
    EXPECT_EQ(problemWith({"--no-keys=maybe"}), "Could not convert: --no-keys = maybe");
}

TEST(DaemonOptions, WhatIsOneThingIsGivenOnce) {
    EXPECT_EQ(problemWith({"--save", "a", "--save", "a"}), "--save may be given only once");
    EXPECT_EQ(problemWith({"--events", "json", "--events", "json"}), "--events may be given only once");
    EXPECT_EQ(problemWith({"--accel", "a", "--accel", "b"}), "--accel may be given only once");
    EXPECT_EQ(problemWith({"--log-level", "debug", "--log-level", "error"}),
              "--log-level may be given only once");
    EXPECT_EQ(problemWith({"--plugin", "a", "--plugin", "b"}), "--plugin may be given only once");
    EXPECT_EQ(problemWith({"--seed", "1", "--seed", "2", "--device", "sim:day"}),
              "--seed may be given only once");
    EXPECT_EQ(problemWith({"--no-keys", "--no-keys"}), "--no-keys may be given only once");
    EXPECT_EQ(problemWith({"--describe", "--describe"}), "--describe may be given only once");
    EXPECT_EQ(problemWith({"--device", "/a", "--device", "/a"}), "--device: '/a' is given twice");
    EXPECT_EQ(problemWith({"--device", "sim:day", "--device", "sim:day"}),
              "--device: 'sim:day' is given twice");
    EXPECT_EQ(problemWith({"--id", "1:2", "--id", "0001:0002"}), "--id: '0001:0002' is given twice");
}

TEST(DaemonOptions, DevicesAreNodesOrScenarios) {
    for (const char *device : {"", "hidraw0", "recording:a"})
        EXPECT_EQ(problemWith({"--device", device}),
                  "--device: '" + std::string(device) +
                      "' must be a path, as /dev/hidraw0, or sim:SCENARIO; scenarios are " + kScenarios);
    EXPECT_EQ(problemWith({"--device", "sim:night"}),
              "--device: 'night' is not a scenario; scenarios are " + kScenarios);
    EXPECT_EQ(problemWith({"--device", "sim:"}),
              "--device: '' is not a scenario; scenarios are " + kScenarios);
}

TEST(DaemonOptions, NumbersMustFit) {
    EXPECT_EQ(problemWith({"--device", "sim:day", "--seed", "-1"}), "--seed: '-1' must be an integer >= 0");
    EXPECT_EQ(problemWith({"--device", "sim:day", "--duration", "0"}),
              "--duration: '0' must be a number from 0.1 to 36000 (s)");
}

TEST(DaemonOptions, MakesAreTwoHexadecimalNumbers) {
    for (const char *id : {"", ":", "1234", "1234:", ":ABCD", "12345:1", "1:12345", "0x12:1", "-1:2", "+1:2",
                           "1:2:3", "g:1", " 1:2", "1: 2"})
        EXPECT_EQ(problemWith({"--id", id}),
                  "--id: '" + std::string(id) +
                      "' must be VENDOR:PRODUCT in hexadecimal digits, at most four each, as 1234:ABCD");
}

TEST(DaemonOptions, UnknownKeysAreRefusedWithTheKnownOnes) {
    EXPECT_THAT(problemWith({"--map", "tap:volume-up=KEY_X"}),
                StartsWith("--map: 'KEY_X' is not a key that can be pressed; "));
    EXPECT_EQ(problemWith({"--map", "swipe:volume-up=none"}),
              "--map: 'swipe' is not a gesture; gestures are tap, hold");
    EXPECT_EQ(problemWith({"--map", "tap:left=none"}),
              "--map: 'left' is not a region; regions are play-pause, volume-down, volume-up");
    EXPECT_EQ(problemWith({"--map", "tap"}),
              "--map: 'tap' is not GESTURE:REGION=KEY, which is written as tap:volume-up=KEY_NEXTSONG");
}

TEST(DaemonOptions, LimitsOfRecordingsMustFit) {
    EXPECT_EQ(problemWith({"--save", "a", "--save-count", "1001"}),
              "--save-count: '1001': must be an integer from 1 to 1000");
    EXPECT_NE(problemWith({"--save", "a", "--save-count", "0"}), "none");
    EXPECT_NE(problemWith({"--save", "a", "--save-count", "1.5"}), "none");
    EXPECT_NE(problemWith({"--save", "a", "--save-bytes", "0"}), "none");
    for (const char *option : {"--save-count=2", "--save-bytes=2", "--save-serial"})
        EXPECT_EQ(problemWith({option}), "--save-count, --save-bytes and --save-serial need --save FILE");
}

TEST(DaemonOptions, OtherValuesAreRefused) {
    EXPECT_EQ(problemWith({"--events", "xml"}), "--events: 'xml' is not a format; json is");
    EXPECT_EQ(problemWith({"--events", ""}), "--events: '' is not a format; json is");
    EXPECT_EQ(problemWith({"--log-level", "info"}), "--log-level: 'info' must be debug, default or error");
    EXPECT_EQ(problemWith({"--accel", ""}), "--accel: '' must be auto, none or the name of an accelerometer");
    EXPECT_EQ(problemWith({"--save", ""}), "--save: '' is not the name of a file");
    EXPECT_EQ(problemWith({"--save", "-"}), "--save: '-' is not the name of a file");
    EXPECT_EQ(problemWith({"--save", "a/"}), "--save: 'a/' is not the name of a file");
    EXPECT_EQ(problemWith({"--plugin", ""}), "--plugin: '' is not the name of a file");
}

TEST(DaemonOptions, WhatDoesNotGoTogetherIsRefused) {
    EXPECT_EQ(problemWith({"--seed", "1"}), "--seed is for --device sim:SCENARIO");
    EXPECT_EQ(problemWith({"--device", "/dev/hidraw0", "--duration", "1"}),
              "--duration is for --device sim:SCENARIO");
    EXPECT_EQ(problemWith({"--id", "1:2", "--device", "/dev/hidraw0"}),
              "--id and --device exclude each other: --device looks for no make");
    EXPECT_EQ(problemWith({"--describe", "--save", "a"}), "--describe and --save exclude each other");
    EXPECT_EQ(problemWith({"--events", "json", "--describe"}), "--describe and --events exclude each other");
    EXPECT_EQ(problemWith({"--describe", "--wait"}), "--describe and --wait exclude each other");
    EXPECT_EQ(problemWith({"--no-keys", "--describe"}), "--describe and --no-keys exclude each other");
    EXPECT_EQ(problemWith({"--keys", "--describe"}), "--describe and --keys exclude each other");
    EXPECT_EQ(problemWith({"--keys", "--no-keys"}), "--keys and --no-keys exclude each other");
    EXPECT_EQ(problemWith({"--describe", "--device", "sim:day", "--duration", "1"}),
              "--describe and --duration exclude each other");
}

} // namespace
} // namespace ZorvaTouch::Tools
