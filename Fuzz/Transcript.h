#pragma once

#include "Shared/FrameList.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/Ports/Clock.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <vector>

namespace ZorvaTouch::Fuzzing {

/// Ends the process if a claim does not hold.
#define ZORVA_MUST(condition)                                                                                \
    do {                                                                                                     \
        if (!(condition)) {                                                                                  \
            std::fprintf(stderr, "%s:%d: does not hold: %s\n", __FILE__, __LINE__, #condition);              \
            std::abort();                                                                                    \
        }                                                                                                    \
    } while (false)

/// Host ticks (nanoseconds) at which every live recording and every replay of a target begins, so that both
/// have the same time stamps.
inline constexpr std::uint64_t kStartTicks = 1'000'000'000;

/// A clock that stands still and never sleeps.
class StillClock final : public Ports::Clock {
public:
    std::uint64_t nowTicks() noexcept override { return kStartTicks; }
    Ports::TimeBase timeBase() noexcept override { return {1, 1}; }
    void sleepMicroseconds(std::uint64_t) noexcept override {}
};

/// State or events as numbers. A float is there by its bits, so that a NaN equals itself; no text is made,
/// because formatting takes longer than recognizing.
using Words = std::vector<std::uint64_t>;

/// A pipeline that writes down its events.
class TranscribedPipeline {
public:
    TranscribedPipeline();
    TranscribedPipeline(const TranscribedPipeline &) = delete; // the hook points here
    TranscribedPipeline &operator=(const TranscribedPipeline &) = delete;
    ~TranscribedPipeline() = default;

    /// Plays the frames into the pipeline without waiting.
    void play(const FrameList &frames);

    [[nodiscard]] const std::shared_ptr<Pipeline> &pipeline() const { return _pipeline; }
    /// Events so far with their time stamps, the recognizer's whole state, counters and tunables.
    [[nodiscard]] Words transcript() const;
    [[nodiscard]] Words tunables() const;

private:
    std::shared_ptr<Pipeline> _pipeline;
    Words _events;
};

/// Demands what holds for every recording: two replays have the same transcript, and a trimmed recording ends
/// in the same tunables.
void demandReplayAgrees(const FrameList &frames);

} // namespace ZorvaTouch::Fuzzing
