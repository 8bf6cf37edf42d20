#pragma once

#include <span>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// The name that a misspelt word was meant to be: the one with the fewest edits, if they are few for the
/// word's length. An edit adds, drops or replaces a character, or swaps two neighbours; case does not count.
/// @return Empty if there is none. The first of equally close names.
[[nodiscard]] std::string_view closestName(std::string_view word, std::span<const std::string_view> names);

/// The end of a message about the word: "; did you mean 'replay'?", or `otherwise` if no name is close.
[[nodiscard]] std::string suggestion(std::string_view word, std::span<const std::string_view> names,
                                     std::string_view otherwise = {});

} // namespace ZorvaTouch::Tools
