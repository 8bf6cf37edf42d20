#pragma once

#include <csignal>
#include <pthread.h>
#include <span>

namespace ZorvaTouch::Host {

/// Whether the process was started to ignore a signal, as `nohup` does, or has come to.
[[nodiscard]] inline bool isSignalIgnored(int signal) noexcept {
    struct sigaction action {};
    return ::sigaction(signal, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

[[nodiscard]] inline sigset_t allSignals() noexcept {
    sigset_t signals;
    ::sigfillset(&signals);
    return signals;
}

/// A set of those of the signals that are not ignored.
[[nodiscard]] inline sigset_t withoutIgnored(std::span<const int> signals) noexcept {
    sigset_t set;
    ::sigemptyset(&set);
    for (const int signal : signals)
        if (!isSignalIgnored(signal))
            ::sigaddset(&set, signal);
    return set;
}

/// Blocks signals on the calling thread, and on those that it starts from now on, to the end of the process.
/// Ignored ones stay as they are.
inline void blockForGood(std::span<const int> signals) noexcept {
    const sigset_t set = withoutIgnored(signals);
    ::pthread_sigmask(SIG_BLOCK, &set, nullptr);
}

/// Blocks signals on the calling thread, and brings back what was blocked before. Threads that are started
/// meanwhile have them blocked for good.
class BlockedSignals {
public:
    explicit BlockedSignals(const sigset_t &signals) noexcept {
        ::pthread_sigmask(SIG_BLOCK, &signals, &_before);
    }
    ~BlockedSignals() { ::pthread_sigmask(SIG_SETMASK, &_before, nullptr); }
    BlockedSignals(const BlockedSignals &) = delete;
    BlockedSignals &operator=(const BlockedSignals &) = delete;

private:
    sigset_t _before{};
};

} // namespace ZorvaTouch::Host
