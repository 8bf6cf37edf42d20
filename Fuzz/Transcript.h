#pragma once

#include "Shared/FrameList.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/Ports/Clock.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

namespace ZorvaTouch::Fuzzing {

/// Ends the process if two roads that must agree do not.
#define ZORVA_MUST(condition)                                                                                \
    do {                                                                                                     \
        if (!(condition)) {                                                                                  \
            std::fprintf(stderr, "%s:%d: does not hold: %s\n", __FILE__, __LINE__, #condition);              \
            std::abort();                                                                                    \
        }                                                                                                    \
    } while (false)

/// A clock that stands still and never sleeps.
class StillClock final : public Ports::Clock {
public:
    std::uint64_t nowTicks() noexcept override { return 1'000'000'000; }
    Ports::TimeBase timeBase() noexcept override { return {1, 1}; }
    void sleepMicroseconds(std::uint64_t) noexcept override {}
};

/// A pipeline that writes down its events and, after each image, both descriptions.
class TranscribedPipeline {
public:
    TranscribedPipeline();
    TranscribedPipeline(const TranscribedPipeline &) = delete; // the hook points here
    TranscribedPipeline &operator=(const TranscribedPipeline &) = delete;
    ~TranscribedPipeline() = default;

    /// Plays the frames into the pipeline, as fast as it goes.
    void play(const FrameList &frames);

    [[nodiscard]] const std::shared_ptr<Pipeline> &pipeline() const { return _pipeline; }
    /// Everything so far, with the counters and the tunables at the end.
    [[nodiscard]] std::string text() const;
    [[nodiscard]] std::string tunables() const;

private:
    std::shared_ptr<Pipeline> _pipeline;
    std::string _events;
};

/// Demands what holds for every recording: replaying twice gives the same text, and a trimmed recording ends
/// in the same tunables.
void demandReplayAgrees(const FrameList &frames);

} // namespace ZorvaTouch::Fuzzing
