#include "Fuzz/Transcript.h"

#include <algorithm>
#include <span>
#include <vector>

// Targets: Shared/Algs.cpp Shared/EventStats.cpp Shared/HandStats.cpp Shared/InputReport.cpp
// Shared/Pipeline.cpp Shared/Pixel.cpp Shared/SVM.cpp Shared/VirtualImage.cpp
//
// Length: 1024
//
// Raw reports of every length and ID: live and replayed they give the same events and state.
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
    std::uint64_t now = Fuzzing::kStartTicks;
    for (const auto report : splitReports({data, size})) {
        recording.handleInputReport(now, report.data(), report.size());
        now += 10'000'000;
    }

    Fuzzing::TranscribedPipeline replayed;
    replayed.play(recording.frames());
    ZORVA_MUST(live.transcript() == replayed.transcript());
    return 0;
}
