#pragma once

#include "Host/Runtime/AsioRunLoop.h"

namespace ZorvaTouch::Host {

/// The loop as devices see it.
struct AsioRunLoop::Table {
    static const ZorvaRunLoopTable kTable;

private:
    static std::uint64_t addSource(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform,
                                   void *context) noexcept;
    static std::uint64_t addDescriptor(ZorvaRunLoop *loop, const char *mode, int descriptor,
                                       ZorvaFunction perform, void *context) noexcept;
    static void signalSource(ZorvaRunLoop *loop, std::uint64_t source) noexcept;
    static void removeSource(ZorvaRunLoop *loop, std::uint64_t source) noexcept;
    static ZorvaBoolean perform(ZorvaRunLoop *loop, const char *mode, ZorvaFunction run,
                                ZorvaFunction discard, void *context) noexcept;

    template <typename Adding>
    static std::uint64_t refusing(AsioRunLoop &self, const Adding &adding) noexcept;
};

} // namespace ZorvaTouch::Host
