#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <functional>
#include <string_view>

namespace ZorvaTouch::Host {

/// Why a pass of a run loop ended.
enum class RunOutcome {
    HandledSource, ///< one source was served
    Stopped,       ///< somebody asked for it
    Finished,      ///< the mode has no source left
};

/// One thread's run loop. It serves the sources of one named mode at a time; sources of other modes wait.
///
/// The object may outlive its thread. Closures left over are destroyed unrun with it.
class RunLoop {
public:
    virtual ~RunLoop() = default;

    /// Waits, without limit, until one source of the mode is served or there is a reason to end. A stop wins
    /// over everything; closures are run on the way and do not count as a source.
    ///
    /// Threads:  the loop's own.
    /// Realtime: a pass that serves a source allocates nothing.
    [[nodiscard]] virtual RunOutcome runOneSource(std::string_view mode) = 0;

    /// Makes the pass that goes on, or else the next one, end with `Stopped`.
    ///
    /// Threads: any.
    virtual void stop() noexcept = 0;

    /// Has a closure run on the loop's thread, in that mode, and wakes the loop.
    ///
    /// Threads: any.
    /// @throws std::bad_alloc
    virtual void perform(std::string_view mode, std::function<void()> closure) = 0;

    /// The same loop as devices see it. Borrowed: lives as long as this, or as it is retained.
    [[nodiscard]] virtual ZorvaRunLoop *boundary() noexcept = 0;
};

} // namespace ZorvaTouch::Host
