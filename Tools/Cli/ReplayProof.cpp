#include "Tools/Cli/ReplayProof.h"

#include "Shared/Ports/Log.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/LiveReport.h"
#include "Tools/Stimulus/Replay.h"
#include "Tools/Stimulus/VirtualClock.h"

#include <algorithm>
#include <iterator>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

/// How long something from before a cut may show in a touch, at least: longer than the score takes to fade.
constexpr std::uint64_t kMemoryNs = 5'000'000'000;

struct TimedEvent {
    std::uint64_t timeNs;
    std::optional<Gesture> gesture;
    std::string text;

    friend bool operator==(const TimedEvent &, const TimedEvent &) = default;
};
using TimedEvents = std::vector<TimedEvent>;

TimedEvents heardEvents(const EventHistory &history) {
    TimedEvents events;
    for (const EventHistory::Entry &entry : history.entries())
        events.push_back({entry.timestamp, entry.gesture, entry.text});
    return events;
}

TimedEvents replayedEvents(const FrameList &recording) {
    VirtualClock clock;
    Replay replay(recording, clock, Ports::silentLogProvider());
    TimedEvents events;
    while (replay.next())
        for (const auto &event : replay.frame().events)
            events.push_back({replay.frame().timestampNs, gestureOf(*event), jsonText(*event)});
    return events;
}

/// The events from one time on and before another.
TimedEvents between(const TimedEvents &events, std::uint64_t fromNs, std::uint64_t untilNs) {
    TimedEvents part;
    std::copy_if(events.begin(), events.end(), std::back_inserter(part),
                 [&](const TimedEvent &event) { return event.timeNs >= fromNs && event.timeNs < untilNs; });
    return part;
}

/// Times at which touches begin, after a cut.
std::vector<std::uint64_t> touchesAfter(std::uint64_t cutNs, const TimedEvents &events) {
    std::vector<std::uint64_t> times;
    for (const TimedEvent &event : events)
        if (event.gesture == Gesture::MayBegin && event.timeNs > cutNs)
            times.push_back(event.timeNs);
    return times;
}

bool isTrimmed(const FrameList &recording, const EventHistory &history) {
    const auto &entries = history.entries();
    if (entries.empty() || recording.empty())
        return false;
    return entries.size() == EventHistory::kCapacity ||
           entries.front().timestamp < (*recording.begin()).timestampNs;
}

/// Until when what was before a cut may show. The region of the last tap or hold attracts the next touch, and
/// is forgotten at the next tap or hold on which the two agree.
std::uint64_t endOfMemory(std::uint64_t cutNs, const TimedEvents &heard, const TimedEvents &replayed) {
    for (const TimedEvent &event : heard)
        if (event.timeNs > cutNs && (event.gesture == Gesture::Tap || event.gesture == Gesture::HoldEnd) &&
            std::find(replayed.begin(), replayed.end(), event) != replayed.end())
            return std::max(cutNs + kMemoryNs, event.timeNs);
    return cutNs + kMemoryNs;
}

/// The touch behind the last one that differs while the recognizer may remember, or else the first.
std::uint64_t firstComparable(std::uint64_t cutNs, const TimedEvents &heard, const TimedEvents &replayed) {
    std::vector<std::uint64_t> touches = touchesAfter(cutNs, heard);
    touches.push_back(kNothingCompared);
    const std::uint64_t endNs = endOfMemory(cutNs, heard, replayed);
    std::uint64_t first = touches.front();
    for (std::size_t i = 0; i + 1 < touches.size() && touches[i] <= endNs; ++i)
        if (between(heard, touches[i], touches[i + 1]) != between(replayed, touches[i], touches[i + 1]))
            first = touches[i + 1];
    return first;
}

/// An event and its time as one line; empty behind the last one.
std::string lineAt(const TimedEvents &events, TimedEvents::const_iterator position) {
    if (position == events.end())
        return {};
    std::string line;
    Util::appendUnsigned(line, position->timeNs);
    return line.append(" ns ").append(position->text);
}

std::optional<ReplayDifference> compare(const TimedEvents &heard, const TimedEvents &replayed) {
    const auto [left, right] = std::mismatch(heard.begin(), heard.end(), replayed.begin(), replayed.end());
    if (left == heard.end() && right == replayed.end())
        return std::nullopt;
    return ReplayDifference{.index = static_cast<std::size_t>(left - heard.begin()),
                            .heard = lineAt(heard, left),
                            .replayed = lineAt(replayed, right)};
}

} // namespace

ReplayProof proveReplay(const FrameList &recording, const EventHistory &history) {
    TimedEvents heard = heardEvents(history);
    TimedEvents replayed = replayedEvents(recording);
    std::optional<std::uint64_t> fromNs;
    if (isTrimmed(recording, history)) {
        fromNs = firstComparable((*recording.begin()).timestampNs, heard, replayed);
        heard = between(heard, *fromNs, kNothingCompared);
        replayed = between(replayed, *fromNs, kNothingCompared);
    }
    return {.reports = countReports(recording),
            .events = heard.size(),
            .fromNs = fromNs,
            .difference = compare(heard, replayed)};
}

} // namespace ZorvaTouch::Tools
