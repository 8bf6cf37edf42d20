#pragma once

#include "Host/Interface/Platform.h"
#include "Plugin/Ref.h"

#include <functional>
#include <memory>

namespace ZorvaTouch::Host {

/// A queue with a thread of its own that runs what is submitted, in order and one at a time.
///
/// A function that throws is told in the log, and the next one runs.
///
/// Threads: any; made and destroyed by one.
class SerialQueue {
public:
    /// @param threadName          At most 15 characters, for those who list threads.
    /// @param roundRobinPriority  Of the round-robin policy; 0 leaves the thread as the system made it. One
    ///                            that the system does not grant is told in the log, and the queue works.
    /// @throws std::system_error  There is no thread to be had.
    explicit SerialQueue(const char *threadName, int roundRobinPriority = 0);
    /// Lets the function that runs come to its end, has the others discarded on the queue's thread, and waits
    /// for both. On the queue's own thread it does not wait: the thread ends after that function.
    ~SerialQueue();
    SerialQueue(const SerialQueue &) = delete;
    SerialQueue &operator=(const SerialQueue &) = delete;

    /// @throws std::bad_alloc
    void submit(std::function<void()> function);

    /// Waits until all that was submitted before has run. On the queue itself, where it would wait for
    /// itself, it is refused with a line in the log.
    /// @throws std::bad_alloc, std::system_error
    void drain();

    /// The queue as services see it. Borrowed; who keeps it beyond the queue's life finds that it refuses
    /// whatever is submitted.
    [[nodiscard]] ZorvaQueue *boundary() noexcept;

private:
    class State;

    State &_state;
    const Ref<ZorvaQueue> _stateReference;
    const std::unique_ptr<Thread> _thread;
};

} // namespace ZorvaTouch::Host
