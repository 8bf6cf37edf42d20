#pragma once

#include "Shared/Pixel.h"

#include <cstdint>
#include <string_view>

namespace ZorvaTouch::Testing {

/// The 38 channels of one frame, for tests that set them by hand; all at rest until told otherwise.
///
/// Normalized values are in units of an activation threshold of 200, the built-in one.
struct Channels {
    Channels();

    /// The channel of electrode 'A' to 'O'.
    [[nodiscard]] Pixel &electrode(char letter);
    /// The channel of a group, by its name such as "KLM".
    [[nodiscard]] VirtualPixel &group(std::string_view name);

    /// Puts a finger on an electrode: touched, above the noise floor, this value now and the largest so far.
    Channels &press(char letter, std::int32_t value);
    /// Lets an electrode be above the noise floor without being touched.
    Channels &brush(char letter, std::int32_t value);
    /// Gives an electrode or a group its largest normalized value so far, and nothing now.
    Channels &remember(char letter, float maxNormalizedValue);
    Channels &remember(std::string_view group, float maxNormalizedValue);

    Pixels pixels;
    VirtualPixels virtualPixels;
};

} // namespace ZorvaTouch::Testing
