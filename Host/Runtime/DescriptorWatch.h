#pragma once

#include <asio/io_context.hpp>
#include <asio/posix/descriptor.hpp>
#include <asio/posix/stream_descriptor.hpp>

#include <utility>

namespace ZorvaTouch::Host {

/// Watches a descriptor of somebody else's for something to read, an error or a hang-up.
///
/// Waiting for a descriptor makes it non-blocking, for everybody who shares it. One that is so already is
/// waited for as it is. Any other is put into an epoll set of its own and the set is waited for, which costs
/// a little more; so is one that is watched several times. Descriptors that cannot be watched are told at
/// once.
///
/// Threads: one at a time. The waits' handlers are called by whoever runs the context.
class [[gnu::visibility("hidden")]] DescriptorWatch {
public:
    /// @throws std::system_error  EPERM: the descriptor cannot be polled (a regular file, a folder,
    /// /dev/null).
    ///                            EBADF: it is not open. Any other: the system has no descriptor or memory
    ///                            left.
    DescriptorWatch(asio::io_context & context, int descriptor);
    /// Calls off a wait: its handler hears of it when the context runs, or is destroyed with the context.
    ~DescriptorWatch();
    DescriptorWatch(const DescriptorWatch &) = delete;
    DescriptorWatch &operator=(const DescriptorWatch &) = delete;

    /// Waits until the descriptor is readable, also if it already is. One wait at a time.
    template <typename Handler> void wait(Handler handler) {
        _watched.async_wait(asio::posix::descriptor_base::wait_read, std::move(handler));
    }
    /// Whether a wait would end at once.
    [[nodiscard]] bool isReadable() noexcept;

private:
    asio::posix::basic_stream_descriptor<asio::io_context::executor_type> _watched; ///< it, or its set
    bool _isSet = false;
};

} // namespace ZorvaTouch::Host
