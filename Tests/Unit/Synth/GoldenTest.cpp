#include "Host/Runtime/Files.h"
#include "Shared/RecordingContainer.h"
#include "Synth/Stream.h"
#include "Tools/Cli/Options.h"
#include "Tools/Cli/ReplayJson.h"
#include "Tools/Stimulus/VirtualClock.h"

#include <gtest/gtest.h>

#include <sstream>
#include <stdexcept>
#include <string>
#include <utility>
#include <variant>
#include <vector>

// The shipped recordings of Tests/Golden/Synth: made again from their commands, and replayed.

namespace ZorvaTouch::Tools {
namespace {

const std::string kFolder = ZORVA_TEST_DIR "/Golden/Synth/";

/// A line of commands.txt: "zorvatouch synth --scenario taps --seed 32 --duration 3 -o taps.json".
SynthOptions readCommand(const std::string &line) {
    std::istringstream words(line);
    std::vector<std::string> arguments;
    for (std::string word; words >> word;)
        arguments.push_back(word);
    arguments.erase(arguments.begin()); // the program
    return std::get<SynthOptions>(parseOptions(arguments));
}

std::vector<SynthOptions> readCommands() {
    std::istringstream lines(Host::readFile(kFolder + "commands.txt"));
    std::vector<SynthOptions> commands;
    for (std::string line; std::getline(lines, line);)
        commands.push_back(readCommand(line));
    return commands;
}

std::string replayLines(FrameList frames) {
    VirtualClock clock;
    Replay replay(std::move(frames), clock, Ports::silentLogProvider());
    std::string text;
    while (replay.next())
        appendReplayLine(text, replay, false);
    appendReplayEnd(text, replay);
    return text;
}

class SynthGolden : public ::testing::TestWithParam<std::string> {
protected:
    static SynthOptions command() {
        for (SynthOptions &options : readCommands())
            if (options.scenario->name == GetParam())
                return options;
        throw std::out_of_range("no command for " + GetParam());
    }
    static std::string name() { return GetParam(); }
};

TEST_P(SynthGolden, IsMadeAgainByItsCommand) {
    const SynthOptions options = command();
    EXPECT_EQ(options.out, name() + ".json");
    const FrameList frames =
        Synth::synthesize(*options.scenario, options.parameters, options.seed, options.duration);
    EXPECT_TRUE(writeRecordingContainer(frames) == Host::readFile(kFolder + options.out))
        << options.out << " is not what its line in commands.txt makes";
}

TEST_P(SynthGolden, GivesTheSameGesturesAsEver) {
    const RecordingContainer recording = readRecordingContainer(Host::readFile(kFolder + name() + ".json"));
    std::istringstream expected(Host::readFile(kFolder + name() + ".jsonl"));
    std::istringstream actual(replayLines(recording.frames));
    std::string expectedLine, actualLine;
    while (std::getline(expected, expectedLine)) {
        ASSERT_TRUE(std::getline(actual, actualLine));
        ASSERT_EQ(actualLine, expectedLine);
    }
    EXPECT_FALSE(std::getline(actual, actualLine)) << actualLine;
}

TEST_P(SynthGolden, IsSmall) { EXPECT_LE(Host::readFile(kFolder + name() + ".json").size(), 150'000u); }

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

INSTANTIATE_TEST_SUITE_P(All, SynthGolden, ::testing::ValuesIn(scenarioNames()), testName);

} // namespace
} // namespace ZorvaTouch::Tools
