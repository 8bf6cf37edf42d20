#include "Bench/HardeningWork.h"
#include "Bench/SampleReports.h"
#include "Bench/StillClock.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/RecordingContainer.h"

#include <memory>
#include <string>

using namespace ZorvaTouch;

std::size_t zorvaBenchWork() noexcept {
    static Bench::StillClock clock;
    static const std::vector<Bench::Report> reports =
        Bench::makeReports(Bench::Stimulus::Taps, Bench::kServiceBound);
    PipelineRecording recording(clock);
    recording.pipeline = std::make_shared<Pipeline>(Ports::silentLogProvider());
    std::uint64_t now = 0;
    for (const Bench::Report &report : reports)
        recording.handleInputReport(++now, report.data(), report.size());
    const std::string text = writeRecordingContainer(recording.frames());
    return text.size() + readRecordingContainer(text).frames.size();
}
