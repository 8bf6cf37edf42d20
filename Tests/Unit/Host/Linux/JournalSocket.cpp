#include "Tests/Unit/Host/Linux/JournalSocket.h"

#include <gtest/gtest.h>

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <iterator>
#include <poll.h>
#include <thread>

namespace ZorvaTouch::Linux::Tests {
namespace {

sockaddr_un addressOf(const std::string &path) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::ranges::copy(path, std::begin(address.sun_path));
    return address;
}

} // namespace

JournalSocket::JournalSocket() {
    _folder = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
    EXPECT_NE(::mkdtemp(_folder.data()), nullptr);
    open();
}

JournalSocket::~JournalSocket() {
    std::error_code ignored;
    std::filesystem::remove_all(_folder, ignored);
}

void JournalSocket::open() {
    _socket = UniqueFd(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const sockaddr_un address = addressOf(path());
    EXPECT_EQ(::bind(_socket.get(), reinterpret_cast<const sockaddr *>(&address), sizeof address), 0);
}

void JournalSocket::close() {
    _socket.reset();
    EXPECT_EQ(::unlink(path().c_str()), 0);
}

std::string JournalSocket::receive() const {
    std::string datagram(4096, '\0');
    const ssize_t size = ::recv(_socket.get(), datagram.data(), datagram.size(), 0);
    datagram.resize(static_cast<std::size_t>(std::max<ssize_t>(size, 0)));
    return datagram;
}

void JournalSocket::waitUntilFull() const {
    const UniqueFd probe(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const sockaddr_un address = addressOf(path());
    ASSERT_EQ(::connect(probe.get(), reinterpret_cast<const sockaddr *>(&address), sizeof address), 0);
    for (;;) {
        pollfd room{probe.get(), POLLOUT, 0};
        if (::poll(&room, 1, 0) == 0)
            return;
        std::this_thread::yield();
    }
}

} // namespace ZorvaTouch::Linux::Tests
