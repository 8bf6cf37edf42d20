#pragma once

#include <chrono>
#include <functional>
#include <memory>

struct sd_event;

namespace ZorvaTouch::Linux {

/// Something that the main loop serves, for as long as this lives. Empty when nothing is served.
class LoopWatch {
public:
    LoopWatch() noexcept;
    LoopWatch(LoopWatch &&other) noexcept;
    LoopWatch &operator=(LoopWatch &&other) noexcept;
    /// From here on it is not called again; it may be called right now if it lets go of itself.
    ~LoopWatch();

    [[nodiscard]] explicit operator bool() const noexcept { return _source != nullptr; }

private:
    friend class MainLoop;
    struct Source;
    explicit LoopWatch(std::unique_ptr<Source> source) noexcept;

    std::unique_ptr<Source> _source;
};

/// Has something called later, as `MainLoop::after` does; tests have timers of their own.
using LoopTimer = std::function<LoopWatch(std::chrono::microseconds delay, std::function<void()> function)>;

/// The loop of a program's main thread, on sd-event: it sleeps until a descriptor is readable, a time has
/// come or another thread has something to be run. What a function throws ends `run` with it.
///
/// Threads: the one that made it, but for `post` and `quit`.
class MainLoop {
public:
    using Function = std::function<void()>;

    /// @throws std::system_error
    MainLoop();
    /// Closures that were posted and have not run are destroyed.
    ~MainLoop();
    MainLoop(const MainLoop &) = delete;
    MainLoop &operator=(const MainLoop &) = delete;

    /// Serves until `quit`.
    /// @throws std::system_error  The loop cannot wait any more.
    /// @throws whatever a function throws
    void run();
    /// Has `run` return when the function that is running is done; before `run`, as soon as it begins.
    ///
    /// Threads: any.
    void quit() noexcept;

    /// Has a function run on the loop's thread, after those posted before. Once the loop is gone nothing
    /// happens.
    ///
    /// Threads: any.
    /// @throws std::bad_alloc
    void post(Function function);

    /// Calls while a descriptor is readable, has failed or was hung up. It stays its owner's, who lets go of
    /// the watch before closing it.
    /// @throws std::system_error
    [[nodiscard]] LoopWatch watch(int descriptor, Function function);
    /// Calls once, when so much time has passed; in suspend it stands still.
    /// @throws std::system_error
    [[nodiscard]] LoopWatch after(std::chrono::microseconds delay, Function function);
    /// For libraries that attach themselves. Borrowed.
    [[nodiscard]] sd_event *native() noexcept;

private:
    friend class LoopWatch;
    struct State;
    const std::unique_ptr<State> _state;
    LoopWatch _posted; ///< of what `post` brings
};

} // namespace ZorvaTouch::Linux
