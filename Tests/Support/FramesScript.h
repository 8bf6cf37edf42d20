#pragma once

#include "Shared/Algs.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"

#include <array>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <vector>

/// Scripts for the core: what a test feeds it and how it reads what comes back.
namespace ZorvaTouch::Scripted {

/// Sensor counts of all electrodes, index order A to O.
using Electrodes = std::array<std::int16_t, kElectrodeCount>;

/// One electrode's sensor counts, by its letter.
struct Touch {
    char letter;
    std::int16_t counts;
};

/// All electrodes at 0 but the named ones.
[[nodiscard]] Electrodes electrodes(std::initializer_list<Touch> touches);

/// A 73-byte image report. The flags are 0 and the raw counts 0xBEEF: nothing may depend on them.
[[nodiscard]] std::vector<std::uint8_t> imageReport(std::uint32_t frameNumber, std::uint32_t timeMs,
                                                    const Electrodes &signals = {});

/// A 10-byte firmware-event report with the payload F1 to F8.
[[nodiscard]] std::vector<std::uint8_t> firmwareReport(std::uint8_t eventCode);

/// An event in words: "may-begin 3", "hold-start 1", "hold-change 2", "hold-end 2", "tap 1", "cancel",
/// "reset", with the region that it carries. An event that is none of these is spelled out field by field.
[[nodiscard]] std::string eventText(const HostEvent &event);

/// A batch, its events joined by ", "; empty for an empty batch.
[[nodiscard]] std::string eventsText(const HostEventList &events);

/// One frame of a scripted gesture and what must come of it.
struct GestureRow {
    std::uint32_t timeMs;
    Electrodes signals;
    std::string events; ///< as `eventsText`
    std::string phrase; ///< the gesture phrase that ends the descriptions
};

/// Feeds frames numbered from 1 to a recognizer.
class FrameFeeder {
public:
    explicit FrameFeeder(Algs &algs) noexcept : _algs(&algs) {}

    /// Processes the next frame and returns its events in words.
    std::string frame(std::uint32_t timeMs, const Electrodes &signals);
    std::string frame(std::uint32_t timeMs, std::initializer_list<Touch> touches);

    /// The gesture phrase of the last frame: what follows the "] " of its description.
    [[nodiscard]] std::string phrase() const;

private:
    Algs *_algs;
    std::uint32_t _frameNumber = 0;
    std::uint32_t _timeMs = 0;
    Electrodes _signals{};
};

/// Feeds all rows and expects each row's events and phrase.
void expectGesture(Algs &algs, const std::vector<GestureRow> &rows);

} // namespace ZorvaTouch::Scripted
