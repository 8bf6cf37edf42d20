#pragma once

#include "Host/Interface/Platform.h"

#include <array>
#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

/// The process around a service, as a test wants it.
namespace ZorvaTouch::Testing {

/// Log lines of several threads, as "debug text", "default text" or "error text".
///
/// Threads: any.
class LogJournal final : public Ports::LogProvider {
public:
    LogJournal();

    /// @throws std::runtime_error  "no log" while `refuse` says so.
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

    /// The lowest level that is written; at first `Debug`.
    void setLevel(Ports::LogLevel minimum);
    void refuse(bool isRefused) { _isRefused = isRefused; }

    using Lines = std::vector<std::string>;
    [[nodiscard]] Lines lines() const;       ///< of category "HIDService"
    [[nodiscard]] Lines linesOfThis() const; ///< of these, the calling thread's
    [[nodiscard]] Lines linesOfOthers() const;
    [[nodiscard]] Lines errors() const; ///< without the "error "
    [[nodiscard]] std::size_t count(std::string_view line) const;
    void clear();

    /// "subsystem/category" of every handle that was opened.
    [[nodiscard]] Lines opened() const;

private:
    class Handle;
    struct State;
    std::shared_ptr<State> _state; ///< handles may outlive the journal
    std::atomic<bool> _isRefused = false;
};

/// A clock that stands still until it is set.
class TestClock final : public Ports::Clock {
public:
    explicit TestClock(Ports::TimeBase base) noexcept : _base(base) {}

    [[nodiscard]] std::uint64_t nowTicks() noexcept override { return ticks; }
    [[nodiscard]] Ports::TimeBase timeBase() noexcept override { return _base; }
    void sleepMicroseconds(std::uint64_t) noexcept override {}

    std::atomic<std::uint64_t> ticks = 0;

private:
    const Ports::TimeBase _base;
};

struct TracePoint {
    std::uint32_t code;
    std::array<std::uint64_t, 4> arguments;

    friend bool operator==(const TracePoint &, const TracePoint &) = default;
};
void PrintTo(const TracePoint &point, std::ostream *stream);

/// Keeps every trace point.
class TraceJournal final : public Host::TraceSink {
public:
    void emit(std::uint32_t code, std::uint64_t argument0, std::uint64_t argument1, std::uint64_t argument2,
              std::uint64_t argument3) noexcept override;

    [[nodiscard]] std::vector<TracePoint> points() const;
    [[nodiscard]] std::vector<TracePoint> pointsOf(std::uint32_t code) const;

private:
    mutable std::mutex _lock;
    std::vector<TracePoint> _points;
};

/// A platform that is the process's own but for what a test looks at, sets, or lets fail.
///
/// What fails, throws std::runtime_error "no thread", "no run loop", "no semaphore". Threads get no real-time
/// priority: the platform only writes down what was asked for.
class TestPlatform final : public Host::Platform {
public:
    explicit TestPlatform(Ports::TimeBase base = {}) : testClock(base) {}

    [[nodiscard]] Ports::LogProvider &logs() noexcept override { return journal; }
    [[nodiscard]] Ports::Clock &clock() noexcept override { return testClock; }
    [[nodiscard]] Host::TraceSink &trace() noexcept override { return traces; }
    [[nodiscard]] std::unique_ptr<Host::Semaphore> createSemaphore() override;
    [[nodiscard]] std::unique_ptr<Host::Thread> startThread(const char *name,
                                                            std::function<void()> body) override;
    [[nodiscard]] std::shared_ptr<Host::RunLoop> createRunLoop() override;
    [[nodiscard]] int setRoundRobinPriority(int priority) noexcept override;

    /// Waits until this many loops in all have begun their first pass: until then a device may not have been
    /// scheduled on the last of them.
    void waitUntilLooping(std::size_t loops);
    /// Waits until this many threads in all have left their body.
    void waitUntilEnded(std::size_t threads);
    [[nodiscard]] std::size_t threadsStarted() const;

    LogJournal journal;
    TestClock testClock;
    TraceJournal traces;

    std::atomic<bool> failsSemaphores = false;
    std::atomic<bool> failsThreads = false;
    std::atomic<bool> failsRunLoops = false;
    std::atomic<int> priorityError = 0;     ///< what `setRoundRobinPriority` returns
    std::atomic<int> priorityAskedFor = -1; ///< the last one
    /// Runs on the loop's thread before each of its passes, and may throw. Set while no loop runs.
    std::function<void()> beforePass;

private:
    class Loop;
    struct Progress {
        std::mutex lock;
        std::condition_variable changed;
        std::size_t started = 0, looping = 0, ended = 0;

        void count(std::size_t Progress::*which);
        void waitFor(std::size_t Progress::*which, std::size_t number);
    };
    std::shared_ptr<Progress> _progress = std::make_shared<Progress>(); ///< threads may outlive the platform
};

} // namespace ZorvaTouch::Testing
