#include "Host/Runtime/SystemThread.h"

#include "Host/Runtime/Signals.h"

#include <pthread.h>
#include <sched.h>

#include <cstddef>
#include <string>
#include <system_error>
#include <thread>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

constexpr std::size_t kLongestName = 15; ///< the system refuses longer ones

class SystemThread final : public Thread {
public:
    SystemThread(std::string name, std::function<void()> body)
        : _thread([name = std::move(name), body = std::move(body)] {
              ::pthread_setname_np(::pthread_self(), name.c_str());
              body();
          }) {}
    ~SystemThread() override {
        if (_thread.joinable())
            _thread.detach();
    }
    SystemThread(const SystemThread &) = delete;
    SystemThread &operator=(const SystemThread &) = delete;

    void join() noexcept override { _thread.join(); }
    [[nodiscard]] bool isCurrent() const noexcept override {
        return _thread.get_id() == std::this_thread::get_id();
    }

private:
    std::thread _thread;
};

} // namespace

std::unique_ptr<Thread> startSystemThread(const char *name, std::function<void()> body) {
    const BlockedSignals blocked(allSignals()); // they are for the program's own threads
    const std::string shortName = std::string(name ? name : "").substr(0, kLongestName);
    try {
        return std::make_unique<SystemThread>(shortName, std::move(body));
    } catch (const std::system_error &error) {
        throw std::system_error(error.code(), "cannot start the thread " + shortName +
                                                  "; raise the limit of threads (ulimit -u, TasksMax=) or of "
                                                  "memory (ulimit -v, LimitAS=)");
    }
}

int setRoundRobinPriorityOfThisThread(int priority) noexcept {
    sched_param parameters{};
    parameters.sched_priority = priority;
    return ::pthread_setschedparam(::pthread_self(), SCHED_RR, &parameters);
}

} // namespace ZorvaTouch::Host
