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

} // namespace

bool isScreen(StandardStream stream) noexcept { return isTerminal(stream) && variable("TERM") != "dumb"; }

bool showsColours(StandardStream stream) noexcept { return isScreen(stream) && variable("NO_COLOR").empty(); }

std::size_t terminalColumns(StandardStream stream) noexcept {
    winsize size{};
    return ::ioctl(static_cast<int>(stream), TIOCGWINSZ, &size) == 0 ? size.ws_col : 0;
}

} // namespace ZorvaTouch::Host
