#pragma once

#include "Shared/FrameList.h"
#include "Shared/PipelineInput.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Util/Ticks.h"

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace ZorvaTouch {

/// Stands in front of a pipeline, keeps every call as a frame and passes it on; plays frames back.
///
/// Recording is always on; only the bound limits its memory. Recording happens before passing on, so that an
/// input on which the pipeline fails is kept too.
///
/// Errors:   std::bad_alloc where a frame is added, trimmed, sorted, copied or written. An input that cannot
/// be
///           recorded leaves the recording as it was and is not passed on.
/// Threads:  no lock of its own; the caller serialises. A copy may be used on another thread.
/// Realtime: input reports yes, once the recording has been full.
class PipelineRecording : public PipelineInput {
public:
    /// An empty recording without a bound and without a pipeline.
    /// @param clock  Time base, now and sleep. Borrowed; must outlive the recording and its copies.
    explicit PipelineRecording(Ports::Clock &clock);

    /// Reads a recording from its JSON text; frames in file order, neither sorted nor trimmed, no bound, no
    /// pipeline.
    ///
    /// @param jsonData  Nothing stands for "none supplied".
    /// @throws std::invalid_argument  for a frame that is not as it must be; `FrameError` if it is known
    /// which one.
    /// @throws std::runtime_error     "migrateSerializedContainer failed: ..." for text that is no container.
    PipelineRecording(std::optional<std::string_view> jsonData, Ports::Clock &clock);

    /// Frames that were read already: a `FrameList` and nothing that turns into one, so that `{}` is the text
    /// that was not supplied.
    template <std::same_as<FrameList> Frames>
    PipelineRecording(Frames frames, Ports::Clock &clock)
        : _clock(&clock), _ticks(clock), _frames(std::move(frames)) {}

    // A copy has the same frames, bound and pipeline, but it is not playing.
    PipelineRecording(const PipelineRecording &other);
    PipelineRecording &operator=(const PipelineRecording &other);
    PipelineRecording(PipelineRecording &&other) noexcept = default;
    PipelineRecording &operator=(PipelineRecording &&other) noexcept = default;
    ~PipelineRecording() override = default;

    std::shared_ptr<PipelineInput> pipeline; ///< where calls go on to; may be null

    // Capture, then pass on unchanged. Errors of the pipeline pass through after the frame was recorded.
    void setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override;
    void handleInputReport(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length) override;
    void handleMetadata(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override;

    /// Adds a frame, trims the list down to the bound once it holds twice as many frames, and ends a
    /// playback. The frame is kept as it is: what its kind has no use for (a key of a report) stays in the
    /// list, and is neither passed on by a playback nor written as text.
    void appendFrame(Frame frame);

    /// Sets the bound and trims to it at once; 0 means no bound. A playback goes on at its frame, or at the
    /// next one that is kept.
    void setMaxFrameCount(std::uint64_t count);
    [[nodiscard]] std::uint64_t maxFrameCount() const noexcept { return _maxFrameCount; }

    [[nodiscard]] const FrameList &frames() const noexcept { return _frames; }

    /// Keeps the newest `maxCount` frames and the state writes that still matter; see `FrameList::trim`.
    static void trimFrames(FrameList &list, std::uint64_t maxCount) { list.trim(maxCount); }
    /// Sorts by time stamp, stable.
    static void sortFrames(FrameList &list) { list.sort(); }

    /// The recording as JSON text. First trims (if there is a bound) and sorts the recording itself; that is
    /// meant. A playback goes on at its frame.
    [[nodiscard]] std::string json();

    /// Turns an older container into the current version; the current one is returned unchanged.
    /// @throws std::invalid_argument  with a message fit to show.
    [[nodiscard]] static PropertyValue migrateSerializedContainer(const PropertyValue &object);

    /// Starts playback at the first frame.
    void playReset();
    /// Whether a playback is in progress and has frames left.
    [[nodiscard]] bool playCanContinue() const noexcept;
    /// Waits for the recorded spacing, divided by `speed`, then passes the next frame on, with a time stamp
    /// as if the recording had begun at `playReset`. Speed changes the pacing and never the time stamps.
    ///
    /// @param speed  0 and less count as 1. NaN and infinity play without waiting.
    /// @throws std::runtime_error  "playback finished" if there is nothing to play. Errors of the pipeline
    /// pass
    ///                             through; the frame then counts as played.
    void playNextFrame(float speed);

private:
    struct Play {
        bool valid = false;
        std::size_t position = 0; ///< in `_frames`, next to play
        std::uint64_t startTimeMach = 0;
        std::optional<std::uint64_t> lastFrameTimeNs;
    };

    void frameAppended();
    void trim(std::uint64_t maxCount);
    void sort();
    void waitForFrame(std::uint64_t timestampNs, float speed);
    void forward(const Frame &frame, std::uint64_t timestamp);

    Ports::Clock *_clock;
    Util::TickConverter _ticks;
    FrameList _frames;
    std::uint64_t _maxFrameCount = 0;
    Play _play;
};

} // namespace ZorvaTouch
