#include "Tools/Stimulus/StimulusText.h"

#include "Shared/Util/Json.h"
#include "Tools/Stimulus/LineWords.h"
#include "Tools/Stimulus/StimulusTimeline.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <limits>
#include <optional>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::int64_t kUnsignedMax = std::numeric_limits<std::uint32_t>::max();
constexpr std::int64_t kLongestPeriodMs = 1'000'000;
constexpr std::int64_t kSignalMin = std::numeric_limits<std::int16_t>::min();
constexpr std::int64_t kSignalMax = std::numeric_limits<std::int16_t>::max();
constexpr std::int64_t kRawCountMax = std::numeric_limits<std::uint16_t>::max();
constexpr std::string_view kRampSign = "..";

// --- Electrodes
// ----------------------------------------------------------------------------------------------------

/// "A=300", taken apart.
struct Assignment {
    std::size_t electrode; ///< index, A is 0
    std::string_view value;
};

Assignment parseAssignment(std::string_view word) {
    const std::size_t sign = word.find('=');
    if (sign == std::string_view::npos)
        throw LineProblem(quoted(word) + " is no electrode with a value, as in A=300");
    const std::string_view name = word.substr(0, sign);
    if (name.size() != 1 || name[0] < 'A' || name[0] >= static_cast<char>('A' + kElectrodeCount))
        throw LineProblem("unknown electrode " + quoted(name));
    return {static_cast<std::size_t>(name[0] - 'A'), word.substr(sign + 1)};
}

/// Refuses an electrode that is named twice.
class EachOnce {
public:
    void note(std::size_t electrode) {
        if (std::exchange(_seen.at(electrode), true))
            throw LineProblem("electrode " + quoted(std::string(1, static_cast<char>('A' + electrode))) +
                              " has two values");
    }

private:
    std::array<bool, kElectrodeCount> _seen{};
};

std::int16_t parseSignal(std::string_view word) {
    return static_cast<std::int16_t>(integerInRange(word, "signal", kSignalMin, kSignalMax));
}

Ramp parseRamp(std::string_view value) {
    const std::size_t sign = value.find(kRampSign);
    if (sign == std::string_view::npos)
        return {parseSignal(value), parseSignal(value)};
    return {parseSignal(value.substr(0, sign)), parseSignal(value.substr(sign + kRampSign.size()))};
}

/// Takes electrodes up to the word "for" or the end of the line.
Ramps takeRamps(LineWords &words) {
    Ramps ramps{};
    EachOnce once;
    while (!words.empty() && words.peek() != "for") {
        const Assignment assignment = parseAssignment(words.take());
        once.note(assignment.electrode);
        ramps[assignment.electrode] = parseRamp(assignment.value);
    }
    return ramps;
}

// --- Lengths
// -------------------------------------------------------------------------------------------------------

std::size_t periodsIn(std::string_view word, std::int64_t periodMs) {
    const std::int64_t durationMs = timeInRange(word, 1, std::numeric_limits<std::int64_t>::max());
    if (durationMs % periodMs != 0)
        throw LineProblem(quoted(word) + " is no whole number of periods of " + std::to_string(periodMs) +
                          "ms");
    return static_cast<std::size_t>(durationMs / periodMs);
}

std::size_t parseReportCount(std::string_view word) {
    return static_cast<std::size_t>(
        integerInRange(word, "number of reports", 1, static_cast<std::int64_t>(kStimulusMaxFrames)));
}

/// Takes "for 120ms", "for 5 reports" or nothing, which is one report; and the end of the line.
std::size_t takeLength(LineWords &words, std::int64_t periodMs) {
    if (words.empty())
        return 1;
    if (words.peek() != "for")
        words.requireEnd();
    words.take();
    const std::string_view length = words.require("a time or a number of reports");
    const bool countsReports = words.peek() == "reports" || words.peek() == "report";
    if (countsReports)
        words.take();
    words.requireEnd();
    return countsReports ? parseReportCount(length) : periodsIn(length, periodMs);
}

// --- Directives
// ----------------------------------------------------------------------------------------------------

void parseEvery(LineWords words, StimulusTimeline &timeline) {
    const std::int64_t periodMs = timeInRange(words.require("a time"), 1, kLongestPeriodMs);
    words.requireEnd();
    timeline.setPeriodMs(static_cast<std::uint32_t>(periodMs));
}

void parseClock(LineWords words, StimulusTimeline &timeline) {
    const std::int64_t timeMs = timeInRange(words.require("a time"), 0, kUnsignedMax);
    words.requireEnd();
    timeline.setSensorClock(static_cast<std::uint32_t>(timeMs));
}

void parseNumber(LineWords words, StimulusTimeline &timeline) {
    const std::int64_t number =
        integerInRange(words.require("a frame number"), "frame number", 0, kUnsignedMax);
    words.requireEnd();
    timeline.setFrameNumber(static_cast<std::uint32_t>(number));
}

void parseTouch(LineWords words, StimulusTimeline &timeline) {
    if (words.empty() || words.peek() == "for")
        throw LineProblem("an electrode is missing, as in A=300");
    const Ramps ramps = takeRamps(words);
    timeline.addImages(ramps, takeLength(words, timeline.periodMs()));
}

void parseIdle(LineWords words, StimulusTimeline &timeline) {
    timeline.addImages({}, takeLength(words, timeline.periodMs()));
}

void parseWait(LineWords words, StimulusTimeline &timeline) {
    const std::int64_t durationMs = timeInRange(words.require("a time"), 1, kUnsignedMax);
    words.requireEnd();
    timeline.wait(static_cast<std::uint64_t>(durationMs));
}

void parseCounts(LineWords words, StimulusTimeline &timeline) {
    std::array<std::uint16_t, kElectrodeCount> counts{};
    EachOnce once;
    while (!words.empty()) {
        const Assignment assignment = parseAssignment(words.take());
        once.note(assignment.electrode);
        counts[assignment.electrode] =
            static_cast<std::uint16_t>(integerInRange(assignment.value, "raw count", 0, kRawCountMax));
    }
    timeline.setRawCounts(counts);
}

PropertyValue parseValue(std::string_view text) {
    auto value = Util::parseJson(text);
    if (!value)
        return text; // a string without quotes
    if (value->isNull())
        throw LineProblem("null cannot be kept in a recording");
    return std::move(*value);
}

void parseKeyed(FrameType type, LineWords words, StimulusTimeline &timeline) {
    std::string key(words.require("a key"));
    if (words.empty())
        throw LineProblem("a value is missing");
    timeline.addKeyed(type, std::move(key), parseValue(words.rest()));
}

void parseState(LineWords words, StimulusTimeline &timeline) {
    parseKeyed(FrameType::State, words, timeline);
}
void parseMeta(LineWords words, StimulusTimeline &timeline) {
    parseKeyed(FrameType::Metadata, words, timeline);
}

std::uint8_t parseByte(std::string_view word) {
    std::uint8_t byte = 0;
    const char *const end = word.data() + word.size();
    const auto [stop, error] = std::from_chars(word.data(), end, byte, 16);
    if (error != std::errc() || stop != end || word.size() > 2)
        throw LineProblem(quoted(word) + " is no byte from 00 to ff");
    return byte;
}

std::vector<std::uint8_t> takeBytes(LineWords &words) {
    std::vector<std::uint8_t> bytes;
    while (!words.empty())
        bytes.push_back(parseByte(words.take()));
    return bytes;
}

void addFirmwareEvent(std::uint8_t code, std::span<const std::uint8_t> payload, StimulusTimeline &timeline) {
    constexpr std::size_t kPayloadAt = 2; // after report ID and event code
    std::array<std::uint8_t, InputReport::FirmwareEvent::kReportLength> report{};
    if (payload.size() > report.size() - kPayloadAt)
        throw LineProblem("a firmware event has at most 8 bytes of payload");
    report[0] = InputReport::FirmwareEvent::kReportId;
    report[1] = code;
    std::copy(payload.begin(), payload.end(), report.begin() + kPayloadAt);
    timeline.addReport(report);
}

void parseReset(LineWords words, StimulusTimeline &timeline) {
    words.requireEnd();
    addFirmwareEvent(InputReport::FirmwareEvent::kDeviceReset, {}, timeline);
}

void parseFirmware(LineWords words, StimulusTimeline &timeline) {
    const std::int64_t code = integerInRange(words.require("an event code"), "event code", 0, 255);
    addFirmwareEvent(static_cast<std::uint8_t>(code), takeBytes(words), timeline);
}

void parseRaw(LineWords words, StimulusTimeline &timeline) { timeline.addReport(takeBytes(words)); }

struct Directive {
    std::string_view name;
    void (*parse)(LineWords words, StimulusTimeline &timeline); ///< `words` without the name
};
constexpr std::array<Directive, 12> kDirectives{{
    {"every", parseEvery},
    {"clock", parseClock},
    {"number", parseNumber},
    {"touch", parseTouch},
    {"idle", parseIdle},
    {"wait", parseWait},
    {"counts", parseCounts},
    {"state", parseState},
    {"meta", parseMeta},
    {"reset", parseReset},
    {"firmware", parseFirmware},
    {"raw", parseRaw},
}};

void parseDirective(std::string_view line, StimulusTimeline &timeline) {
    LineWords words(withoutComment(line));
    const std::string_view name = words.take();
    for (const Directive &directive : kDirectives)
        if (directive.name == name)
            return directive.parse(words, timeline);
    throw LineProblem("unknown directive " + quoted(name));
}

// --- The text
// ------------------------------------------------------------------------------------------------------

/// Sorts lines into stimulus and expected ones.
class TextReader {
public:
    explicit TextReader(std::size_t maxFrames) noexcept : _timeline(maxFrames) {}

    void readLine(std::string_view line) {
        ++_lineNumber;
        const std::string_view content = withoutOuterBlanks(line);
        if (content.empty())
            _isExpected =
                _isExpected || _hasDirective; // blank lines ahead of the first directive do not count
        else if (content.front() != '#')
            readContent(line);
    }

    [[nodiscard]] Stimulus takeStimulus() { return {_timeline.takeFrames(), std::move(_expected)}; }

private:
    void readContent(std::string_view line) try {
        if (_isExpected) {
            _expected.push_back(parseExpectedLine(line, _lineNumber));
        } else {
            parseDirective(line, _timeline);
            _hasDirective = true;
        }
    } catch (const LineProblem &problem) {
        throw StimulusError(_lineNumber, problem.what());
    }

    std::size_t _lineNumber = 0;
    bool _hasDirective = false;
    bool _isExpected = false;
    StimulusTimeline _timeline;
    std::vector<ExpectedLine> _expected;
};

} // namespace

Stimulus parseStimulus(std::string_view text, std::size_t maxFrames) {
    TextReader reader(maxFrames);
    while (!text.empty()) {
        const std::size_t end = std::min(text.find('\n'), text.size());
        reader.readLine(text.substr(0, end));
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return reader.takeStimulus();
}

} // namespace ZorvaTouch::Tools
