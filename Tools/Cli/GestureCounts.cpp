#include "Tools/Cli/GestureCounts.h"

#include "Shared/Util/Text.h"

#include <numeric>
#include <string_view>

namespace ZorvaTouch::Tools {

void GestureCounts::add(const ReplayedFrame &frame) noexcept {
    for (const auto &event : frame.events)
        if (const auto gesture = gestureOf(*event))
            add(*gesture);
}

void GestureCounts::add(const GestureCounts &other) noexcept {
    for (std::size_t i = 0; i < kGestureCount; ++i)
        _counts[i] += other._counts[i];
}

std::uint64_t GestureCounts::gestures() const noexcept {
    return std::accumulate(_counts.begin(), _counts.end(), std::uint64_t{0}) - of(Gesture::MayBegin);
}

bool GestureCounts::empty() const noexcept { return gestures() == 0 && of(Gesture::MayBegin) == 0; }

void GestureCounts::appendTo(std::string &text) const {
    if (empty())
        text.append("none");
    std::string_view separator;
    for (const Gesture gesture : kGestures) {
        if (of(gesture) == 0)
            continue;
        text.append(separator).append(nameOf(gesture)).append(" ");
        Util::appendUnsigned(text, of(gesture));
        separator = ", ";
    }
}

void GestureCounts::appendJsonTo(std::string &text) const {
    std::string_view separator = "{\"";
    for (const Gesture gesture : kGestures) {
        text.append(separator).append(nameOf(gesture)).append("\":");
        Util::appendUnsigned(text, of(gesture));
        separator = ",\"";
    }
    text.push_back('}');
}

} // namespace ZorvaTouch::Tools
