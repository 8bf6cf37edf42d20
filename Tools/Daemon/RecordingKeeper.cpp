#include "Tools/Daemon/RecordingKeeper.h"

#include <exception>
#include <utility>

namespace ZorvaTouch::Tools {

using Host::MutexLock;

RecordingKeeper::RecordingKeeper(std::optional<std::string> file, const RecordingLimits &limits,
                                 DaemonListener &listener, DaemonLog log, Linux::MainLoop &loop)
    : _file(std::move(file)), _limits(limits), _listener(listener), _log(std::move(log)), _loop(loop),
      _files(_file.value_or(""), limits.count), _names(_file ? _files.names() : std::vector<std::string>()) {
    if (_file)
        _queue.emplace("zorva-save");
}

RecordingKeeper::~RecordingKeeper() { giveUp(); }

void RecordingKeeper::expect(const SurfaceName &name) {
    if (_file)
        _files.expect(name.id);
}

void RecordingKeeper::save(const SurfaceName &name, const Surface &surface) noexcept {
    take(name, surface, false);
}

void RecordingKeeper::finish(const SurfaceName &name, const Surface &surface) noexcept {
    take(name, surface, true);
}

void RecordingKeeper::take(const SurfaceName &name, const Surface &surface, bool isLast) noexcept {
    if (!_file)
        return;
    try {
        auto recording = surface.recording();
        if (!recording)
            throw SavingError(name.node + ": there is no recording to save");
        const bool hasReports = !recording->history.empty();
        const auto file = _files.fileFor(name.id, hasReports);
        if (!file)
            return;
        submit(*file, {.surface = name, .recording = std::move(*recording), .isLast = isLast});
        if (isLast && hasReports)
            _files.finish(name.id);
    } catch (const std::exception &error) {
        _log.error({error.what()});
        _hasFailed = _hasFailed || isLast;
    }
}

// --- The queue ---------------------------------------------------------------------------------------------

void RecordingKeeper::submit(const std::string &file, Job job) {
    const MutexLock lock(_lock);
    _waiting.insert_or_assign(file, std::move(job));
    _queue->submit([this, file] { saveNext(file); });
    ++_busy;
}

std::optional<RecordingKeeper::Job> RecordingKeeper::nextFor(const std::string &file) {
    const MutexLock lock(_lock);
    auto waiting = _waiting.extract(file);
    return waiting ? std::optional(std::move(waiting.mapped())) : std::nullopt;
}

/// On the queue. A file that several were submitted for is written once, with the newest.
void RecordingKeeper::saveNext(const std::string &file) {
    const std::optional<Job> job = nextFor(file);
    std::optional<Result> result;
    if (job)
        result = saveTo(file, *job);
    {
        const MutexLock lock(_lock);
        --_busy; // first: what follows needs memory
        _changed.notify_all();
        if (result)
            _results.push_back(std::move(*result));
    }
    _loop.post([this] { reportResults(); });
}

RecordingKeeper::Result RecordingKeeper::saveTo(const std::string &file, const Job &job) const {
    Result result{.surface = job.surface, .file = file, .isLast = job.isLast};
    try {
        result.reports = saveRecordingFile(file, job.recording, _limits.bytes, _givenUp.get_token());
        for (const std::string &removed : removeOldestRecordings(_names, file, _limits.bytes))
            _log.notice({removed, ": removed, since all recordings together are more than --save-bytes"});
    } catch (const std::exception &error) {
        result.problem = error.what();
    }
    return result;
}

// --- The main thread again ---------------------------------------------------------------------------------

void RecordingKeeper::reportResults() {
    std::vector<Result> results;
    {
        const MutexLock lock(_lock);
        results.swap(_results);
    }
    for (const Result &result : results)
        report(result);
}

void RecordingKeeper::report(const Result &result) {
    if (result.problem.empty())
        return _listener.onRecording(result.surface, result.file, result.reports);
    _log.error({result.problem});
    _hasFailed = _hasFailed || result.isLast;
}

// --- The end -----------------------------------------------------------------------------------------------

void RecordingKeeper::wait() {
    {
        const MutexLock lock(_lock);
        while (_busy != 0 && !_givenUp.stop_requested())
            _changed.wait(_lock);
        const auto end = std::chrono::steady_clock::now() + kGrace;
        while (_busy != 0 && _changed.wait_until(_lock, end) == std::cv_status::no_timeout) {
        }
        _hasFailed = _hasFailed || _busy != 0;
    }
    reportResults();
}

void RecordingKeeper::giveUp() noexcept {
    const MutexLock lock(_lock);
    _givenUp.request_stop();
    _changed.notify_all();
}

bool RecordingKeeper::isBusy() const {
    const MutexLock lock(_lock);
    return _busy != 0;
}

} // namespace ZorvaTouch::Tools
