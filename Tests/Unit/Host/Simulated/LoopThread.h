#pragma once

#include "Host/Interface/Platform.h"

#include <functional>
#include <memory>

namespace ZorvaTouch::Simulated {

/// A thread with the system's run loop, as a service has one: it runs the mode "mode" until it is stopped or
/// finished.
class LoopThread {
public:
    using Step = std::function<void(ZorvaRunLoop *loop)>;

    /// Returns when `begin` has run on the thread. `end` runs there after the last pass.
    LoopThread(Step begin, Step end);
    /// Stops.
    ~LoopThread() { stop(); }
    LoopThread(const LoopThread &) = delete;
    LoopThread &operator=(const LoopThread &) = delete;

    void stop();
    /// Waits until the loop ends by itself.
    /// @return Why it did.
    Host::RunOutcome join();

private:
    void run();

    const Step _begin, _end;
    const std::unique_ptr<Host::Semaphore> _hasBegun;
    std::shared_ptr<Host::RunLoop> _loop;
    Host::RunOutcome _outcome = Host::RunOutcome::HandledSource;
    std::unique_ptr<Host::Thread> _thread;
};

} // namespace ZorvaTouch::Simulated
