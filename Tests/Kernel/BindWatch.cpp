#include "Tests/Kernel/BindWatch.h"

#include <linux/netlink.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <filesystem>
#include <string_view>
#include <system_error>
#include <utility>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr unsigned kKernelsGroup = 1;

int openSocket() {
    const int descriptor =
        ::socket(AF_NETLINK, SOCK_RAW | SOCK_CLOEXEC | SOCK_NONBLOCK, NETLINK_KOBJECT_UEVENT);
    sockaddr_nl address{};
    address.nl_family = AF_NETLINK;
    address.nl_groups = kKernelsGroup;
    if (descriptor < 0 ||
        ::bind(descriptor, reinterpret_cast<const sockaddr *>(&address), sizeof address) != 0)
        throw std::system_error(errno, std::generic_category(), "listening to the kernel's device events");
    return descriptor;
}

/// The value of KEY=value among the message's NUL-ended lines; empty if it is not there.
std::string_view valueOf(std::string_view message, std::string_view key) {
    while (!message.empty()) {
        const std::string_view line = message.substr(0, message.find('\0'));
        if (line.size() > key.size() && line.starts_with(key) && line[key.size()] == '=')
            return line.substr(key.size() + 1);
        message.remove_prefix(std::min(message.size(), line.size() + 1));
    }
    return {};
}

} // namespace

BindWatch::BindWatch(std::string serial) : _serial(std::move(serial)), _descriptor(openSocket()) {}

BindWatch::~BindWatch() { ::close(_descriptor); }

std::optional<std::string> BindWatch::takeBound() {
    std::array<char, 8192> buffer;
    for (;;) {
        const ssize_t length = ::recv(_descriptor, buffer.data(), buffer.size(), 0);
        if (length < 0)
            return std::nullopt;
        const std::string_view message(buffer.data(), static_cast<std::size_t>(length));
        if (valueOf(message, "ACTION") == "bind" && valueOf(message, "SUBSYSTEM") == "hid" &&
            valueOf(message, "HID_UNIQ") == _serial)
            return std::string("/sys").append(valueOf(message, "DEVPATH"));
    }
}

std::string hidrawNode(const std::string &folder) {
    std::error_code none;
    for (const auto &entry : std::filesystem::directory_iterator(folder + "/hidraw", none))
        return "/dev/" + entry.path().filename().string();
    return {};
}

} // namespace ZorvaTouch::KernelTests
