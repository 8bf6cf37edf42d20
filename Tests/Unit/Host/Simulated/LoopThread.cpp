#include "Tests/Unit/Host/Simulated/LoopThread.h"

#include <utility>

namespace ZorvaTouch::Simulated {

LoopThread::LoopThread(Step begin, Step end)
    : _begin(std::move(begin)), _end(std::move(end)), _hasBegun(Host::processPlatform().createSemaphore()) {
    _thread = Host::processPlatform().startThread("test-loop", [this] { run(); });
    _hasBegun->wait();
}

void LoopThread::run() {
    _loop = Host::processPlatform().createRunLoop();
    _begin(_loop->boundary());
    _hasBegun->signal();
    while (_outcome == Host::RunOutcome::HandledSource)
        _outcome = _loop->runOneSource("mode");
    _end(_loop->boundary());
}

void LoopThread::stop() {
    if (!_thread)
        return;
    _loop->stop();
    join();
}

Host::RunOutcome LoopThread::join() {
    if (const auto thread = std::move(_thread))
        thread->join();
    return _outcome;
}

} // namespace ZorvaTouch::Simulated
