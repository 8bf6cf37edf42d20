#pragma once

#include <csignal>
#include <pthread.h>

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
