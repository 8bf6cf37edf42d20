#include "Host/Runtime/StopSignals.h"

#include "Host/Runtime/Signals.h"

#include <poll.h>
#include <signal.h>
#include <sys/eventfd.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdint>
#include <system_error>
#include <thread>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

constexpr std::array<int, 3> kStopSignals{SIGINT, SIGTERM, SIGHUP};

sigset_t watchedSignals() noexcept {
    sigset_t signals;
    ::sigemptyset(&signals);
    for (const int signal : kStopSignals)
        if (!isSignalIgnored(signal))
            ::sigaddset(&signals, signal);
    return signals;
}

/// A descriptor of the kernel's that is closed in the end.
class Descriptor {
public:
    Descriptor(int number, const char *operation) : _number(number) {
        if (number < 0)
            throw std::system_error(errno, std::generic_category(), operation);
    }
    ~Descriptor() { ::close(_number); }
    Descriptor(const Descriptor &) = delete;
    Descriptor &operator=(const Descriptor &) = delete;

    [[nodiscard]] int number() const noexcept { return _number; }

private:
    int _number;
};

/// Lets a signal do what it does to a process that knows nothing of it.
void raiseAsEver(int signal) noexcept {
    struct sigaction action {};
    action.sa_handler = SIG_DFL;
    ::sigaction(signal, &action, nullptr);
    sigset_t signals;
    ::sigemptyset(&signals);
    ::sigaddset(&signals, signal);
    ::pthread_sigmask(SIG_UNBLOCK, &signals, nullptr);
    static_cast<void>(::raise(signal));
}

} // namespace

class StopSignals::Watch {
public:
    explicit Watch(std::function<void()> onStop)
        : _onStop(std::move(onStop)), _signals(watchedSignals()), _blocked(_signals),
          _signalled(::signalfd(-1, &_signals, SFD_CLOEXEC | SFD_NONBLOCK), "signalfd"),
          _ended(::eventfd(0, EFD_CLOEXEC), "eventfd"), _thread([this] { watch(); }) {}

    ~Watch() {
        const std::uint64_t one = 1;
        while (::write(_ended.number(), &one, sizeof one) < 0 && errno == EINTR) {
        }
        _thread.join();
    }
    Watch(const Watch &) = delete;
    Watch &operator=(const Watch &) = delete;

private:
    void watch() noexcept {
        bool isFirst = true;
        while (const int signal = waitForSignal()) {
            if (std::exchange(isFirst, false))
                _onStop();
            else
                raiseAsEver(signal);
        }
    }

    /// The next signal, or 0 in the end.
    [[nodiscard]] int waitForSignal() const noexcept {
        for (;;) {
            std::array<pollfd, 2> descriptors{
                {{_ended.number(), POLLIN, 0}, {_signalled.number(), POLLIN, 0}}};
            if (::poll(descriptors.data(), descriptors.size(), -1) < 0 && errno != EINTR)
                return 0;
            if (descriptors[0].revents != 0)
                return 0;
            signalfd_siginfo info{};
            if (::read(_signalled.number(), &info, sizeof info) == static_cast<ssize_t>(sizeof info))
                return static_cast<int>(info.ssi_signo);
        }
    }

    const std::function<void()> _onStop;
    const sigset_t _signals;
    const BlockedSignals _blocked; ///< before the thread, which inherits it
    const Descriptor _signalled;
    const Descriptor _ended;
    std::thread _thread;
};

StopSignals::StopSignals(std::function<void()> onStop) : _watch(std::make_unique<Watch>(std::move(onStop))) {}

StopSignals::~StopSignals() = default;

} // namespace ZorvaTouch::Host
