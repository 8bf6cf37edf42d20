#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Linux/MainLoop.h"
#include "Host/Runtime/SerialQueue.h"
#include "Tools/Daemon/DaemonListener.h"
#include "Tools/Daemon/DaemonLog.h"
#include "Tools/Daemon/RecordingFiles.h"
#include "Tools/Daemon/RecordingSaver.h"
#include "Tools/Daemon/Surface.h"

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <map>
#include <optional>
#include <stop_token>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {

/// Saves surfaces' recordings to files, on a thread of its own: a slow disk does not delay the main loop.
/// The main thread takes the recording from the plug-in, and later reports what came of it.
///
/// Threads: the main thread, but for `giveUp`.
class RecordingKeeper {
public:
    /// How long `wait` waits for a file that is being written when saving is given up.
    static constexpr std::chrono::seconds kGrace{1};

    /// @param file      Nothing: nothing is saved, and there is no thread.
    /// @param listener  Borrowed.
    /// @param loop      Borrowed. Results are reported by its functions.
    /// @throws std::system_error  There is no thread for it.
    RecordingKeeper(std::optional<std::string> file, const RecordingLimits &limits, DaemonListener &listener,
                    DaemonLog log, Linux::MainLoop &loop);
    /// Gives up what is not saved yet, and waits for the file that is being written.
    ~RecordingKeeper();
    RecordingKeeper(const RecordingKeeper &) = delete;
    RecordingKeeper &operator=(const RecordingKeeper &) = delete;

    /// All files that recordings may be saved to; none without a file.
    [[nodiscard]] const std::vector<std::string> &files() const noexcept { return _names; }

    /// The surface has come: its place among them, and so its file, is settled, whichever is saved first.
    /// @throws std::bad_alloc
    void expect(const SurfaceName &name);

    /// Saves what the surface has recorded so far, in the place of what was saved since it was opened.
    void save(const SurfaceName &name, const Surface &surface) noexcept;
    /// The same for a surface that is about to be closed. When it comes back, its next recording goes to
    /// another file, unless this one has no report.
    void finish(const SurfaceName &name, const Surface &surface) noexcept;

    /// Waits until everything is saved, and reports it. Once saving is given up, it waits for a moment only.
    void wait();
    /// From now on nothing is saved: recordings that wait are lost, each with an error line, and the one that
    /// is being written ends without a file as soon as the system lets it.
    ///
    /// Threads: any.
    void giveUp() noexcept;

    /// Whether recordings are still to be saved; after `wait`, that the system did not let a write end.
    [[nodiscard]] bool isBusy() const;
    /// Whether the last recording of a surface was lost, as far as it was reported.
    [[nodiscard]] bool hasFailed() const noexcept { return _hasFailed; }

private:
    struct Job {
        SurfaceName surface;
        SurfaceRecording recording;
        bool isLast;
    };
    struct Result {
        SurfaceName surface;
        std::string file;
        bool isLast;
        std::size_t reports = 0;
        std::string problem = {}; ///< empty: saved
    };

    void take(const SurfaceName &name, const Surface &surface, bool isLast) noexcept;
    void submit(const std::string &file, Job job);
    [[nodiscard]] std::optional<Job> nextFor(const std::string &file);
    void saveNext(const std::string &file);
    [[nodiscard]] Result saveTo(const std::string &file, const Job &job) const;
    void reportResults();
    void report(const Result &result);

    const std::optional<std::string> _file;
    const RecordingLimits _limits;
    DaemonListener &_listener;
    const DaemonLog _log;
    Linux::MainLoop &_loop;
    RecordingFiles _files;
    const std::vector<std::string> _names; ///< see `files`
    bool _hasFailed = false;
    std::stop_source _givenUp;

    mutable Host::Mutex _lock;
    std::condition_variable_any _changed; ///< less is to be saved, or saving was given up
    std::map<std::string, Job> _waiting ZORVA_GUARDED_BY(_lock); ///< by file: a newer one replaces an older
    std::vector<Result> _results ZORVA_GUARDED_BY(_lock);        ///< not reported yet
    std::size_t _busy ZORVA_GUARDED_BY(_lock) = 0;               ///< functions on the queue

    std::optional<Host::SerialQueue> _queue; ///< ends first
};

} // namespace ZorvaTouch::Tools
