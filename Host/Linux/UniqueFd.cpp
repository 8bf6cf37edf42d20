#include "Host/Linux/UniqueFd.h"

#include <unistd.h>

#include <cerrno>

namespace ZorvaTouch::Linux {

void UniqueFd::reset(int descriptor) noexcept {
    const int old = std::exchange(_descriptor, descriptor < 0 ? -1 : descriptor);
    if (old < 0 || old == _descriptor)
        return;
    const int errorNumber = errno;
    ::close(old); // never again, also after EINTR: the number may be somebody else's by then
    errno = errorNumber;
}

} // namespace ZorvaTouch::Linux
