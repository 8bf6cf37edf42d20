#include "Tools/Cli/Counters.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/Layout.h"

namespace ZorvaTouch::Tools {
namespace {

constexpr std::string_view kGap = "  ";
constexpr std::size_t kLabelWidth = 14;

/// Appends the counters that are not 0, "numTaps 1, numPlayPause 1", or "none".
void appendNonZero(std::string &text, const PropertyValue *counters) {
    std::string_view separator;
    const PropertyValue::Dictionary *const entries = counters ? counters->asDictionary() : nullptr;
    for (const auto &[name, value] : entries ? *entries : PropertyValue::Dictionary()) {
        if (value.toUnsigned() == 0)
            continue;
        text.append(separator).append(name).append(" ");
        Util::appendUnsigned(text, value.toUnsigned());
        separator = ", ";
    }
    if (separator.empty())
        text.append("none");
}

} // namespace

void appendSummaryLabel(std::string &text, std::string_view label) {
    text.append(kGap);
    appendLeft(text, label, kLabelWidth);
}

void appendCounters(std::string &text, const Counters &counters) {
    appendSummaryLabel(text, "events");
    counters.gestures.appendTo(text);
    appendSummaryLabel(text.append("\n"), "dispatched");
    appendNonZero(text, counters.eventStats.find("Dispatched"));
    appendSummaryLabel(text.append("\n"), "rejected");
    appendNonZero(text, counters.eventStats.find("Rejected"));
    appendSummaryLabel(text.append("\n"), "device");
    Util::appendUnsigned(text.append("resets "), counters.resets);
    Util::appendUnsigned(text.append(", disjoint images "), counters.disjointImages);
    text.append("\n");
}

} // namespace ZorvaTouch::Tools
