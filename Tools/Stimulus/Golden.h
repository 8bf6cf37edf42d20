#pragma once

#include "Shared/FrameList.h"
#include "Tools/Stimulus/ExpectedLine.h"

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Tools {

/// Replays frames and writes what came out as the text form's expected lines, in the order of the replay:
/// after each frame its events, then the descriptions of the frame that are asked for, touch before virtual.
///
/// @param expected  Asks for descriptions: those of the description lines among them.
[[nodiscard]] std::vector<std::string> replayLines(const FrameList &frames,
                                                   std::span<const ExpectedLine> expected);

/// Replays a stimulus in virtual time and compares with its expected lines.
/// @return As `compareGolden` below.
[[nodiscard]] std::string compareExpected(const FrameList &frames, std::span<const ExpectedLine> expected);

/// Replays a text's stimulus in virtual time and compares with its expected lines.
///
/// @return Empty when all is as expected. Otherwise what differs, to show to a person: the lines that both
/// have, with
///         two blanks before them, those that only the text has ("- ") and those that only the replay has ("+
///         "). A text that cannot be read differs too: then it is the error, "line 12: unknown electrode
///         'P'".
[[nodiscard]] std::string compareGolden(std::string_view text);

} // namespace ZorvaTouch::Tools
