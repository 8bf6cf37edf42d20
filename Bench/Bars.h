#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace ZorvaTouch::Bench {

/// A promise about speed or size: a figure, what it is held against, and how far apart the two may be.
struct Bar {
    enum class Sense {
        AtMost,  ///< figure / counterpart must not exceed the limit
        AtLeast, ///< counterpart / figure, "times as fast", must reach the limit
    };

    std::string name{};
    std::string unit{}; ///< of figure and counterpart
    std::string counterpartName{};
    double figure = 0;
    double counterpart = 0;
    Sense sense = Sense::AtMost;
    std::optional<double> limit{};   ///< without one it is no bar, only shown
    std::optional<double> stretch{}; ///< a limit that is aimed at beyond the bar
    bool isBinding = false;          ///< counted rather than timed: missing it is an error

    /// What is compared with the limit. Nothing against nothing is 0.
    [[nodiscard]] double ratio() const noexcept;
    [[nodiscard]] bool passes() const noexcept { return !limit || reaches(*limit); }
    [[nodiscard]] bool reaches(double aim) const noexcept;
};

/// The bars of one run.
class BarTable {
public:
    void add(Bar bar) { _bars.push_back(std::move(bar)); }
    /// A bar that could not be measured: what was to be compared differs.
    void addError(std::string name, std::string problem);

    [[nodiscard]] bool empty() const noexcept { return _bars.empty() && _errors.empty(); }
    /// One line for each bar below a heading: name, figure, counterpart, ratio, bar, "pass", "FAIL" or,
    /// without a bar, "compare".
    [[nodiscard]] std::string text() const;
    /// Whether nothing differs and every binding bar passes. Times are no errors: they depend on the machine.
    [[nodiscard]] bool isSound() const noexcept;

private:
    struct Error {
        std::string name;
        std::string problem;
    };

    std::vector<Bar> _bars;
    std::vector<Error> _errors;
};

} // namespace ZorvaTouch::Bench
