#include "Host/Runtime/SystemSemaphore.h"

#include <cerrno>
#include <system_error>

namespace ZorvaTouch::Host {

SystemSemaphore::SystemSemaphore() : _semaphore{} {
    if (::sem_init(&_semaphore, 0, 0) != 0)
        throw std::system_error(errno, std::generic_category(), "make a semaphore");
}

SystemSemaphore::~SystemSemaphore() { ::sem_destroy(&_semaphore); }

void SystemSemaphore::signal() noexcept { ::sem_post(&_semaphore); }

void SystemSemaphore::wait() noexcept {
    while (::sem_wait(&_semaphore) != 0 && errno == EINTR) {
    }
}

} // namespace ZorvaTouch::Host
