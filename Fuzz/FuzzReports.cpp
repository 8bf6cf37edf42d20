#include "Fuzz/Transcript.h"

#include <algorithm>
#include <span>
#include <vector>

// Raw reports of every length and ID: live and replayed they give the same.
//
// Input: chunks of one length byte (times 3, so that 0 to 765 is reached) and as many report bytes.

using namespace ZorvaTouch;

namespace {

std::vector<std::span<const std::uint8_t>> splitReports(std::span<const std::uint8_t> input) {
    std::vector<std::span<const std::uint8_t>> reports;
    while (!input.empty()) {
        const std::size_t wanted = input[0] * std::size_t{3};
        input = input.subspan(1);
        const std::size_t length = std::min(wanted, input.size());
        reports.push_back(input.first(length));
        input = input.subspan(length);
    }
    return reports;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    Fuzzing::StillClock clock;
    Fuzzing::TranscribedPipeline live;
    PipelineRecording recording(clock);
    recording.pipeline = live.pipeline();
    std::uint64_t now = 0;
    for (const auto report : splitReports({data, size}))
        recording.handleInputReport(now += 10'000'000, report.data(), report.size());

    Fuzzing::TranscribedPipeline replayed;
    replayed.play(recording.frames());
    ZORVA_MUST(live.text() == replayed.text());
    Fuzzing::demandReplayAgrees(recording.frames());
    return 0;
}
