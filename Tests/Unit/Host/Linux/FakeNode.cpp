#include "Tests/Unit/Host/Linux/FakeNode.h"

#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <iterator>
#include <system_error>

namespace ZorvaTouch::Linux::Tests {
namespace {

IoResult copyOut(int errorNumber, const Bytes &bytes, std::span<std::uint8_t> buffer) {
    if (errorNumber != 0)
        return {.errorNumber = errorNumber};
    const std::size_t count = std::min(bytes.size(), buffer.size());
    std::copy_n(bytes.begin(), count, buffer.begin());
    return {.count = count};
}

} // namespace

FakeNode::FakeNode() {
    int ends[2];
    if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0, ends) != 0)
        throw std::system_error(errno, std::generic_category(), "socketpair");
    _near = UniqueFd(ends[0]);
    _far = UniqueFd(ends[1]);
}

void FakeNode::send(const Bytes &report) const {
    if (::send(_far.get(), report.data(), report.size(), MSG_NOSIGNAL) != static_cast<ssize_t>(report.size()))
        throw std::system_error(errno, std::generic_category(), "send");
}

IoResult FakeNode::read(std::span<std::uint8_t> buffer) noexcept {
    ++reads;
    if (!readErrors.empty()) {
        const int errorNumber = readErrors.front();
        readErrors.pop_front();
        return {.errorNumber = errorNumber};
    }
    const ssize_t count = ::read(descriptor(), buffer.data(), buffer.size());
    if (count < 0)
        return {.errorNumber = errno};
    if (count == 0)
        return {.errorNumber = endError};
    return {.count = static_cast<std::size_t>(count)};
}

IoResult FakeNode::deviceNumber(std::uint64_t &stored) noexcept {
    if (numberError == 0)
        stored = number;
    return {.errorNumber = numberError};
}

IoResult FakeNode::info(HidrawInfo &stored) noexcept {
    if (infoError == 0)
        stored = hidrawInfo;
    return {.errorNumber = infoError};
}

IoResult FakeNode::text(HidrawText which, std::span<std::uint8_t> buffer) noexcept {
    const Bytes &bytes = which == HidrawText::Name       ? name
                         : which == HidrawText::UniqueId ? uniqueId
                                                         : physicalPath;
    return copyOut(textError, bytes, buffer);
}

IoResult FakeNode::reportDescriptor(std::span<std::uint8_t> buffer) noexcept {
    return copyOut(descriptorError, descriptorBytes, buffer);
}

IoResult FakeNode::featureReport(std::span<std::uint8_t> buffer) noexcept {
    return onFeature ? onFeature(buffer) : IoResult{.errorNumber = EIO};
}

OpenedNode FakeOpener::open() {
    ++opens;
    if (!errors.empty()) {
        const int errorNumber = errors.front();
        errors.pop_front();
        if (errorNumber != 0)
            return {.node = nullptr, .errorNumber = errorNumber};
    }
    auto node = std::make_shared<FakeNode>();
    if (prepare)
        prepare(*node);
    _last = node;
    return {.node = std::move(node), .errorNumber = 0};
}

std::ptrdiff_t openDescriptors() {
    return std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
}

} // namespace ZorvaTouch::Linux::Tests
