#pragma once

#include "Shared/FrameList.h"
#include "Tools/Stimulus/ExpectedLine.h"

#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// Recordings that a person writes as text. Docs/TextForm.md is the grammar.
namespace ZorvaTouch::Tools {

/// Time stamp of the first frame. Not 0, so that a time stamp that is missing or taken for an offset stands
/// out.
inline constexpr std::uint64_t kStimulusStartNs = 1'000'000'000;
/// Most frames that a text may make: almost three hours at the usual 100 reports a second.
inline constexpr std::size_t kStimulusMaxFrames = 1'000'000;
/// Most time that may pass in a text, in ms: time stamps stay far from overflowing.
inline constexpr std::uint64_t kStimulusMaxDurationMs = 10'000'000'000'000;

/// A line that cannot be read. `what()` is "line 12: unknown electrode 'P'".
class StimulusError : public std::runtime_error {
public:
    StimulusError(std::size_t lineNumber, const std::string &problem)
        : std::runtime_error("line " + std::to_string(lineNumber) + ": " + problem), line(lineNumber),
          message(problem) {}
    std::size_t line; ///< from 1
    std::string message;
};

/// What a text says.
struct Stimulus {
    FrameList frames;
    std::vector<ExpectedLine> expected; ///< in the order of the text
};

/// Parses a text: stimulus lines, a blank line, expected lines.
/// @param maxFrames  Most frames that the text may make; `kStimulusMaxFrames` or less.
/// @throws StimulusError  for the first line that cannot be read.
[[nodiscard]] Stimulus parseStimulus(std::string_view text, std::size_t maxFrames = kStimulusMaxFrames);

} // namespace ZorvaTouch::Tools
