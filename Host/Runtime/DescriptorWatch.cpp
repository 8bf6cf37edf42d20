#include "Host/Runtime/DescriptorWatch.h"

#include <poll.h>
#include <sys/epoll.h>
#include <unistd.h>

#include <cerrno>
#include <string>
#include <system_error>

namespace ZorvaTouch::Host {
namespace {

[[noreturn]] void fail(int descriptor, int errorNumber) {
    throw std::system_error(errorNumber, std::generic_category(),
                            "watch descriptor " + std::to_string(descriptor));
}

/// A new epoll set with this descriptor in it.
int makeSetOf(int descriptor) {
    const int set = ::epoll_create1(EPOLL_CLOEXEC);
    if (set < 0)
        fail(descriptor, errno);
    epoll_event event{};
    event.events = EPOLLIN;
    if (::epoll_ctl(set, EPOLL_CTL_ADD, descriptor, &event) != 0) {
        const int errorNumber = errno;
        ::close(set);
        fail(descriptor, errorNumber);
    }
    return set;
}

} // namespace

DescriptorWatch::DescriptorWatch(asio::io_context &context, int descriptor) : _set(context) {
    const int set = makeSetOf(descriptor);
    asio::error_code error;
    _set.assign(set, error);
    if (error) {
        ::close(set);
        throw std::system_error(error);
    }
}

DescriptorWatch::~DescriptorWatch() { ::close(_set.release()); }

bool DescriptorWatch::isReadable() noexcept {
    pollfd set{.fd = _set.native_handle(), .events = POLLIN, .revents = 0};
    return ::poll(&set, 1, 0) > 0;
}

} // namespace ZorvaTouch::Host
