#include "Tools/Cli/ReplayExpecter.h"

#include "Tools/Cli/ReplayJson.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::string_view kNothing = "(nothing more)";

} // namespace

ReplayExpecter::ReplayExpecter(std::string_view expected, std::string expectedTitle, bool describe,
                               Output &output)
    : _rest(expected), _expectedTitle(std::move(expectedTitle)), _describe(describe), _output(output) {}

void ReplayExpecter::begin(const std::string &title, const Replay & /*replay*/) { _title = title; }

void ReplayExpecter::print(const Replay &replay) {
    if (_differs)
        return;
    _line.clear();
    appendReplayLine(_line, replay, _describe);
    if (!_line.empty())
        compareLine("frame " + std::to_string(replay.frame().index));
}

void ReplayExpecter::end(const Replay &replay) {
    if (_differs)
        return;
    _line.clear();
    appendReplayEnd(_line, replay);
    compareLine("the end");
}

void ReplayExpecter::finish() {
    if (!_differs && !_rest.empty())
        tell("after the end", takeExpected(), kNothing);
}

void ReplayExpecter::compareLine(const std::string &place) {
    const std::string_view actual =
        std::string_view(_line).substr(0, _line.size() - 1); // without the newline
    if (_rest.empty()) {
        ++_lineNumber;
        tell(place, kNothing, actual);
    } else if (const std::string_view expected = takeExpected(); expected != actual) {
        tell(place, expected, actual);
    }
}

std::string_view ReplayExpecter::takeExpected() {
    const std::size_t end = std::min(_rest.find('\n'), _rest.size());
    const std::string_view line = _rest.substr(0, end);
    _rest.remove_prefix(std::min(end + 1, _rest.size()));
    ++_lineNumber;
    return line;
}

void ReplayExpecter::tell(const std::string &place, std::string_view expected, std::string_view actual) {
    _differs = true;
    std::string &text = _output.text();
    text.append(_title).append(": ").append(place).append(" differs from ").append(_expectedTitle);
    text.append(", line ").append(std::to_string(_lineNumber));
    text.append("\nexpected: ").append(expected).append("\nactual:   ").append(actual).append("\n");
    _output.wrote();
}

} // namespace ZorvaTouch::Tools
