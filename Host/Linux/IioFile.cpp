#include "Host/Linux/IioFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <new>

namespace ZorvaTouch::Linux {
namespace {

OpenedIioNode open(const std::string &path) noexcept {
    UniqueFd descriptor(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (!descriptor)
        return {.node = nullptr, .errorNumber = errno};
    try {
        return {.node = std::make_unique<IioFile>(std::move(descriptor)), .errorNumber = 0};
    } catch (const std::bad_alloc &) {
        return {.node = nullptr, .errorNumber = ENOMEM};
    }
}

} // namespace

IioOpener IioFile::opener(std::string path) {
    return [path = std::move(path)] { return open(path); };
}

IoResult IioFile::read(std::span<std::uint8_t> buffer) noexcept {
    const ssize_t count = ::read(descriptor(), buffer.data(), buffer.size());
    if (count < 0)
        return {.errorNumber = errno};
    return {.count = static_cast<std::size_t>(count)};
}

} // namespace ZorvaTouch::Linux
