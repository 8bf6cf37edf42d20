#include "Bench/Bars.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>
#include <utility>

namespace ZorvaTouch::Bench {
namespace {

constexpr std::size_t kColumnCount = 6;
using Row = std::array<std::string, kColumnCount>;

/// Three digits are more than the measurements are good for. Nothing but 0 is shown as 0.
std::string numberText(double value) {
    const double size = std::abs(value);
    const int decimals = value == std::floor(value) || size >= 100 ? 0 : size >= 10 ? 1 : 2;
    const bool isTiny = value != 0 && size < 0.01;
    std::array<char, 64> text{};
    std::snprintf(text.data(), text.size(), isTiny ? "%.*g" : "%.*f", decimals, value);
    return text.data();
}

std::string verdictText(const Bar &bar) {
    if (!bar.limit)
        return "compare";
    std::string text = bar.passes() ? "pass" : "FAIL";
    if (bar.stretch)
        text += " (stretch " + numberText(*bar.stretch) +
                (bar.reaches(*bar.stretch) ? ": reached)" : ": missed)");
    return text;
}

Row rowOf(const Bar &bar) {
    const std::string unit = " " + bar.unit;
    const std::string sign = bar.sense == Bar::Sense::AtMost ? "<= " : ">= ";
    return {bar.name,
            numberText(bar.figure) + unit,
            bar.counterpartName + " " + numberText(bar.counterpart) + unit,
            numberText(bar.ratio()),
            bar.limit ? sign + numberText(*bar.limit) : "-",
            verdictText(bar)};
}

} // namespace

double Bar::ratio() const noexcept {
    const double above = sense == Sense::AtMost ? figure : counterpart;
    const double below = sense == Sense::AtMost ? counterpart : figure;
    return above == 0 ? 0 : above / below;
}

bool Bar::reaches(double aim) const noexcept {
    return sense == Sense::AtMost ? ratio() <= aim : ratio() >= aim;
}

void BarTable::addError(std::string name, std::string problem) {
    _errors.push_back({std::move(name), std::move(problem)});
}

std::string BarTable::text() const {
    std::vector<Row> rows{{"bar", "figure", "against", "ratio", "limit", "verdict"}};
    for (const Bar &bar : _bars)
        rows.push_back(rowOf(bar));

    std::array<std::size_t, kColumnCount> widths{};
    for (const Row &row : rows)
        for (std::size_t column = 0; column + 1 < kColumnCount; ++column) // nothing follows the last one
            widths[column] = std::max(widths[column], row[column].size() + 2);

    std::string text;
    for (const Row &row : rows) {
        for (std::size_t column = 0; column < kColumnCount; ++column) {
            text += row[column];
            if (row[column].size() < widths[column])
                text.append(widths[column] - row[column].size(), ' ');
        }
        text += "\n";
    }
    for (const Error &error : _errors)
        text += error.name + ": FAIL, " + error.problem + "\n";
    return text;
}

bool BarTable::isSound() const noexcept {
    return _errors.empty() && std::all_of(_bars.begin(), _bars.end(),
                                          [](const Bar &bar) { return bar.passes() || !bar.isBinding; });
}

} // namespace ZorvaTouch::Bench
