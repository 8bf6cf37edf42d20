#pragma once

#include "Synth/Episodes.h"
#include "Synth/Parameters.h"

#include <array>
#include <cstddef>
#include <string_view>

namespace ZorvaTouch::Synth {

/// A kind of recording that can be made.
struct Scenario {
    std::string_view name;
    std::string_view description;
    double duration; ///< s, unless another is asked for
    EpisodeMaker make;
    void (*tune)(Parameters &parameters); ///< its own defaults, or null
};

inline constexpr std::size_t kScenarioCount = 13;
[[nodiscard]] const std::array<Scenario, kScenarioCount> &scenarios() noexcept;

/// Null if there is none of that name.
[[nodiscard]] const Scenario *scenarioNamed(std::string_view name) noexcept;

/// The defaults as the scenario has them.
[[nodiscard]] Parameters parametersOf(const Scenario &scenario) noexcept;

} // namespace ZorvaTouch::Synth
