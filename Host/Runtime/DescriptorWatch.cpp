#include "Host/Runtime/DescriptorWatch.h"

#include <fcntl.h>
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

/// Closes an epoll set unless it is taken out.
class UniqueSet {
public:
    explicit UniqueSet(int set) noexcept : _set(set) {}
    ~UniqueSet() {
        if (_set >= 0)
            ::close(_set);
    }
    UniqueSet(const UniqueSet &) = delete;
    UniqueSet &operator=(const UniqueSet &) = delete;

    [[nodiscard]] int get() const noexcept { return _set; }
    void release() noexcept { _set = -1; }

private:
    int _set;
};

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

bool isNonBlocking(int descriptor) { return (::fcntl(descriptor, F_GETFL) & O_NONBLOCK) != 0; }

} // namespace

DescriptorWatch::DescriptorWatch(asio::io_context &context, int descriptor) : _watched(context) {
    UniqueSet set(makeSetOf(descriptor)); // in any case: it tells whether the descriptor can be watched
    asio::error_code error;
    if (isNonBlocking(descriptor))
        _watched.assign(descriptor, error);
    if (_watched.is_open() && !error)
        return;
    _watched.assign(set.get(), error);
    if (error)
        throw std::system_error(error);
    set.release();
    _isSet = true;
}

DescriptorWatch::~DescriptorWatch() {
    const int watched = _watched.release();
    if (_isSet)
        ::close(watched);
}

bool DescriptorWatch::isReadable() noexcept {
    pollfd watched{.fd = _watched.native_handle(), .events = POLLIN, .revents = 0};
    return ::poll(&watched, 1, 0) > 0;
}

} // namespace ZorvaTouch::Host
