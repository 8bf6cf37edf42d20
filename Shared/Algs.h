#pragma once

#include "Shared/EventStats.h"
#include "Shared/HandStats.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"
#include "Shared/Pixel.h"
#include "Shared/Ports/Log.h"
#include "Shared/Util/PropertyValue.h"
#include "Shared/VirtualImage.h"

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

namespace ZorvaTouch {

/// One frame's touch signals, index order A to O.
using Signals = std::span<const std::int16_t, kElectrodeCount>;

/// The recognizer: drives the touch model frame by frame and turns its decisions into events.
///
/// Threads:  no lock of its own; the caller serialises all calls.
/// Realtime: frames yes. A frame without an event allocates nothing unless the log is at debug level.
class Algs {
public:
    /// @param logs  Asked once for the recognizer's own log handle.
    explicit Algs(Ports::LogProvider &logs);

    /// Processes one image.
    /// @return The frame's event, if it has one.
    [[nodiscard]] HostEventList handleImage(const InputReport::Image &image);

    /// Winds down a touch in progress after the device has reset: processes one all-zero frame with number 0
    /// and time 0, because the sensor's clock has started again. The touch's duration therefore is a wrapped
    /// difference.
    /// @return That frame's event, if it has one.
    [[nodiscard]] HostEventList handleReset();

    /// Processes one frame and appends at most one event.
    ///
    /// @param values       Sensor counts.
    /// @param frameNumber  Goes into the event and the log.
    /// @param timeMs       Frame time.
    void processTouchFrame(Signals values, std::uint32_t frameNumber, std::uint32_t timeMs,
                           HostEventList &events);

    /// Clears what is measured per touch: all channels' sticky statistics and the hand's strongest channel
    /// and score. Flags, times, tunables, counters and the last event's phase stay.
    void Reset() noexcept;

    /// Reads a tunable or the counters. `key` without the recognizer's domain ("ActivationThreshold").
    /// @return Null for a key that is unknown or cannot be read.
    [[nodiscard]] PropertyValue getState(std::string_view key) const;

    /// Writes a tunable; used from the next frame on. Keys that are unknown or cannot be written are ignored.
    void setState(std::string_view key, const PropertyValue &value);

    /// Whether `setState` does anything with the key: for tools that want to refuse a misspelt one.
    [[nodiscard]] static bool isWritableKey(std::string_view key);

    /// One line about the hand, every electrode and the gesture.
    /// @param values  The frame's input, shown beside each channel's value.
    [[nodiscard]] std::string touchStateDescription(Signals values, std::uint32_t timeMs) const;

    /// The same about the virtual pixels; `values` is not used.
    [[nodiscard]] std::string virtualStateDescription(Signals values, std::uint32_t timeMs) const;

    [[nodiscard]] static std::shared_ptr<HostEvent> createMayBeginEvent(PixelRegion region);
    [[nodiscard]] static std::shared_ptr<HostEvent> createHoldStartEvent(PixelRegion region);
    [[nodiscard]] static std::shared_ptr<HostEvent> createHoldChangeEvent(PixelRegion region);
    [[nodiscard]] static std::shared_ptr<HostEvent> createHoldEndEvent(PixelRegion region);
    [[nodiscard]] static std::shared_ptr<HostEvent> createTapEvent(PixelRegion region);
    [[nodiscard]] static std::shared_ptr<HostEvent> createCancelEvent();

    [[nodiscard]] const Pixels &pixels() const noexcept { return _pixels; }
    [[nodiscard]] const VirtualImage &virtualImage() const noexcept { return _virtualImage; }
    [[nodiscard]] const VirtualPixels &virtualPixels() const noexcept { return _virtualPixels; }
    [[nodiscard]] const HandStats &handStats() const noexcept { return _handStats; }
    [[nodiscard]] const EventStats &eventStats() const noexcept { return _eventStats; }
    [[nodiscard]] std::uint16_t lastEventPhase() const noexcept { return _lastEventPhase; }

private:
    void updatePixels(Signals values) noexcept;
    void updateVirtualPixels() noexcept;
    [[nodiscard]] std::shared_ptr<HostEvent> decideEvent();
    void stampEvent(HostEvent &event, std::uint32_t frameNumber);
    void logFrame(Signals values, std::uint32_t frameNumber, std::uint32_t timeMs) const;

    void setFactor(std::size_t index, float factor) noexcept;

    std::shared_ptr<Ports::Log> _log;
    Pixels _pixels;
    VirtualImage _virtualImage;
    VirtualPixels _virtualPixels;
    HandStats _handStats;
    EventStats _eventStats;
    std::uint16_t _lastEventPhase = kEventPhaseNone; ///< survives `Reset`: the next touch end needs it
};

} // namespace ZorvaTouch
