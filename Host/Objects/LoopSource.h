#pragma once

#include "Plugin/Ref.h"

#include <cstdint>
#include <string>

namespace ZorvaTouch::Host {

/// The place of something on a run loop: the loop, which it keeps, the mode, and its source there.
///
/// Threads: no lock of its own; the owner's.
class LoopSource {
public:
    LoopSource() noexcept = default;
    LoopSource(const LoopSource &) = delete;
    LoopSource &operator=(const LoopSource &) = delete;
    ~LoopSource() { disconnect(); }

    /// Takes a place, without a source yet. The old place must have been left.
    /// @throws std::bad_alloc
    void schedule(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform, void *context);
    /// Leaves the place and its source.
    /// @return The loop, to be released when no lock is held: whoever goes with it may have things to say.
    Ref<ZorvaRunLoop> unschedule() noexcept;
    [[nodiscard]] bool isScheduled() const noexcept { return static_cast<bool>(_loop); }
    [[nodiscard]] bool isScheduledOn(const ZorvaRunLoop *loop, const char *mode) const noexcept;

    /// Adds the source if there is a place and no source; without memory there stays none.
    void connect() noexcept;
    /// Takes the source away; the place stays. Harmless without.
    void disconnect() noexcept;
    [[nodiscard]] bool isConnected() const noexcept { return _source != 0; }
    /// Makes the source ready. Harmless without.
    void signal() noexcept;

private:
    Ref<ZorvaRunLoop> _loop; ///< null when there is no place
    std::string _mode;
    ZorvaFunction _perform = nullptr;
    void *_context = nullptr;
    std::uint64_t _source = 0;
};

} // namespace ZorvaTouch::Host
