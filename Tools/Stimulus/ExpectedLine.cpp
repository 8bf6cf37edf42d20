#include "Tools/Stimulus/ExpectedLine.h"

#include "Shared/Util/Text.h"
#include "Tools/Stimulus/EventNames.h"
#include "Tools/Stimulus/LineWords.h"

#include <array>
#include <limits>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::int64_t kUnsignedMax = std::numeric_limits<std::uint32_t>::max();
constexpr std::string_view kTouchWord = "touch";
constexpr std::string_view kVirtualWord = "virtual";
constexpr std::string_view kFrameWord = "frame";

std::string eventText(std::int64_t frameNumber, std::int64_t timeMs, std::string_view gesture,
                      std::string_view region) {
    std::string text(kFrameWord);
    text.push_back(' ');
    Util::appendInteger(text, frameNumber);
    text.append(" @");
    Util::appendInteger(text, timeMs);
    text.append("ms ").append(gesture).append(" ").append(region);
    return text;
}

std::int64_t takeTime(LineWords &words) {
    std::string_view word = words.require("a time as in @130ms");
    if (!word.starts_with('@'))
        throw LineProblem(quoted(word) + " is no time as in @130ms");
    word.remove_prefix(1);
    return timeInRange(word, 0, kUnsignedMax);
}

std::string_view takeGesture(LineWords &words) {
    const std::string_view word = words.require("a gesture");
    const auto gesture = gestureNamed(word);
    if (!gesture || *gesture == Gesture::Reset)
        throw LineProblem("unknown gesture " + quoted(word));
    return nameOf(*gesture);
}

std::string_view takeRegion(LineWords &words) {
    const std::string_view word = words.require("a region");
    const auto region = regionNamed(word);
    if (!region)
        throw LineProblem("unknown region " + quoted(word));
    return nameOf(*region);
}

ExpectedLine parseEvent(LineWords words, std::size_t number) {
    const std::int64_t frameNumber =
        integerInRange(words.require("a frame number"), "frame number", 0, kUnsignedMax);
    const std::int64_t timeMs = takeTime(words);
    const std::string_view gesture = takeGesture(words);
    const std::string_view region = takeRegion(words);
    words.requireEnd();
    return {number, ExpectedLine::Kind::Event, 0, eventText(frameNumber, timeMs, gesture, region)};
}

ExpectedLine parseReset(LineWords words, std::size_t number) {
    words.requireEnd();
    return {number, ExpectedLine::Kind::Event, 0, std::string(nameOf(Gesture::Reset))};
}

ExpectedLine parseDescription(ExpectedLine::Kind kind, LineWords words, std::size_t number) {
    std::string_view word = words.require("a frame number");
    if (!word.ends_with(':'))
        throw LineProblem(quoted(word) +
                          " is no frame number as in 14: (the first blank line ends the stimulus)");
    word.remove_suffix(1);
    const auto frameNumber =
        static_cast<std::uint32_t>(integerInRange(word, "frame number", 0, kUnsignedMax));
    return {number, kind, frameNumber, descriptionLine(kind, frameNumber, words.rest())};
}

} // namespace

ExpectedLine parseExpectedLine(std::string_view line, std::size_t number) {
    LineWords wholeLine(line); // a description is taken as it is, without looking for a comment
    LineWords words(withoutComment(line));
    wholeLine.take();
    const std::string_view keyword = words.take();
    if (keyword == kTouchWord)
        return parseDescription(ExpectedLine::Kind::TouchDescription, wholeLine, number);
    if (keyword == kVirtualWord)
        return parseDescription(ExpectedLine::Kind::VirtualDescription, wholeLine, number);
    if (keyword == kFrameWord)
        return parseEvent(words, number);
    if (keyword == nameOf(Gesture::Reset))
        return parseReset(words, number);
    throw LineProblem(quoted(keyword) + " begins no expected line (the first blank line ends the stimulus)");
}

std::string eventLine(const ReplayedFrame &frame, const HostEvent &event) {
    const auto gesture = gestureOf(event);
    if (gesture == Gesture::Reset)
        return std::string(nameOf(Gesture::Reset));
    const std::int64_t timeMs = frame.kind == InputKind::Image ? frame.image.timeMs : 0;
    return eventText(event.integerField(kDigitizerFieldFrameNumber).value_or(0), timeMs,
                     gesture ? nameOf(*gesture) : "unknown", nameOf(regionOf(event)));
}

std::string descriptionLine(ExpectedLine::Kind kind, std::uint32_t frameNumber,
                            std::string_view description) {
    std::string text(kind == ExpectedLine::Kind::TouchDescription ? kTouchWord : kVirtualWord);
    text.push_back(' ');
    Util::appendUnsigned(text, frameNumber);
    text.append(": ").append(withoutTrailingBlanks(description));
    return text;
}

} // namespace ZorvaTouch::Tools
