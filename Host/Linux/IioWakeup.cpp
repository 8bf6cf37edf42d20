#include "Host/Linux/IioWakeup.h"

#include <sys/eventfd.h>

#include <cerrno>
#include <system_error>

namespace ZorvaTouch::Linux {

IioWakeup::IioWakeup() : _event(::eventfd(0, EFD_CLOEXEC)) {
    if (!_event)
        throw std::system_error(errno, std::generic_category(), "eventfd");
}

void IioWakeup::wake() const noexcept {
    while (::eventfd_write(_event.get(), 1) != 0 && errno == EINTR)
        ;
}

void IioWakeup::wait() const noexcept {
    eventfd_t count = 0;
    while (::eventfd_read(_event.get(), &count) != 0 && errno == EINTR)
        ;
}

} // namespace ZorvaTouch::Linux
