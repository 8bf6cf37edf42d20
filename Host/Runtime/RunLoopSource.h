#pragma once

#include "Host/Runtime/AsioRunLoop.h"
#include "Host/Runtime/HandlerMemory.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>

namespace ZorvaTouch::Host {

/// A source. What can change is used under the loop's lock.
struct AsioRunLoop::Source {
    Source(const char *sourceMode, ZorvaFunction function, void *argument)
        : mode(sourceMode), perform(function), context(argument) {}

    const std::string mode;
    const ZorvaFunction perform;
    void *const context;

    std::uint64_t number = 0;
    std::optional<DescriptorWatch> watch; ///< none: signalled only
    HandlerMemory memory;
    std::uint64_t waitingSince = 0; ///< the loop's moment when the last wait began
    std::uint64_t readySince = 0;   ///< 0: not ready
    bool isSignalled = false;
    bool isWaiting = false; ///< for the descriptor
    bool isRemoved = false;
    bool wasReadable = false; ///< the system itself has said so once
};

/// What is called when a wait has ended.
class AsioRunLoop::WaitHandler {
public:
    using allocator_type = HandlerAllocator<void>; // NOLINT(readability-identifier-naming): asio's name

    WaitHandler(AsioRunLoop &loop, std::shared_ptr<Source> source) noexcept
        : _loop(&loop), _source(std::move(source)) {}

    [[nodiscard]] allocator_type get_allocator() const noexcept { // NOLINT(readability-identifier-naming)
        return allocator_type(_source->memory);
    }
    void operator()(const asio::error_code &error) const { _loop->waitEnded(*_source, error); }

private:
    AsioRunLoop *_loop;
    std::shared_ptr<Source> _source;
};

} // namespace ZorvaTouch::Host
