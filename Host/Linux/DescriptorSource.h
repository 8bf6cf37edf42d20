#pragma once

#include "Plugin/Ref.h"

#include <cstdint>
#include <string>

namespace ZorvaTouch::Linux {

/// The place of a device on a run loop: the loop, which it keeps, the mode, and the source that watches the
/// device's descriptor there.
///
/// Threads: no lock of its own; the owner's.
class DescriptorSource {
public:
    DescriptorSource() noexcept = default;
    DescriptorSource(const DescriptorSource &) = delete;
    DescriptorSource &operator=(const DescriptorSource &) = delete;
    ~DescriptorSource() { disconnect(); }

    /// Takes a place, without a source yet. The old place must have been left.
    /// @throws std::bad_alloc
    void schedule(ZorvaRunLoop *loop, const char *mode);
    /// Leaves the place and its source.
    /// @return The loop, to be released when no lock is held: whoever goes with it may have things to say.
    [[nodiscard]] Ref<ZorvaRunLoop> unschedule() noexcept;
    [[nodiscard]] bool isScheduled() const noexcept { return static_cast<bool>(_loop); }
    [[nodiscard]] bool isScheduledOn(const ZorvaRunLoop *loop, const char *mode) const noexcept;

    /// Watches the descriptor, if there is a place. No other is watched.
    /// @return False: the loop cannot watch it, and has said why.
    [[nodiscard]] bool connect(int descriptor, ZorvaFunction perform, void *context) noexcept;
    /// Watches it no more, so that it may be closed; the place stays. Harmless without.
    void disconnect() noexcept;

private:
    Ref<ZorvaRunLoop> _loop; ///< null when there is no place
    std::string _mode;
    std::uint64_t _source = 0;
};

} // namespace ZorvaTouch::Linux
