#pragma once

#include "Shared/Util/PropertyValue.h"
#include "Tools/Cli/GestureCounts.h"

#include <cstdint>
#include <string>
#include <string_view>

/// What a recognizer has counted, for people.
namespace ZorvaTouch::Tools {

struct Counters {
    GestureCounts gestures;
    PropertyValue eventStats; ///< {"Dispatched": {...}, "Rejected": {...}}; nothing is shown of anything else
    std::uint64_t resets = 0;
    std::uint64_t disjointImages = 0;
};

/// Appends the lines that end a recording or a run: events, and what is not 0 of recognized, rejected and
/// device.
void appendCounters(std::string &text, const Counters &counters);

/// Appends the beginning of such a line, "  events        ".
void appendSummaryLabel(std::string &text, std::string_view label);

} // namespace ZorvaTouch::Tools
