#include "Host/Linux/StandardStreams.h"

#include <fcntl.h>
#include <unistd.h>

namespace ZorvaTouch::Linux {

void fillStandardStreams() noexcept {
    // A descriptor that is opened gets the lowest number that is free.
    for (int number = STDIN_FILENO; number <= STDERR_FILENO; ++number)
        if (::fcntl(number, F_GETFD) < 0)
            static_cast<void>(::open("/dev/null", O_RDWR));
}

} // namespace ZorvaTouch::Linux
