#include "Host/Runtime/SerialQueue.h"

#include "Host/Runtime/SerialQueueState.h"
#include "Host/Runtime/SystemSemaphore.h"
#include "Host/Runtime/SystemThread.h"
#include "Shared/LogNames.h"

#include <utility>

namespace ZorvaTouch::Host {

SerialQueue::SerialQueue(const char *threadName, int roundRobinPriority)
    : _state(*new State(threadName ? threadName : "",
                        processPlatform().logs().openLog(kLogSubsystem, "SerialQueue"))),
      _stateReference(Ref<ZorvaQueue>::adopt(&_state)),
      _thread(startSystemThread(threadName, [state = &_state, reference = _stateReference,
                                             roundRobinPriority] { state->serve(roundRobinPriority); })) {}

SerialQueue::~SerialQueue() {
    _state.end();
    if (!_thread->isCurrent())
        _thread->join();
}

void SerialQueue::submit(std::function<void()> function) {
    Job job(std::move(function));
    (void)_state.submit(job); // it has not ended: that is the destructor's
}

void SerialQueue::drain() {
    if (_thread->isCurrent()) {
        _state.logError("drain was called on the queue itself");
        return;
    }
    SystemSemaphore isDone;
    const ZorvaFunction signal = [](void *semaphore) { static_cast<SystemSemaphore *>(semaphore)->signal(); };
    Job job(signal, signal, &isDone);
    if (_state.submit(job))
        isDone.wait();
}

ZorvaQueue *SerialQueue::boundary() noexcept { return &_state; }

} // namespace ZorvaTouch::Host
