#pragma once

#include "Shared/FrameList.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"

#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>

namespace ZorvaTouch::Tools {

/// What the pipeline took a frame for.
enum class InputKind {
    State,
    Metadata,
    Image,
    Reset,     ///< firmware event: the device has reset
    Firmware,  ///< any other firmware event
    Unhandled, ///< a report that is neither an image nor a firmware event
};

/// A frame that was played, and what came of it.
struct ReplayedFrame {
    InputKind kind = InputKind::State;
    std::size_t index = 0;         ///< in the recording, from 0, all frames counted
    std::uint64_t timestampNs = 0; ///< as recorded
    InputReport::Image image{};    ///< of an image; else the last one's
    std::uint8_t eventCode = 0;    ///< of a firmware event
    bool isDisjoint = false;       ///< an image whose number does not follow the one before
    HostEventList events;          ///< in the pipeline's order
};

/// Plays a recording into a pipeline of its own, frame by frame.
///
///     Replay replay(frames, clock, logs);
///     while (replay.next())
///         use(replay.frame());
///
/// Threads: none of its own; the caller serialises.
class Replay {
public:
    /// As fast as it goes.
    static constexpr float kNoPauses = std::numeric_limits<float>::infinity();

    /// @param frames  In the order in which they are played.
    /// @param clock   Sleeps between frames. Borrowed, for the life of the replay.
    /// @param logs    Asked for the recognizer's log.
    Replay(FrameList frames, Ports::Clock &clock, Ports::LogProvider &logs);
    Replay(const Replay &) = delete; // the pipeline's hooks point here
    Replay &operator=(const Replay &) = delete;

    /// Sets a state of the recognizer, before the first frame: the recording's own writes come later and win.
    /// @param key  Without a domain ("ActivationThreshold").
    void setState(const std::string &key, const PropertyValue &value);

    /// Plays the next frame, after the recorded pause divided by `speed`.
    /// @return False when all frames have been played; `frame` is then the last one's.
    [[nodiscard]] bool next(float speed = kNoPauses);

    /// The frame played last. Valid until the next one is.
    [[nodiscard]] const ReplayedFrame &frame() const noexcept { return _frame; }
    /// The same as it was recorded. Only after `next` was true.
    [[nodiscard]] FrameView recorded() const noexcept { return *_recorded; }
    /// Time of `frame` since the first one. Negative if the recording is not in order of time.
    [[nodiscard]] std::int64_t offsetNs() const noexcept;

    // The recognizer's view of the image played last. Costly: each is a line of about a thousand characters.
    [[nodiscard]] std::string touchDescription() const;
    [[nodiscard]] std::string virtualDescription() const;

    [[nodiscard]] const FrameList &frames() const noexcept { return _recording.frames(); }
    [[nodiscard]] const Pipeline &pipeline() const noexcept { return *_pipeline; }

private:
    void watchPipeline();

    std::shared_ptr<Pipeline> _pipeline;
    PipelineRecording _recording;
    FrameList::Iterator _recorded; ///< once played: the frame of `_frame`
    std::size_t _playedCount = 0;
    ReplayedFrame _frame;
};

} // namespace ZorvaTouch::Tools
