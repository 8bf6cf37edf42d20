#include "Bench/BarBenchmarks.h"
#include "Bench/Process.h"
#include "Bench/Reference/ReferenceRecognizer.h"
#include "Bench/Rounds.h"
#include "Bench/SampleReports.h"
#include "Shared/RecordingContainer.h"
#include "Shared/Util/Json.h"

// The command line's replay of ten minutes, from its start to its end.

namespace ZorvaTouch::Bench {
namespace {

constexpr int kRounds = 11;
constexpr std::size_t kReportCount = 60'000;
constexpr double kRealTimeMs = kReportCount * kReportPeriodMs;

/// What the replay must print, made with the recognizer that is written straight down.
std::string expectedOutput() {
    Reference::Recognizer recognizer;
    std::string text;
    std::size_t number = 0;
    for (const InputReport::Image &image : makeImages(Stimulus::Taps, kReportCount)) {
        text += R"({"type":"image","n":)" + std::to_string(number++);
        text += R"(,"frameNumber":)" + std::to_string(image.frameNumber);
        text += R"(,"timeMs":)" + std::to_string(image.timeMs) + R"(,"events":[)";
        for (const auto &event : recognizer.handleImage(image)) // at most one
            text += jsonText(*event);
        text += "]}\n";
    }
    text += R"({"type":"end","EventStats":)" + Util::jsonText(recognizer.getState("EventStats"));
    text += R"(,"ResetCount":0,"DisjointImageCount":0})"
            "\n";
    return text;
}

void replay(benchmark::State &state, BarTable &table, const std::string &program) {
    const std::string name = "replay --json of ten minutes";
    const TemporaryFile recording(writeRecordingContainer(makeReportRecording(Stimulus::Taps, kReportCount)));
    const std::vector<std::string> command{program, "replay", "--json", recording.path()};
    const ProcessResult result = runProcess(command, ProcessOutput::Capture);
    if (result.exitStatus != 0 || result.output != expectedOutput())
        return reportError(state, table, name, "the output is not the expected one");

    Samples wall, cpu;
    for (auto _ : state) {
        const double before = wallNs();
        cpu.add(runProcess(command, ProcessOutput::Discard).cpuNs);
        const double timeNs = wallNs() - before;
        wall.add(timeNs);
        state.SetIterationTime(timeNs / 1e9);
    }
    Bar bar{.name = name,
            .unit = "ms",
            .counterpartName = "real time",
            .figure = wall.fastest() / 1e6,
            .counterpart = kRealTimeMs,
            .sense = Bar::Sense::AtLeast,
            .limit = 4000};
    report(state, table, bar);
    bar.limit.reset();
    bar.name = name + ", median";
    bar.figure = wall.median() / 1e6;
    table.add(bar);
    bar.name = name + ", processor";
    bar.figure = cpu.median() / 1e6;
    table.add(bar);
}

} // namespace

void registerReplayBar(BarTable &table, const std::string &program) {
    registerBar("bar/replay", kRounds,
                [&table, program](benchmark::State &state) { replay(state, table, program); });
}

} // namespace ZorvaTouch::Bench
