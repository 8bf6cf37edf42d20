#include "Bench/BarBenchmarks.h"
#include "Bench/RapidJsonRoads.h"
#include "Bench/Rounds.h"
#include "Bench/SampleReports.h"
#include "Shared/RecordingContainer.h"

#include <algorithm>

// Containers read and written beside RapidJSON: the same text, the same frames, the same hex.

namespace ZorvaTouch::Bench {
namespace {

constexpr int kRounds = 41;

bool isSame(const FrameList &left, const FrameList &right) {
    return left.size() == right.size() && std::equal(left.begin(), left.end(), right.begin(),
                                                     [](const FrameView &one, const FrameView &other) {
                                                         return one.toFrame() == other.toFrame();
                                                     });
}

void readContainer(benchmark::State &state, BarTable &table, Bar bar, RapidJsonChecks checks) {
    const std::string text = writeRecordingContainer(makeRecording(kFullRecording));
    const auto other = readWithRapidJson(text, checks);
    if (!other || !isSame(*other, readRecordingContainer(text).frames))
        return reportError(state, table, bar.name, "the frames read differ");

    Rounds rounds;
    rounds.run(
        state, [&] { return cpuTimeOf([&] { benchmark::DoNotOptimize(readRecordingContainer(text)); }); },
        [&] { return cpuTimeOf([&] { benchmark::DoNotOptimize(readWithRapidJson(text, checks)); }); });
    bar.unit = "ms";
    bar.sense = Bar::Sense::AtLeast;
    bar.figure = rounds.figure.median() / 1e6;
    bar.counterpart = rounds.counterpart.median() / 1e6;
    report(state, table, bar);
}

void writeContainer(benchmark::State &state, BarTable &table) {
    const std::string name = "writing a container";
    const FrameList frames = makeRecording(kFullRecording);
    const std::string text = writeRecordingContainer(frames);
    if (RapidJsonText(frames, text.size()).text() != text)
        return reportError(state, table, name, "the texts written differ");

    Rounds rounds;
    rounds.run(
        state, [&] { return cpuTimeOf([&] { benchmark::DoNotOptimize(writeRecordingContainer(frames)); }); },
        [&] {
            return cpuTimeOf(
                [&] { benchmark::DoNotOptimize(RapidJsonText(frames, text.size()).text().size()); });
        });
    report(state, table,
           {.name = name,
            .unit = "ms",
            .counterpartName = "RapidJSON Writer",
            .figure = rounds.figure.median() / 1e6,
            .counterpart = rounds.counterpart.median() / 1e6,
            .sense = Bar::Sense::AtLeast,
            .limit = 0.9});
}

} // namespace

void registerContainerBars(BarTable &table) {
    registerBar("bar/read", kRounds, [&table](benchmark::State &state) {
        readContainer(state, table,
                      {.name = "reading a container", .counterpartName = "RapidJSON SAX", .limit = 1.5},
                      RapidJsonChecks::Same);
    });
    registerBar("bar/read_unchecked", kRounds, [&table](benchmark::State &state) {
        readContainer(state, table,
                      {.name = "reading a container", .counterpartName = "RapidJSON SAX, unchecked"},
                      RapidJsonChecks::Default);
    });
    registerBar("bar/write", kRounds, [&table](benchmark::State &state) { writeContainer(state, table); });
}

} // namespace ZorvaTouch::Bench
