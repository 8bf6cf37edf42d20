#include "Tools/Cli/DemoSummary.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/Layout.h"

#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::int64_t kNanosecondsPerSecond = 1'000'000'000;

// --- For people

std::string countText(std::uint64_t count, std::string_view what) {
    std::string text;
    Util::appendUnsigned(text, count);
    return text.append(" ").append(what).append(count == 1 ? "" : "s");
}

/// What was compared, if not everything.
std::string scopeText(const std::optional<std::uint64_t> &comparedFromNs) {
    if (!comparedFromNs)
        return {};
    if (*comparedFromNs == kNothingCompared)
        return "older reports are trimmed, no later touch can be compared";
    return "from " + fixedPointText(static_cast<std::int64_t>(*comparedFromNs), kNanosecondsPerSecond) +
           " s on; older reports are trimmed";
}

void appendDifference(std::string &text, const ReplayDifference &difference) {
    for (const auto &[who, event] :
         {std::pair("host    ", difference.heard), std::pair("replay  ", difference.replayed)}) {
        appendSummaryLabel(text, "");
        text.append(who).append(event.empty() ? "nothing" : event).append("\n");
    }
}

void appendProof(std::string &text, const DemoSummary &summary, bool usesColour) {
    const ReplayProof &proof = summary.proof;
    appendSummaryLabel(text, "replayed");
    text.append(countText(proof.reports, "report")).append(": ");
    if (proof.difference)
        appendColoured(text, "event " + std::to_string(proof.difference->index + 1) + " differs",
                       Colour::Yellow, usesColour);
    else
        appendColoured(text, "the same " + countText(proof.events, "event"), Colour::Green, usesColour);
    text.append("\n");
    if (const std::string scope = scopeText(summary.comparedFromNs); !scope.empty()) {
        appendSummaryLabel(text, "");
        text.append(scope).append("\n");
    }
    if (proof.difference)
        appendDifference(text, *proof.difference);
}

// --- For programs

void appendString(std::string &text, std::string_view label, std::string_view value) {
    Util::appendJsonString(text.append(label), value);
}

void appendNumber(std::string &text, std::string_view label, std::uint64_t value) {
    Util::appendUnsigned(text.append(label), value);
}

void appendJsonCounters(std::string &text, const Counters &counters) {
    counters.gestures.appendJsonTo(text.append(R"(,"events":)"));
    Util::appendJson(text.append(R"(,"EventStats":)"), counters.eventStats, 3);
    appendNumber(text, R"(,"ResetCount":)", counters.resets);
    appendNumber(text, R"(,"DisjointImageCount":)", counters.disjointImages);
}

void appendJsonProof(std::string &text, const DemoSummary &summary) {
    const ReplayProof &proof = summary.proof;
    appendNumber(text, R"(,"replay":{"reports":)", proof.reports);
    appendNumber(text, R"(,"events":)", proof.events);
    text.append(R"(,"same":)").append(proof.difference ? "false" : "true");
    text.append(R"(,"fromTimeNs":)");
    if (summary.comparedFromNs && *summary.comparedFromNs != kNothingCompared)
        Util::appendUnsigned(text, *summary.comparedFromNs);
    else
        text.append("null");
    text.push_back('}');
}

} // namespace

void appendForPerson(std::string &text, const DemoSummary &summary, bool usesColour) {
    appendCounters(text, summary.counters);
    appendSummaryLabel(text, "reports");
    text.append(std::to_string(summary.handledReports)).append(" handled, ");
    text.append(std::to_string(summary.droppedReports)).append(" lost on the way\n");
    appendSummaryLabel(text, "recording");
    text.append(summary.recordingFile).append("\n");
    appendProof(text, summary, usesColour);
}

void appendForPrograms(std::string &text, const DemoSummary &summary) {
    appendString(text, R"({"summary":{"plugin":)", summary.plugIn);
    appendString(text, R"(,"version":)", summary.version);
    appendString(text, R"(,"scenario":)", summary.finger.scenario->name);
    appendNumber(text, R"(,"seed":)", summary.finger.seed);
    appendNumber(text, R"(,"handled":)", summary.handledReports);
    appendNumber(text, R"(,"dropped":)", summary.droppedReports);
    appendJsonCounters(text, summary.counters);
    appendString(text, R"(,"recording":)", summary.recordingFile);
    appendJsonProof(text, summary);
    text.append("}}\n");
}

} // namespace ZorvaTouch::Tools
