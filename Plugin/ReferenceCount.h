#pragma once

#include <atomic>
#include <cstdint>

namespace ZorvaTouch {

/// A count of references that begins at one.
///
/// Threads:  any.
/// Realtime: yes.
class ReferenceCount {
public:
    /// @return The count with the new reference.
    std::uint32_t retain() noexcept { return _count.fetch_add(1, std::memory_order_relaxed) + 1; }

    /// @return The count that is left. Who gets 0 destroys the object; whatever others did to it has happened
    ///         before.
    std::uint32_t release() noexcept {
        // acq_rel and no separate fence: the thread sanitizer does not know fences.
        return _count.fetch_sub(1, std::memory_order_acq_rel) - 1;
    }

private:
    std::atomic<std::uint32_t> _count{1};
};

} // namespace ZorvaTouch
