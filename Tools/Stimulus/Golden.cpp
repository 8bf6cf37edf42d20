#include "Tools/Stimulus/Golden.h"

#include "Tools/Stimulus/StimulusText.h"
#include "Tools/Stimulus/VirtualClock.h"

#include <algorithm>
#include <cstdint>
#include <set>

namespace ZorvaTouch::Tools {
namespace {

/// Sensor frame numbers whose descriptions are asked for.
class DescribedFrames {
public:
    explicit DescribedFrames(std::span<const ExpectedLine> expected) {
        for (const ExpectedLine &line : expected) {
            if (line.kind == ExpectedLine::Kind::TouchDescription)
                _touch.insert(line.frameNumber);
            else if (line.kind == ExpectedLine::Kind::VirtualDescription)
                _virtual.insert(line.frameNumber);
        }
    }

    void appendTo(std::vector<std::string> &lines, const Replay &replay) const {
        const std::uint32_t number = replay.frame().image.frameNumber;
        if (_touch.contains(number))
            lines.push_back(
                descriptionLine(ExpectedLine::Kind::TouchDescription, number, replay.touchDescription()));
        if (_virtual.contains(number))
            lines.push_back(
                descriptionLine(ExpectedLine::Kind::VirtualDescription, number, replay.virtualDescription()));
    }

private:
    std::set<std::uint32_t> _touch, _virtual;
};

using Lines = std::vector<std::string>;

Lines textsOf(std::span<const ExpectedLine> expected) {
    Lines lines;
    for (const ExpectedLine &line : expected)
        lines.push_back(line.text);
    return lines;
}

void appendLines(std::string &text, std::string_view mark, Lines::const_iterator begin,
                 Lines::const_iterator end) {
    for (auto line = begin; line != end; ++line)
        text.append(mark).append(*line).append("\n");
}

/// What both begin with, what is between in each, what both end with.
std::string differenceOf(const Lines &expected, const Lines &actual) {
    if (expected == actual)
        return {};
    const auto [expectedFrom, actualFrom] =
        std::mismatch(expected.begin(), expected.end(), actual.begin(), actual.end());
    const auto [expectedBack, actualBack] =
        std::mismatch(expected.rbegin(), std::make_reverse_iterator(expectedFrom), actual.rbegin(),
                      std::make_reverse_iterator(actualFrom));
    std::string text;
    appendLines(text, "  ", expected.begin(), expectedFrom);
    appendLines(text, "- ", expectedFrom, expectedBack.base());
    appendLines(text, "+ ", actualFrom, actualBack.base());
    appendLines(text, "  ", expectedBack.base(), expected.end());
    return text;
}

} // namespace

std::vector<std::string> replayLines(const FrameList &frames, std::span<const ExpectedLine> expected) {
    const DescribedFrames described(expected);
    VirtualClock clock;
    Replay replay(frames, clock, Ports::silentLogProvider());
    Lines lines;
    while (replay.next()) {
        for (const auto &event : replay.frame().events)
            lines.push_back(eventLine(replay.frame(), *event));
        if (replay.frame().kind == InputKind::Image)
            described.appendTo(lines, replay);
    }
    return lines;
}

std::string compareExpected(const FrameList &frames, std::span<const ExpectedLine> expected) {
    return differenceOf(textsOf(expected), replayLines(frames, expected));
}

std::string compareGolden(std::string_view text) try {
    const Stimulus stimulus = parseStimulus(text);
    return compareExpected(stimulus.frames, stimulus.expected);
} catch (const StimulusError &error) {
    return error.what();
}

} // namespace ZorvaTouch::Tools
