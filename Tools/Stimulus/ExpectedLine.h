#pragma once

#include "Shared/HostEvent.h"
#include "Tools/Stimulus/Replay.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// A line that says what a replay is expected to do.
struct ExpectedLine {
    enum class Kind {
        Event,              ///< an event
        TouchDescription,   ///< the recognizer's description of the electrodes after a frame
        VirtualDescription, ///< likewise, of the virtual pixels
    };

    std::size_t line; ///< number in the text, from 1
    Kind kind;
    std::uint32_t frameNumber = 0; ///< of a description: the sensor's number of the image
    std::string text;              ///< as a replay writes it: single blanks, none at the end
};

/// Parses one expected line that is neither blank nor a comment.
/// @param number  Goes into the result.
/// @throws LineProblem
[[nodiscard]] ExpectedLine parseExpectedLine(std::string_view line, std::size_t number);

/// An event of the frame as such a line, "frame 14 @130ms may-begin play/pause" or "reset". Events that
/// belong to a device reset have frame 0 and time 0.
[[nodiscard]] std::string eventLine(const ReplayedFrame &frame, const HostEvent &event);

/// A description as such a line.
/// @param kind  One of the two descriptions.
[[nodiscard]] std::string descriptionLine(ExpectedLine::Kind kind, std::uint32_t frameNumber,
                                          std::string_view description);

} // namespace ZorvaTouch::Tools
