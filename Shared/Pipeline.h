#pragma once

#include "Shared/Algs.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"
#include "Shared/PipelineInput.h"
#include "Shared/Ports/Log.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace ZorvaTouch {

/// Domain of the recognizer's state keys: "Algs.ActivationThreshold".
inline constexpr std::string_view kAlgsDomain = "Algs";

/// Routes input reports into the recognizer and its events out, answers state keys, and lets an owner watch.
///
/// Usable from construction until destruction; nothing resets the counters.
///
/// Threads:  no lock of its own; the caller serialises all calls and every change of a hook.
/// Realtime: reports yes, as far as the hooks are.
class Pipeline : public PipelineInput, public PipelineOutput {
public:
    /// @param logs  Asked for the recognizer's log handle.
    explicit Pipeline(Ports::LogProvider &logs);

    // Hooks: called when set. They must not fail: an exception that leaves one ends the process.
    // Time stamps are host ticks; pointers and references are borrowed for the call.

    /// A state write, before it is applied.
    std::function<void(std::uint64_t timestamp, const std::string &key, const PropertyValue &value)>
        onSetState;
    /// Every input report, before it is parsed.
    std::function<void(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length)> onInputReport;
    std::function<void(std::uint64_t timestamp, const std::string &key, const PropertyValue &value)>
        onMetadata;
    /// A report that is neither a firmware event nor an image.
    std::function<void(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length)>
        onUnhandledReport;
    std::function<void(std::uint64_t timestamp, const InputReport::FirmwareEvent *event)> onFirmwareEvent;
    /// An image, before the recognizer sees it.
    std::function<void(std::uint64_t timestamp, const InputReport::Image *image)> onImage;
    /// An image whose number does not follow the previous one; before the recognizer sees it.
    std::function<void(std::uint64_t timestamp, std::uint32_t previousFrameNumber,
                       const InputReport::Image *image)>
        onDisjointImage;
    /// The output: every batch that is not empty, stamped with the report's time.
    std::function<void(std::uint64_t timestamp, const HostEventList &events)> onHIDEvents;
    std::function<void(const std::string &key)> onGetState;

    /// Keys of the domain "Algs" go to the recognizer; any other is ignored.
    void setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override;

    /// A firmware event goes to its hook and, if the device has reset, winds down the touch and adds a
    /// vendor-defined event. An image goes to the recognizer. Anything else goes to `onUnhandledReport`.
    void handleInputReport(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length) override;

    /// Goes to `onMetadata` and nowhere else.
    void handleMetadata(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override;

    /// Keys of the domain "Algs" are the recognizer's; "DebugInfo" is a dictionary of "ResetCount" and
    /// "DisjointImageCount".
    [[nodiscard]] PropertyValue getState(const std::string &key) const override;

    /// Stamps the events with `timestamp` and hands a batch that is not empty to `onHIDEvents`.
    void handleHIDEvents(std::uint64_t timestamp, const HostEventList &events);

    [[nodiscard]] const Algs &algs() const noexcept { return _algs; }
    [[nodiscard]] std::uint32_t resetCount() const noexcept { return _resetCount; }
    [[nodiscard]] std::uint32_t disjointImageCount() const noexcept { return _disjointImageCount; }

private:
    void handleFirmwareEvent(std::uint64_t timestamp, const InputReport::FirmwareEvent &event);
    void handleDeviceReset(std::uint64_t timestamp);
    void handleImage(std::uint64_t timestamp, const InputReport::Image &image);
    void checkContinuity(std::uint64_t timestamp, const InputReport::Image &image);

    std::uint32_t _lastFrameNumber = 0;
    bool _hasLastFrame = false; ///< a device reset does not clear it: the next image is compared all the same
    std::uint32_t _resetCount = 0;
    std::uint32_t _disjointImageCount = 0;
    Algs _algs;
};

} // namespace ZorvaTouch
