#include "Host/Runtime/Terminal.h"

#include <sys/ioctl.h>

namespace ZorvaTouch::Host {

std::size_t terminalColumns(StandardStream stream) noexcept {
    winsize size{};
    return ::ioctl(static_cast<int>(stream), TIOCGWINSZ, &size) == 0 ? size.ws_col : 0;
}

} // namespace ZorvaTouch::Host
