#pragma once

#include "Shared/Util/PropertyValue.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>

/// The recognizer's state keys for tools: which can be written, and which values make sense.
///
/// The recognizer itself converts whatever is written (`Algs::setState`); a tool refuses what is out of
/// range, since a value that was meant to be something else is a mistake of its user.
namespace ZorvaTouch {

/// The values that make sense for a state key.
struct StateRange {
    enum class Kind { Boolean, Number, WholeNumber, Anything };

    Kind kind;
    double lowest = 0;  ///< of the two kinds of number, included
    double highest = 0; ///< likewise

    /// Whether a value is of the kind and within the limits. 0 and 1 are booleans too; NaN is not a number.
    [[nodiscard]] bool contains(const PropertyValue &value) const;
    /// "an integer from 0 to 4294967295", "true or false".
    [[nodiscard]] std::string text() const;
};

/// The range of a key that can be written, without the recognizer's domain ("ActivationThreshold"); nothing
/// for any other key.
[[nodiscard]] std::optional<StateRange> stateRange(std::string_view key);

/// The names of all keys that can be written; "VirtualNormalizationFactors.0 to .22" stands for the 23
/// factors.
[[nodiscard]] std::span<const std::string_view> writableStateKeys();

} // namespace ZorvaTouch
