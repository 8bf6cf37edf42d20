#pragma once

#include "Host/Runtime/Files.h"

#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Host {

/// Owns a file descriptor.
///
/// Threads: as an integer.
class Descriptor {
public:
    explicit Descriptor(int number) noexcept : _number(number) {}
    Descriptor(Descriptor &&other) noexcept : _number(std::exchange(other._number, -1)) {}
    Descriptor(const Descriptor &) = delete;
    Descriptor &operator=(const Descriptor &) = delete;
    Descriptor &operator=(Descriptor &&) = delete;
    ~Descriptor() {
        if (_number >= 0)
            ::close(_number);
    }

    [[nodiscard]] int number() const noexcept { return _number; }

    /// Some file systems report a failed write only here.
    /// @throws FileFailure
    void close() {
        if (::close(std::exchange(_number, -1)) != 0 && errno != EINTR)
            throw FileFailure("close", errno);
    }

private:
    int _number;
};

/// Calls a system function again while signals interrupt it.
template <typename Call> auto uninterrupted(const Call &call) {
    auto result = call();
    while (result < 0 && errno == EINTR)
        result = call();
    return result;
}

/// @throws FileFailure  A part may have been written.
inline void writeAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const auto count = uninterrupted([&] { return ::write(descriptor, text.data(), text.size()); });
        if (count < 0)
            throw FileFailure("write", errno);
        text.remove_prefix(static_cast<std::size_t>(count));
    }
}

} // namespace ZorvaTouch::Host
