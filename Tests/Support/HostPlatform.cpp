#include "Tests/Support/HostPlatform.h"

#include <algorithm>
#include <ostream>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch::Testing {

// --- Logs ----------------------------------------------------------------------------------------

struct LogJournal::State {
    struct Record {
        std::string line;
        std::thread::id writer;
    };

    mutable std::mutex lock;
    std::vector<Record> records; ///< of category "HIDService"
    Lines opened;
    std::atomic<Ports::LogLevel> minimum = Ports::LogLevel::Debug;

    [[nodiscard]] Lines linesIf(const std::function<bool(const Record &)> &isWanted) const {
        const std::lock_guard guard(lock);
        Lines lines;
        for (const Record &record : records)
            if (isWanted(record))
                lines.push_back(record.line);
        return lines;
    }
};

class LogJournal::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<State> state, bool isKept) : _state(std::move(state)), _isKept(isKept) {}

    [[nodiscard]] bool isEnabled(Ports::LogLevel level) const noexcept override {
        return _isKept && level >= _state->minimum;
    }

    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        static constexpr std::array<const char *, 3> kNames{"debug ", "default ", "error "};
        const std::lock_guard guard(_state->lock);
        _state->records.push_back(
            {kNames[static_cast<std::size_t>(level)] + std::string(text), std::this_thread::get_id()});
    }

private:
    const std::shared_ptr<State> _state;
    const bool _isKept;
};

LogJournal::LogJournal() : _state(std::make_shared<State>()) {}

std::shared_ptr<Ports::Log> LogJournal::openLog(std::string_view subsystem, std::string_view category) {
    if (_isRefused)
        throw std::runtime_error("no log");
    const std::lock_guard guard(_state->lock);
    _state->opened.push_back(std::string(subsystem) + "/" + std::string(category));
    return std::make_shared<Handle>(_state, category == "HIDService");
}

void LogJournal::setLevel(Ports::LogLevel minimum) { _state->minimum = minimum; }

LogJournal::Lines LogJournal::lines() const {
    return _state->linesIf([](const State::Record &) { return true; });
}

LogJournal::Lines LogJournal::linesOfThis() const {
    return _state->linesIf(
        [](const State::Record &record) { return record.writer == std::this_thread::get_id(); });
}

LogJournal::Lines LogJournal::linesOfOthers() const {
    return _state->linesIf(
        [](const State::Record &record) { return record.writer != std::this_thread::get_id(); });
}

LogJournal::Lines LogJournal::errors() const {
    static constexpr std::string_view kPrefix = "error ";
    Lines errors =
        _state->linesIf([](const State::Record &record) { return record.line.starts_with(kPrefix); });
    for (std::string &line : errors)
        line.erase(0, kPrefix.size());
    return errors;
}

std::size_t LogJournal::count(std::string_view line) const {
    return _state->linesIf([&](const State::Record &record) { return record.line == line; }).size();
}

void LogJournal::clear() {
    const std::lock_guard guard(_state->lock);
    _state->records.clear();
}

LogJournal::Lines LogJournal::opened() const {
    const std::lock_guard guard(_state->lock);
    return _state->opened;
}

// --- Trace points --------------------------------------------------------------------------------

void PrintTo(const TracePoint &point, std::ostream *stream) {
    *stream << std::hex << point.code;
    for (const std::uint64_t argument : point.arguments)
        *stream << ' ' << argument;
    *stream << std::dec;
}

void TraceJournal::emit(std::uint32_t code, std::uint64_t argument0, std::uint64_t argument1,
                        std::uint64_t argument2, std::uint64_t argument3) noexcept {
    const std::lock_guard guard(_lock);
    _points.push_back({code, {argument0, argument1, argument2, argument3}});
}

std::vector<TracePoint> TraceJournal::points() const {
    const std::lock_guard guard(_lock);
    return _points;
}

std::vector<TracePoint> TraceJournal::pointsOf(std::uint32_t code) const {
    std::vector<TracePoint> wanted = points();
    std::erase_if(wanted, [code](const TracePoint &point) { return point.code != code; });
    return wanted;
}

// --- The platform --------------------------------------------------------------------------------

/// The real loop, which says when it begins.
class TestPlatform::Loop final : public Host::RunLoop {
public:
    Loop(std::shared_ptr<Host::RunLoop> real, std::shared_ptr<Progress> progress,
         std::function<void()> beforePass)
        : _real(std::move(real)), _progress(std::move(progress)), _beforePass(std::move(beforePass)) {}

    [[nodiscard]] Host::RunOutcome runOneSource(std::string_view mode) override {
        if (!std::exchange(_hasBegun, true))
            _progress->count(&Progress::looping);
        if (_beforePass)
            _beforePass();
        return _real->runOneSource(mode);
    }
    void stop() noexcept override { _real->stop(); }
    void perform(std::string_view mode, std::function<void()> closure) override {
        _real->perform(mode, std::move(closure));
    }
    [[nodiscard]] ZorvaRunLoop *boundary() noexcept override { return _real->boundary(); }

private:
    const std::shared_ptr<Host::RunLoop> _real;
    const std::shared_ptr<Progress> _progress;
    const std::function<void()> _beforePass;
    bool _hasBegun = false;
};

void TestPlatform::Progress::count(std::size_t Progress::*which) {
    const std::lock_guard guard(lock);
    ++(this->*which);
    changed.notify_all();
}

void TestPlatform::Progress::waitFor(std::size_t Progress::*which, std::size_t number) {
    std::unique_lock guard(lock);
    changed.wait(guard, [&] { return this->*which >= number; });
}

std::unique_ptr<Host::Semaphore> TestPlatform::createSemaphore() {
    if (failsSemaphores)
        throw std::runtime_error("no semaphore");
    return Host::processPlatform().createSemaphore();
}

std::unique_ptr<Host::Thread> TestPlatform::startThread(const char *name, std::function<void()> body) {
    if (failsThreads)
        throw std::runtime_error("no thread");
    _progress->count(&Progress::started);
    return Host::processPlatform().startThread(
        name, [body = std::move(body), progress = _progress]() mutable {
            body();
            body = nullptr; // what it holds goes before the thread counts as ended
            progress->count(&Progress::ended);
        });
}

std::shared_ptr<Host::RunLoop> TestPlatform::createRunLoop() {
    if (failsRunLoops)
        throw std::runtime_error("no run loop");
    return std::make_shared<Loop>(Host::processPlatform().createRunLoop(), _progress, beforePass);
}

int TestPlatform::setRoundRobinPriority(int priority) noexcept {
    priorityAskedFor = priority;
    return priorityError;
}

void TestPlatform::waitUntilLooping(std::size_t loops) { _progress->waitFor(&Progress::looping, loops); }

void TestPlatform::waitUntilEnded(std::size_t threads) { _progress->waitFor(&Progress::ended, threads); }

std::size_t TestPlatform::threadsStarted() const {
    const std::lock_guard guard(_progress->lock);
    return _progress->started;
}

} // namespace ZorvaTouch::Testing
