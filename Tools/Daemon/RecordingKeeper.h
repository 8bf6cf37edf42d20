#pragma once

#include "Tools/Daemon/DaemonListener.h"
#include "Tools/Daemon/DaemonLog.h"
#include "Tools/Daemon/Surface.h"

#include <atomic>
#include <cstddef>
#include <map>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// Saves surfaces' recordings, each surface's to a file of its own, which it keeps when it is attached anew.
///
/// Threads: the main thread, but for `giveUp`.
class RecordingKeeper {
public:
    /// @param file      Nothing: nothing is saved.
    /// @param listener  Borrowed.
    RecordingKeeper(std::optional<std::string> file, DaemonListener &listener, DaemonLog log);

    /// The surface has come: its place among them, and so its file, is settled, whichever is saved first.
    /// @throws std::bad_alloc
    void expect(const SurfaceName &name);

    /// Saves what the surface has recorded so far, in the place of what was there. A recording without a
    /// report does not take the place of one that was saved before.
    void save(const SurfaceName &name, const Surface &surface) noexcept;

    /// From now on `save` saves nothing and logs an error instead; a save in progress is completed.
    ///
    /// Threads: any.
    void giveUp() noexcept { _isGivenUp = true; }

private:
    /// A surface that has or had a recording.
    struct Slot {
        std::string file;
        bool isWritten = false;
    };

    Slot &slotOf(const SurfaceName &name);

    const std::optional<std::string> _file;
    DaemonListener &_listener;
    const DaemonLog _log;
    std::atomic<bool> _isGivenUp{false};
    std::map<std::string, Slot> _slots; ///< by the surface's identity
};

} // namespace ZorvaTouch::Tools
