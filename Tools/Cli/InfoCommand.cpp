#include "Tools/Cli/InfoCommand.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Cli/Layout.h"
#include "Tools/Cli/RecordingInfo.h"

#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::int64_t kNanosecondsPerMs = 1'000'000;
constexpr std::int64_t kNanosecondsPerSecond = 1'000'000'000;
constexpr std::size_t kLabelWidth = 12; // characters

struct KindName {
    InputKind kind;
    std::string_view jsonName;
    std::string_view title; ///< of several
};
constexpr std::array<KindName, kInputKindCount> kKindNames{
    {{InputKind::Image, "image", "images"},
     {InputKind::Reset, "reset", "resets"},
     {InputKind::Firmware, "firmware", "other firmware events"},
     {InputKind::Unhandled, "unhandled", "unhandled reports"},
     {InputKind::State, "state", "state writes"},
     {InputKind::Metadata, "metadata", "metadata items"}}};

// --- For a person
// --------------------------------------------------------------------------------------------------

std::string &beginRow(std::string &text, std::string_view label) {
    text.append("  ");
    appendLeft(text, label, kLabelWidth);
    return text;
}

void appendFrameCounts(std::string &text, const RecordingInfo &info) {
    Util::appendUnsigned(text, info.frames());
    std::string_view separator = ": ";
    for (const KindName &name : kKindNames) {
        if (info.countOf(name.kind) == 0)
            continue;
        text.append(separator).append(name.title).append(" ");
        Util::appendUnsigned(text, info.countOf(name.kind));
        separator = ", ";
    }
}

void appendIntervals(std::string &text, const ImageIntervals &intervals) {
    if (const auto rate = intervals.ratePerSecond())
        text.append(decimalText(*rate, 2)).append(" images/s, ");
    text.append("one each ").append(fixedPointText(intervals.medianNs, kNanosecondsPerMs));
    text.append(" ms, jitter ").append(fixedPointText(intervals.jitterNs, kNanosecondsPerMs));
    text.append(" ms, longest gap ")
        .append(fixedPointText(intervals.longestNs, kNanosecondsPerMs))
        .append(" ms");
}

void appendStates(std::string &text, const RecordingInfo &info) {
    std::string_view label = "states";
    for (const auto &[key, value] : info.states) {
        beginRow(text, label).append(key).append(" = ");
        Util::appendJson(text, value);
        text.append("\n");
        label = "";
    }
}

void appendForPerson(std::string &text, const RecordingInfo &info, const std::string &title,
                     bool usesColour) {
    appendColoured(text, title, Colour::Bold, usesColour);
    Util::appendUnsigned(beginRow(text.append("\n"), "container").append("version "), info.version);
    appendFrameCounts(beginRow(text.append("\n"), "frames"), info);
    const auto durationNs = static_cast<std::int64_t>(info.durationNs);
    beginRow(text.append("\n"), "duration")
        .append(fixedPointText(durationNs, kNanosecondsPerSecond))
        .append(" s");
    if (info.intervals)
        appendIntervals(beginRow(text.append("\n"), "rate"), *info.intervals);
    Util::appendUnsigned(beginRow(text.append("\n"), "disjoint").append("images "), info.disjointCount);
    info.gestures.appendTo(beginRow(text.append("\n"), "events"));
    text.append("\n");
    appendStates(text, info);
}

// --- For programs
// --------------------------------------------------------------------------------------------------

void appendNumber(std::string &text, std::string_view label, std::uint64_t value) {
    text.append(label);
    Util::appendUnsigned(text, value);
}

void appendJsonFrameCounts(std::string &text, const RecordingInfo &info) {
    appendNumber(text, R"(,"frames":{"total":)", info.frames());
    for (const KindName &name : kKindNames) {
        text.append(",\"").append(name.jsonName);
        appendNumber(text, "\":", info.countOf(name.kind));
    }
    text.push_back('}');
}

void appendJsonIntervals(std::string &text, const std::optional<ImageIntervals> &intervals) {
    text.append(R"(,"intervals":)");
    if (!intervals) {
        text.append("null");
        return;
    }
    text.append(R"({"ratePerSecond":)");
    const auto rate = intervals->ratePerSecond();
    Util::appendJson(text, rate ? PropertyValue(*rate) : PropertyValue());
    Util::appendInteger(text.append(R"(,"medianNs":)"), intervals->medianNs);
    Util::appendInteger(text.append(R"(,"jitterNs":)"), intervals->jitterNs);
    Util::appendInteger(text.append(R"(,"longestNs":)"), intervals->longestNs);
    text.push_back('}');
}

void appendJsonStates(std::string &text, const RecordingInfo &info) {
    text.append(R"(,"states":)");
    Util::appendJson(text, PropertyValue::Dictionary(info.states.begin(), info.states.end()));
}

void appendForPrograms(std::string &text, const RecordingInfo &info, const std::string &file) {
    text.append(R"({"file":)");
    Util::appendJsonString(text, file);
    appendNumber(text, R"(,"version":)", info.version);
    appendJsonFrameCounts(text, info);
    appendNumber(text, R"(,"durationNs":)", info.durationNs);
    appendJsonIntervals(text, info.intervals);
    appendNumber(text, R"(,"disjoint":)", info.disjointCount);
    info.gestures.appendJsonTo(text.append(R"(,"events":)"));
    appendJsonStates(text, info);
    text.append("}\n");
}

} // namespace

ExitStatus runInfo(const InfoOptions &options, Environment &environment) {
    for (const std::string &file : options.files) {
        const std::string title = inputTitle(file);
        Progress progress(environment, title);
        const RecordingInfo info =
            inspectRecording(readRecording(file, environment, progress), environment, progress);
        if (options.json)
            appendForPrograms(environment.output.text(), info, file);
        else
            appendForPerson(environment.output.text(), info, title, environment.usesColour);
        environment.output.wrote();
    }
    return kExitDone;
}

} // namespace ZorvaTouch::Tools
