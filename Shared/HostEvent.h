#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace ZorvaTouch {

/// What an event reports; the host's type codes.
enum class HostEventType : std::uint32_t {
    VendorDefined = 1,
    Digitizer = 11,
    Accelerometer = 13,
};

/// Where in its life a gesture is; bits of the host's phase field.
enum HostEventPhase : std::uint16_t {
    kEventPhaseNone = 0, ///< unset
    kEventPhaseBegan = 1,
    kEventPhaseChanged = 2,
    kEventPhaseEnded = 4,
    kEventPhaseCancelled = 8,
    kEventPhaseMayBegin = 128,
};

/// Event masks that tell the gestures apart; may-begin and cancel have none.
inline constexpr std::uint32_t kEventMaskHold = 0x2;
inline constexpr std::uint32_t kEventMaskTap = 0x20000;

/// Code of the digitizer field that carries the number of the frame that produced the event.
inline constexpr std::uint32_t kDigitizerFieldFrameNumber = 0xB001B;

/// Fields of a digitizer event, in the order in which the host's constructor takes them.
struct DigitizerFields {
    std::uint32_t transducerType = 0;
    std::uint32_t transducerIndex = 0;
    std::uint32_t identity = 0;
    std::uint32_t eventMask = 0;
    std::uint32_t buttonMask = 0;
    double x = 0, y = 0, z = 0;
    double tipPressure = 0, barrelPressure = 0;
    bool inRange = false;
    bool touch = false;
};

/// Fields of a vendor-defined event.
struct VendorDefinedFields {
    std::uint16_t usagePage = 0;
    std::uint16_t usage = 0;
    std::uint32_t version = 0;
    std::vector<std::uint8_t> payload;
};

/// Fields of an accelerometer event, in g.
struct AccelerometerFields {
    float x = 0, y = 0, z = 0;
};

/// What an event carries; its place in the list tells the type.
using HostEventFields = std::variant<DigitizerFields, VendorDefinedFields, AccelerometerFields>;

/// One event on its way to the host, or from it: accelerometer events are the host's.
///
/// Events are shared, reference-counted objects. They are changed only by their maker, before the batch is
/// handed on.
class HostEvent {
public:
    /// @param timestamp  Host ticks.
    [[nodiscard]] static std::shared_ptr<HostEvent>
    createDigitizer(std::uint64_t timestamp, const DigitizerFields &fields, std::uint32_t options);
    [[nodiscard]] static std::shared_ptr<HostEvent>
    createVendorDefined(std::uint64_t timestamp, VendorDefinedFields fields, std::uint32_t options);

    [[nodiscard]] static std::shared_ptr<HostEvent>
    createAccelerometer(std::uint64_t timestamp, const AccelerometerFields &fields, std::uint32_t options);

    HostEvent(std::uint64_t timestamp, HostEventFields fields, std::uint32_t options);

    [[nodiscard]] HostEventType type() const noexcept;
    /// The fields if the event is of that type, else null.
    [[nodiscard]] const DigitizerFields *digitizer() const noexcept {
        return std::get_if<DigitizerFields>(&_fields);
    }
    [[nodiscard]] const VendorDefinedFields *vendorDefined() const noexcept {
        return std::get_if<VendorDefinedFields>(&_fields);
    }
    [[nodiscard]] const AccelerometerFields *accelerometer() const noexcept {
        return std::get_if<AccelerometerFields>(&_fields);
    }
    [[nodiscard]] std::uint32_t options() const noexcept { return _options; }

    [[nodiscard]] std::uint64_t timestamp() const noexcept { return _timestamp; } ///< host ticks
    void setTimestamp(std::uint64_t timestamp) noexcept { _timestamp = timestamp; }

    /// The phase bits; `kEventPhaseNone` when unset.
    [[nodiscard]] std::uint16_t phase() const noexcept { return _phase; }
    void setPhase(std::uint16_t phase) noexcept { _phase = phase; }

    /// An integer field by the host's field code; nothing if it was never set.
    [[nodiscard]] std::optional<std::int64_t> integerField(std::uint32_t code) const noexcept;
    void setIntegerField(std::uint32_t code, std::int64_t value);

private:
    std::uint64_t _timestamp;
    HostEventFields _fields;
    std::uint32_t _options;
    std::uint16_t _phase = kEventPhaseNone;
    std::map<std::uint32_t, std::int64_t> _integerFields;
};

/// A batch: the events of one report, in order. The list belongs to whoever holds it and shares the events.
using HostEventList = std::vector<std::shared_ptr<HostEvent>>;

/// An event as compact JSON, for logs and for programs:
/// `{"mask":2,"phase":1,"y":3,"frame":57}` (phase null when unset) or
/// `{"vendor":true,"usagePage":65376,"usage":2}` or `{"accelerometer":true,"x":0.5,"y":0.0,"z":-1.0}`.
[[nodiscard]] std::string jsonText(const HostEvent &event);

} // namespace ZorvaTouch
