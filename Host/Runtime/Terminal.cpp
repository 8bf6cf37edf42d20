#include "Host/Runtime/Terminal.h"

#include <sys/ioctl.h>

#include <cstdlib>
#include <string_view>

namespace ZorvaTouch::Host {
namespace {

std::string_view variable(const char *name) noexcept {
    const char *const value = std::getenv(name);
    return value ? value : "";
}

/// Zeros if it is not a terminal.
winsize sizeOf(StandardStream stream) noexcept {
    winsize size{};
    return ::ioctl(static_cast<int>(stream), TIOCGWINSZ, &size) == 0 ? size : winsize{};
}

} // namespace

bool isScreen(StandardStream stream) noexcept { return isTerminal(stream) && variable("TERM") != "dumb"; }

bool showsColours(StandardStream stream) noexcept { return isScreen(stream) && variable("NO_COLOR").empty(); }

std::size_t terminalColumns(StandardStream stream) noexcept { return sizeOf(stream).ws_col; }

std::size_t terminalRows(StandardStream stream) noexcept { return sizeOf(stream).ws_row; }

} // namespace ZorvaTouch::Host
