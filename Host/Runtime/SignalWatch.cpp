#include "Host/Runtime/SignalWatch.h"

#include "Host/Runtime/Signals.h"
#include "Host/Runtime/SystemThread.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdint>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

/// Owns a descriptor.
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

} // namespace

class SignalWatch::State {
public:
    State(std::span<const int> signals, Function onSignal)
        : _onSignal(std::move(onSignal)), _signals(withoutIgnored(signals)), _blocked(_signals),
          _signalled(::signalfd(-1, &_signals, SFD_CLOEXEC | SFD_NONBLOCK), "signalfd"),
          _ended(::eventfd(0, EFD_CLOEXEC), "eventfd"),
          _thread(startSystemThread("zorva-signals", [this] { watch(); })) {}

    ~State() {
        const std::uint64_t one = 1;
        while (::write(_ended.number(), &one, sizeof one) < 0 && errno == EINTR) {
        }
        _thread->join();
    }
    State(const State &) = delete;
    State &operator=(const State &) = delete;

private:
    void watch() noexcept {
        while (const int signal = waitForSignal())
            _onSignal(signal);
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

    const Function _onSignal;
    const sigset_t _signals;
    const BlockedSignals _blocked;
    const Descriptor _signalled;
    const Descriptor _ended;
    const std::unique_ptr<Thread> _thread;
};

SignalWatch::SignalWatch(std::span<const int> signals, Function onSignal)
    : _state(std::make_unique<State>(signals, std::move(onSignal))) {}

SignalWatch::~SignalWatch() = default;

} // namespace ZorvaTouch::Host
