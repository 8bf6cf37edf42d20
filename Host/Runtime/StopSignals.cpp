#include "Host/Runtime/StopSignals.h"

#include <pthread.h>
#include <signal.h>

#include <array>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

constexpr std::array<int, 3> kStopSignals{SIGINT, SIGTERM, SIGHUP};

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

StopSignals::StopSignals(std::function<void()> onStop)
    : _watch(kStopSignals, [onStop = std::move(onStop), isFirst = true](int signal) mutable {
          if (std::exchange(isFirst, false))
              onStop();
          else
              raiseAsEver(signal);
      }) {}

} // namespace ZorvaTouch::Host
