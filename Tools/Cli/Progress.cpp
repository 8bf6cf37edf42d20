#include "Tools/Cli/Progress.h"

#include "Shared/Util/Text.h"
#include "Shared/Util/Ticks.h"

#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kFirstDrawNs = 1'000'000'000; // after the start
constexpr std::uint64_t kDrawEveryNs = 100'000'000;
constexpr std::size_t kBarWidth = 30; // characters
constexpr std::string_view kClearLine = "\r\x1b[K";

std::size_t shareOf(std::size_t whole, std::size_t done, std::size_t total) {
    return total == 0 ? whole : whole * done / total;
}

} // namespace

Progress::Progress(Environment &environment, std::string title, std::size_t total)
    : _environment(environment), _title(std::move(title)), _total(total),
      _nextDrawNs(nowNs() + kFirstDrawNs) {
    if (environment.showsProgress)
        environment.output.beforeFlush = [this] { hide(); };
}

Progress::~Progress() {
    if (!_environment.showsProgress)
        return;
    _environment.output.beforeFlush = nullptr;
    try {
        hide();
    } catch (...) { // standard error is gone: then so is the bar
    }
}

void Progress::update(std::size_t done) {
    if (!_environment.showsProgress || nowNs() < _nextDrawNs)
        return;
    _nextDrawNs = nowNs() + kDrawEveryNs;
    draw(done);
}

void Progress::draw(std::size_t done) {
    const std::size_t filled = shareOf(kBarWidth, done, _total);
    std::string &text = _environment.errorOutput.text();
    text.append(kClearLine).append(_title).append(" [");
    text.append(filled, '#').append(kBarWidth - filled, '.').append("] ");
    Util::appendUnsigned(text, shareOf(100, done, _total));
    text.append("%");
    _environment.errorOutput.flush();
    _isVisible = true;
}

void Progress::hide() {
    if (!std::exchange(_isVisible, false))
        return;
    _environment.errorOutput.write(kClearLine);
    _environment.errorOutput.flush();
}

std::uint64_t Progress::nowNs() noexcept {
    return Util::TickConverter(_environment.clock).nanosecondsFromMachTime(_environment.clock.nowTicks());
}

} // namespace ZorvaTouch::Tools
