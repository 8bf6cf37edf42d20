#include "Tools/Cli/Counters.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/Layout.h"

#include <span>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::string_view kGap = "  ";
constexpr std::size_t kLabelWidth = 14;

struct CounterName {
    std::string_view key, name;
};

/// What people read for the recognizer's counters, in the order in which they are shown.
constexpr CounterName kRecognizedNames[] = {
    {"numTaps", "taps"},
    {"numPlayPause", "taps play/pause"},
    {"numVolumeDown", "taps volume down"},
    {"numVolumeUp", "taps volume up"},
    {"numBeginHold", "holds begun"},
    {"numKeloCall", "holds begun play/pause"},
    {"numEndHold", "holds ended"},
    {"numHolding2Suppressed", "holds suppressed later"},
    {"numIncrementHold", "frames of holds"},
    {"numKeloCallIncrement", "frames of holds play/pause"},
    {"numVolumeDecrement", "frames of holds volume down"},
    {"numVolumeIncrement", "frames of holds volume up"},
};
constexpr CounterName kRejectedNames[] = {
    {"numRejectedTap", "taps"},
    {"numRejectedPlayPause", "taps play/pause"},
    {"numRejectedVolumeDown", "taps volume down"},
    {"numRejectedVolumeUp", "taps volume up"},
    {"numRejectedBeginHold", "holds suppressed"},
    {"numRejectedKeloCall", "holds suppressed play/pause"},
    {"numRejectedEndHold", "suppressed holds ended"},
    {"numSuppressed2Holding", "suppressed holds begun later"},
    {"numRejectedIncrementHold", "frames of suppressed holds"},
    {"numRejectedKeloCallIncrement", "frames of suppressed holds play/pause"},
    {"numRejectedVolumeDecrement", "frames of suppressed holds volume down"},
    {"numRejectedVolumeIncrement", "frames of suppressed holds volume up"},
};

/// A list "taps 1, holds begun 2" that grows.
class CountList {
public:
    /// Adds a counter that is not 0.
    void add(std::string_view name, std::uint64_t count) {
        if (count == 0)
            return;
        _text.append(_text.empty() ? "" : ", ").append(name).append(" ");
        Util::appendUnsigned(_text, count);
    }

    void add(const PropertyValue *counters, std::span<const CounterName> names) {
        for (const CounterName &entry : names) {
            const PropertyValue *const value = counters ? counters->find(entry.key) : nullptr;
            add(entry.name, value ? value->toUnsigned() : 0);
        }
    }

    /// Appends it as a line, if there is anything in it.
    void appendTo(std::string &text, std::string_view label) const {
        if (_text.empty())
            return;
        appendSummaryLabel(text, label);
        appendWrapped(text, _text, kGap.size() + kLabelWidth, ", ");
        text.append("\n");
    }

private:
    std::string _text;
};

} // namespace

void appendSummaryLabel(std::string &text, std::string_view label) {
    text.append(kGap);
    appendLeft(text, label, kLabelWidth);
}

void appendCounters(std::string &text, const Counters &counters) {
    std::string events;
    counters.gestures.appendTo(events);
    appendSummaryLabel(text, "events");
    appendWrapped(text, events, kGap.size() + kLabelWidth, ", ");
    text.append("\n");
    CountList recognized;
    recognized.add(counters.eventStats.find("Dispatched"), kRecognizedNames);
    recognized.appendTo(text, "recognized");
    CountList rejected;
    rejected.add(counters.eventStats.find("Rejected"), kRejectedNames);
    rejected.appendTo(text, "rejected");
    CountList device;
    device.add("resets", counters.resets);
    device.add("gaps in the images", counters.disjointImages);
    device.appendTo(text, "device");
}

} // namespace ZorvaTouch::Tools
