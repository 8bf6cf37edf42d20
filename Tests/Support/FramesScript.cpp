#include "Tests/Support/FramesScript.h"

#include "Shared/Util/Bytes.h"

#include <gtest/gtest.h>

#include <cstddef>

namespace ZorvaTouch::Scripted {
namespace {

// Places in an image report.
constexpr std::size_t kFrameNumberOffset = 1;
constexpr std::size_t kTimeOffset = 5;
constexpr std::size_t kRawCountsOffset = 13;
constexpr std::size_t kSignalsOffset = 43;
constexpr std::uint16_t kDistractingRawCount = 0xBEEF;

struct GestureName {
    std::uint32_t eventMask;
    std::uint16_t phase;
    const char *name;
    bool hasRegion;
};

constexpr std::array<GestureName, 6> kGestureNames{{
    {.eventMask = 0, .phase = 128, .name = "may-begin", .hasRegion = true},
    {.eventMask = 2, .phase = 1, .name = "hold-start", .hasRegion = true},
    {.eventMask = 2, .phase = 2, .name = "hold-change", .hasRegion = true},
    {.eventMask = 2, .phase = 4, .name = "hold-end", .hasRegion = true},
    {.eventMask = 0x20000, .phase = 0, .name = "tap", .hasRegion = true},
    {.eventMask = 0, .phase = 8, .name = "cancel", .hasRegion = false},
}};

std::string number(double value) { return std::to_string(static_cast<std::int64_t>(value)); }

std::string digitizerText(const HostEvent &event, const DigitizerFields &fields) {
    for (const GestureName &gesture : kGestureNames) {
        if (gesture.eventMask != fields.eventMask || gesture.phase != event.phase())
            continue;
        if (gesture.hasRegion)
            return std::string(gesture.name) + " " + number(fields.y);
        if (fields.y == 0.0)
            return gesture.name;
    }
    return "digitizer mask " + std::to_string(fields.eventMask) + " phase " + std::to_string(event.phase()) +
           " y " + std::to_string(fields.y);
}

} // namespace

Electrodes electrodes(std::initializer_list<Touch> touches) {
    Electrodes signals{};
    for (const Touch &touch : touches)
        signals.at(static_cast<std::size_t>(touch.letter - 'A')) = touch.counts;
    return signals;
}

std::vector<std::uint8_t> imageReport(std::uint32_t frameNumber, std::uint32_t timeMs,
                                      const Electrodes &signals) {
    std::vector<std::uint8_t> report(InputReport::Image::kReportLength);
    report[0] = InputReport::Image::kReportId;
    Util::storeLittle32(&report[kFrameNumberOffset], frameNumber);
    Util::storeLittle32(&report[kTimeOffset], timeMs);
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        Util::storeLittle16(&report[kRawCountsOffset + 2 * i], kDistractingRawCount);
        Util::storeLittle16(&report[kSignalsOffset + 2 * i], static_cast<std::uint16_t>(signals[i]));
    }
    return report;
}

std::vector<std::uint8_t> firmwareReport(std::uint8_t eventCode) {
    return {InputReport::FirmwareEvent::kReportId, eventCode, 0xF1, 0xF2, 0xF3, 0xF4, 0xF5, 0xF6, 0xF7, 0xF8};
}

std::string eventText(const HostEvent &event) {
    if (const DigitizerFields *fields = event.digitizer())
        return digitizerText(event, *fields);
    const VendorDefinedFields &fields = *event.vendorDefined();
    if (fields.usagePage == 0xFF60 && fields.usage == 2 && fields.version == 0 && fields.payload.empty())
        return "reset";
    return "vendor page " + std::to_string(fields.usagePage) + " usage " + std::to_string(fields.usage);
}

std::string eventsText(const HostEventList &events) {
    std::string text;
    for (const auto &event : events)
        text += (text.empty() ? "" : ", ") + eventText(*event);
    return text;
}

std::string FrameFeeder::frame(std::uint32_t timeMs, const Electrodes &signals) {
    _timeMs = timeMs;
    _signals = signals;
    HostEventList events;
    _algs->processTouchFrame(_signals, ++_frameNumber, _timeMs, events);
    return eventsText(events);
}

std::string FrameFeeder::frame(std::uint32_t timeMs, std::initializer_list<Touch> touches) {
    return frame(timeMs, electrodes(touches));
}

std::string FrameFeeder::phrase() const {
    const std::string line = _algs->touchStateDescription(_signals, _timeMs);
    const std::string virtualLine = _algs->virtualStateDescription(_signals, _timeMs);
    std::string phrase = line.substr(line.find("] ") + 2);
    EXPECT_EQ(phrase, virtualLine.substr(virtualLine.find("] ") + 2)) << "the two descriptions disagree";
    return phrase;
}

void expectGesture(Algs &algs, const std::vector<GestureRow> &rows) {
    FrameFeeder feeder(algs);
    for (const GestureRow &row : rows) {
        SCOPED_TRACE("frame at " + std::to_string(row.timeMs) + " ms");
        EXPECT_EQ(feeder.frame(row.timeMs, row.signals), row.events);
        EXPECT_EQ(feeder.phrase(), row.phrase);
    }
}

} // namespace ZorvaTouch::Scripted
