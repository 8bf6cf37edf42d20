#include "Bench/Latency/Link.h"

#include <fcntl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace ZorvaTouch::Bench {

Link::Link() {
    if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0, _ends) != 0)
        throw std::system_error(errno, std::generic_category(), "socketpair");
    ::fcntl(_ends[0], F_SETFL, O_NONBLOCK); // as a driver opens its nodes
}

Link::~Link() {
    ::close(_ends[0]);
    ::close(_ends[1]);
}

void Link::write(std::span<const std::uint8_t> report) const {
    if (::send(_ends[1], report.data(), report.size(), MSG_NOSIGNAL) < 0)
        throw std::system_error(errno, std::generic_category(), "send");
}

std::size_t Link::read(std::span<std::uint8_t> buffer) const {
    const ssize_t length = ::recv(_ends[0], buffer.data(), buffer.size(), 0);
    return length > 0 ? static_cast<std::size_t>(length) : 0;
}

void Link::shutDown() const noexcept { ::shutdown(_ends[1], SHUT_RDWR); }

} // namespace ZorvaTouch::Bench
