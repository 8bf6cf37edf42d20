#pragma once

#include <atomic>
#include <thread>

namespace ZorvaTouch::Bench {

/// Keeps one processor busy while it lives, at the usual policy.
class BusyThread {
public:
    BusyThread()
        : _thread([this] {
              while (!_end.load(std::memory_order_relaxed)) {
              }
          }) {}
    ~BusyThread() {
        _end = true;
        _thread.join();
    }
    BusyThread(const BusyThread &) = delete;
    BusyThread &operator=(const BusyThread &) = delete;

private:
    std::atomic<bool> _end{false};
    std::thread _thread;
};

} // namespace ZorvaTouch::Bench
