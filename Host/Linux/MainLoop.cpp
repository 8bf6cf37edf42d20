#include "Host/Linux/MainLoop.h"

#include "Host/Interface/Mutex.h"
#include "Host/Linux/UniqueFd.h"

#include <sys/epoll.h>
#include <sys/eventfd.h>
#include <systemd/sd-event.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdint>
#include <deque>
#include <exception>
#include <system_error>
#include <thread>
#include <utility>

namespace ZorvaTouch::Linux {

using Host::MutexLock;

namespace {

constexpr std::uint64_t kTimerAccuracyUs = 1000; // sd-event's own default is a quarter of a second

/// @param result  Of a function of sd-event: an errno, negative.
void require(int result, const char *operation) {
    if (result < 0)
        throw std::system_error(-result, std::generic_category(), operation);
}

UniqueFd makeEventFd() {
    UniqueFd descriptor(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK));
    if (!descriptor)
        throw std::system_error(errno, std::generic_category(), "eventfd");
    return descriptor;
}

} // namespace

struct MainLoop::State {
    State() : wake(makeEventFd()) { require(::sd_event_new(&event), "make a main loop"); }
    ~State() { ::sd_event_unref(event); }
    State(const State &) = delete;
    State &operator=(const State &) = delete;

    /// Calls; what is thrown is kept and ends the loop, since it must not pass through C.
    void call(const Function &function) noexcept {
        try {
            function();
        } catch (...) {
            failure = std::current_exception();
            ::sd_event_exit(event, 0);
        }
    }

    void wakeUp() const noexcept {
        const std::uint64_t one = 1;
        while (::write(wake.get(), &one, sizeof one) < 0 && errno == EINTR) {
        }
    }

    void runPosted() {
        std::uint64_t count = 0;
        [[maybe_unused]] const ssize_t size = ::read(wake.get(), &count, sizeof count); // reset; never waits
        if (isQuitting)
            ::sd_event_exit(event, 0);
        std::deque<Function> functions;
        {
            const MutexLock lock(mutex);
            functions.swap(posted);
        }
        for (const Function &function : functions)
            function();
    }

    const UniqueFd wake;
    const std::thread::id thread = std::this_thread::get_id();
    sd_event *event = nullptr;
    std::exception_ptr failure;
    std::atomic<bool> isQuitting{false};

    Host::Mutex mutex;
    std::deque<Function> posted ZORVA_GUARDED_BY(mutex);
};

// --- A watch -----------------------------------------------------------------------------------------------

struct LoopWatch::Source {
    Source(MainLoop::State &ofLoop, MainLoop::Function called)
        : loop(ofLoop), function(std::make_shared<const MainLoop::Function>(std::move(called))) {}
    ~Source() { ::sd_event_source_disable_unref(source); }
    Source(const Source &) = delete;
    Source &operator=(const Source &) = delete;

    static int serve(void *context) noexcept {
        Source &self = *static_cast<Source *>(context);
        const auto function = self.function; // which may let go of the watch
        self.loop.call(*function);
        return 0;
    }
    static int serveDescriptor(sd_event_source *, int, std::uint32_t, void *context) noexcept {
        return serve(context);
    }
    static int serveTime(sd_event_source *, std::uint64_t, void *context) noexcept { return serve(context); }

    MainLoop::State &loop;
    const std::shared_ptr<const MainLoop::Function> function;
    sd_event_source *source = nullptr;
};

LoopWatch::LoopWatch() noexcept = default;
LoopWatch::LoopWatch(std::unique_ptr<Source> source) noexcept : _source(std::move(source)) {}
LoopWatch::LoopWatch(LoopWatch &&other) noexcept = default;
LoopWatch &LoopWatch::operator=(LoopWatch &&other) noexcept = default;
LoopWatch::~LoopWatch() = default;

// --- The loop ----------------------------------------------------------------------------------------------

MainLoop::MainLoop() : _state(std::make_unique<State>()) {
    _posted = watch(_state->wake.get(), [state = _state.get()] { state->runPosted(); });
}

MainLoop::~MainLoop() = default;

void MainLoop::run() {
    require(::sd_event_loop(_state->event), "wait in the main loop");
    if (const auto failure = std::exchange(_state->failure, nullptr))
        std::rethrow_exception(failure);
}

void MainLoop::quit() noexcept {
    if (std::this_thread::get_id() == _state->thread) {
        ::sd_event_exit(_state->event, 0);
        return;
    }
    _state->isQuitting = true;
    _state->wakeUp();
}

void MainLoop::post(Function function) {
    {
        const MutexLock lock(_state->mutex);
        _state->posted.push_back(std::move(function));
    }
    _state->wakeUp();
}

LoopWatch MainLoop::watch(int descriptor, Function function) {
    auto source = std::make_unique<LoopWatch::Source>(*_state, std::move(function));
    require(::sd_event_add_io(_state->event, &source->source, descriptor, EPOLLIN,
                              LoopWatch::Source::serveDescriptor, source.get()),
            "watch a descriptor");
    return LoopWatch(std::move(source));
}

LoopWatch MainLoop::after(std::chrono::microseconds delay, Function function) {
    auto source = std::make_unique<LoopWatch::Source>(*_state, std::move(function));
    require(::sd_event_add_time_relative(_state->event, &source->source, CLOCK_MONOTONIC,
                                         static_cast<std::uint64_t>(delay.count()), kTimerAccuracyUs,
                                         LoopWatch::Source::serveTime, source.get()),
            "wait for a time");
    return LoopWatch(std::move(source));
}

sd_event *MainLoop::native() noexcept { return _state->event; }

} // namespace ZorvaTouch::Linux
