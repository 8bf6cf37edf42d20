#include "Tools/Cli/Progress.h"

#include "Shared/Util/Text.h"
#include "Shared/Util/Ticks.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kFirstDrawNs = 1'000'000'000; // after the start
constexpr std::uint64_t kDrawEveryNs = 100'000'000;
constexpr std::size_t kBarWidth = 30; // characters
constexpr std::string_view kClearLine = "\r\x1b[K";

constexpr std::uint64_t kBytesPerMegabyte = 1'000'000;

/// @param total  Not 0. A file may grow while it is read.
std::uint64_t shareOf(std::uint64_t whole, std::uint64_t done, std::uint64_t total) {
    return whole * std::min(done, total) / total;
}

void appendBar(std::string &text, std::uint64_t done, std::uint64_t total) {
    const std::uint64_t filled = shareOf(kBarWidth, done, total);
    text.append("[").append(filled, '#').append(kBarWidth - filled, '.').append("] ");
    Util::appendUnsigned(text, shareOf(100, done, total));
    text.append("%");
}

} // namespace

Progress::Progress(Environment &environment, std::string title)
    : _environment(environment), _title(std::move(title)), _nextDrawNs(nowNs() + kFirstDrawNs) {
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

void Progress::begin(std::string_view part, std::uint64_t total) {
    _part = part;
    _total = total;
    update(0);
}

void Progress::update(std::uint64_t done) {
    if (!_environment.showsProgress || nowNs() < _nextDrawNs)
        return;
    _nextDrawNs = nowNs() + kDrawEveryNs;
    draw(done);
}

void Progress::draw(std::uint64_t done) {
    std::string &text = _environment.errorOutput.text();
    text.append(kClearLine).append(_title).append(": ").append(_part).append(" ");
    if (_total > 0) {
        appendBar(text, done, _total);
    } else {
        Util::appendUnsigned(text, done / kBytesPerMegabyte);
        text.append(" MB");
    }
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
