#include "Tools/Stimulus/StimulusText.h"

#include <gtest/gtest.h>

#include <string>

namespace ZorvaTouch::Tools {
namespace {

/// The message for a text, or "" if it can be read.
std::string errorFor(const std::string &text) {
    try {
        static_cast<void>(parseStimulus(text));
        return "";
    } catch (const StimulusError &error) {
        return error.what();
    }
}

struct ErrorCase {
    std::string text;
    std::string error;
};

void expectErrors(const std::vector<ErrorCase> &cases) {
    for (const ErrorCase &row : cases)
        EXPECT_EQ(errorFor(row.text), row.error) << row.text;
}

TEST(StimulusErrors, SayTheLineAndTheProblem) {
    try {
        static_cast<void>(parseStimulus("# comment\nidle\r\ntouch P=3"));
        FAIL() << "no error";
    } catch (const StimulusError &error) {
        EXPECT_EQ(error.line, 3u);
        EXPECT_EQ(error.message, "unknown electrode 'P'");
        EXPECT_STREQ(error.what(), "line 3: unknown electrode 'P'");
    }
}

TEST(StimulusErrors, OfDirectives) {
    expectErrors({
        {"poke A=3", "line 1: unknown directive 'poke'"},
        {"Touch A=3", "line 1: unknown directive 'Touch'"},
        {"frame 1 @0ms tap none", "line 1: unknown directive 'frame'"},
        {std::string(50, 'x'), "line 1: unknown directive '" + std::string(40, 'x') + "...'"},
    });
}

TEST(StimulusErrors, OfElectrodes) {
    expectErrors({
        {"touch", "line 1: an electrode is missing, as in A=300"},
        {"touch for 10ms", "line 1: an electrode is missing, as in A=300"},
        {"touch A", "line 1: 'A' is no electrode with a value, as in A=300"},
        {"touch A=1 fro 10ms", "line 1: 'fro' is no electrode with a value, as in A=300"},
        {"touch a=1", "line 1: unknown electrode 'a'"},
        {"touch P=1", "line 1: unknown electrode 'P'"},
        {"touch @=1", "line 1: unknown electrode '@'"},
        {"touch AB=1", "line 1: unknown electrode 'AB'"},
        {"touch =1", "line 1: unknown electrode ''"},
        {"touch A=1 B=2 A=3", "line 1: electrode 'A' has two values"},
        {"counts O=1 O=1", "line 1: electrode 'O' has two values"},
        {"counts Q=1", "line 1: unknown electrode 'Q'"},
    });
}

TEST(StimulusErrors, OfValues) {
    expectErrors({
        {"touch A=", "line 1: '' is no signal from -32768 to 32767"},
        {"touch A=32768", "line 1: '32768' is no signal from -32768 to 32767"},
        {"touch A=-32769", "line 1: '-32769' is no signal from -32768 to 32767"},
        {"touch A=1.5", "line 1: '1.5' is no signal from -32768 to 32767"},
        {"touch A=+1", "line 1: '+1' is no signal from -32768 to 32767"},
        {"touch A=99999999999999999999", "line 1: '99999999999999999999' is no signal from -32768 to 32767"},
        {"touch A=1..", "line 1: '' is no signal from -32768 to 32767"},
        {"touch A=1..2..3", "line 1: '2..3' is no signal from -32768 to 32767"},
        {"counts A=65536", "line 1: '65536' is no raw count from 0 to 65535"},
        {"counts A=-1", "line 1: '-1' is no raw count from 0 to 65535"},
        {"counts A=1..2", "line 1: '1..2' is no raw count from 0 to 65535"},
        {"firmware 256", "line 1: '256' is no event code from 0 to 255"},
        {"firmware", "line 1: an event code is missing"},
        {"firmware 1 100", "line 1: '100' is no byte from 00 to ff"},
        {"firmware 1 1 2 3 4 5 6 7 8 9", "line 1: a firmware event has at most 8 bytes of payload"},
        {"raw 0g", "line 1: '0g' is no byte from 00 to ff"},
        {"raw 0x1", "line 1: '0x1' is no byte from 00 to ff"},
        {"number -1", "line 1: '-1' is no frame number from 0 to 4294967295"},
        {"number 4294967296", "line 1: '4294967296' is no frame number from 0 to 4294967295"},
        {"number", "line 1: a frame number is missing"},
        {"state", "line 1: a key is missing"},
        {"state a", "line 1: a value is missing"},
        {"meta a # b", "line 1: a value is missing"},
        {"state a null", "line 1: null cannot be kept in a recording"},
    });
}

TEST(StimulusErrors, OfTimes) {
    expectErrors({
        {"every", "line 1: a time is missing"},
        {"every 10", "line 1: '10' is no time from 1ms to 1000000ms"},
        {"every 10 ms", "line 1: '10' is no time from 1ms to 1000000ms"},
        {"every 0ms", "line 1: '0ms' is no time from 1ms to 1000000ms"},
        {"every 1000001ms", "line 1: '1000001ms' is no time from 1ms to 1000000ms"},
        {"every 10ms 20ms", "line 1: unexpected '20ms'"},
        {"clock 4294967296ms", "line 1: '4294967296ms' is no time from 0ms to 4294967295ms"},
        {"clock 1s", "line 1: '1s' is no time from 0ms to 4294967295ms"},
        {"wait 0ms", "line 1: '0ms' is no time from 1ms to 4294967295ms"},
        {"wait ms", "line 1: 'ms' is no time from 1ms to 4294967295ms"},
        {"idle for 15ms", "line 1: '15ms' is no whole number of periods of 10ms"},
        {"every 7ms\nidle for 20ms", "line 2: '20ms' is no whole number of periods of 7ms"},
        {"idle for 0ms", "line 1: '0ms' is no time from 1ms to 9223372036854775807ms"},
        {"idle for", "line 1: a time or a number of reports is missing"},
        {"idle for 5", "line 1: '5' is no time from 1ms to 9223372036854775807ms"},
        {"idle for 0 reports", "line 1: '0' is no number of reports from 1 to 1000000"},
        {"idle for 10ms reports", "line 1: '10ms' is no number of reports from 1 to 1000000"},
        {"idle for 5 reports now", "line 1: unexpected 'now'"},
        {"idle 10ms", "line 1: unexpected '10ms'"},
        {"reset now", "line 1: unexpected 'now'"},
    });
}

TEST(StimulusErrors, OfSize) {
    expectErrors({
        {"idle for 1000000 reports\nidle", "line 2: the recording gets more than 1000000 frames"},
        {"idle for 1000000 reports\nstate a 1", "line 2: the recording gets more than 1000000 frames"},
        {"idle for 1000000 reports\nraw", "line 2: the recording gets more than 1000000 frames"},
        {"idle for 1000001 reports", "line 1: '1000001' is no number of reports from 1 to 1000000"},
        {"idle for 9223372036854775800ms", "line 1: the recording gets more than 1000000 frames"},
    });
}

TEST(StimulusErrors, OfASizeThatTheCallerLimits) {
    EXPECT_EQ(parseStimulus("idle for 3 reports", 3).frames.size(), 3u);
    try {
        static_cast<void>(parseStimulus("idle for 3 reports\nidle", 3));
        FAIL() << "four frames were made";
    } catch (const StimulusError &error) {
        EXPECT_STREQ(error.what(), "line 2: the recording gets more than 3 frames");
    }
}

TEST(StimulusErrors, OfLength) {
    // 10^13 ms are 2328 of the longest waits and 1316137240 ms more.
    std::string text;
    for (int i = 0; i < 2328; ++i)
        text += "wait 4294967295ms\n";
    EXPECT_EQ(errorFor(text + "wait 1316137240ms"), "");
    EXPECT_EQ(errorFor(text + "wait 1316137241ms"),
              "line 2329: the recording gets longer than 10000000000000ms");
    EXPECT_EQ(errorFor(text + "wait 1316137240ms\nidle"),
              "line 2330: the recording gets longer than 10000000000000ms");
}

TEST(StimulusErrors, OfExpectedLines) {
    expectErrors({
        {"idle\n\ntap", "line 3: 'tap' begins no expected line (the first blank line ends the stimulus)"},
        {"idle\n\nidle", "line 3: 'idle' begins no expected line (the first blank line ends the stimulus)"},
        {"idle\n\ntouch A=3",
         "line 3: 'A=3' is no frame number as in 14: (the first blank line ends the stimulus)"},
        {"idle\n\nframe", "line 3: a frame number is missing"},
        {"idle\n\nframe x", "line 3: 'x' is no frame number from 0 to 4294967295"},
        {"idle\n\nframe 1", "line 3: a time as in @130ms is missing"},
        {"idle\n\nframe 1 130ms", "line 3: '130ms' is no time as in @130ms"},
        {"idle\n\nframe 1 @130", "line 3: '130' is no time from 0ms to 4294967295ms"},
        {"idle\n\nframe 1 @0ms", "line 3: a gesture is missing"},
        {"idle\n\nframe 1 @0ms swipe none", "line 3: unknown gesture 'swipe'"},
        {"idle\n\nframe 1 @0ms reset none", "line 3: unknown gesture 'reset'"},
        {"idle\n\nframe 1 @0ms tap", "line 3: a region is missing"},
        {"idle\n\nframe 1 @0ms tap volume", "line 3: unknown region 'volume'"},
        {"idle\n\nframe 1 @0ms tap none now", "line 3: unexpected 'now'"},
        {"idle\n\nreset now", "line 3: unexpected 'now'"},
        {"idle\n\nvirtual", "line 3: a frame number is missing"},
        {"idle\n\nvirtual -1: ts", "line 3: '-1' is no frame number from 0 to 4294967295"},
    });
}

} // namespace
} // namespace ZorvaTouch::Tools
