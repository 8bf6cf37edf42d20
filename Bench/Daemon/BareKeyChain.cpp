#include "Bench/Daemon/KeyChain.h"
#include "Host/Interface/Platform.h"

#include <sys/epoll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <cstdint>
#include <ctime>
#include <thread>

namespace ZorvaTouch::Bench {
namespace {

constexpr int kPriority = 63;

int epollFor(int descriptor) {
    const int set = ::epoll_create1(EPOLL_CLOEXEC);
    epoll_event event{.events = EPOLLIN, .data = {}};
    ::epoll_ctl(set, EPOLL_CTL_ADD, descriptor, &event);
    return set;
}

double cpuNsOf(pthread_t thread) {
    clockid_t clock{};
    timespec time{};
    ::pthread_getcpuclockid(thread, &clock);
    ::clock_gettime(clock, &time);
    return static_cast<double>(time.tv_sec) * 1e9 + static_cast<double>(time.tv_nsec);
}

class BareKeyChain final : public KeyChain {
public:
    BareKeyChain(const Link &link, bool realTime)
        : _link(link), _realTime(realTime), _keys(::eventfd(0, EFD_CLOEXEC)),
          _keyThread([this] { pressKeys(); }), _inputThread([this] { readReports(); }) {}
    ~BareKeyChain() override {
        _inputThread.join(); // the link has been shut down
        _isOver = true;
        wakeKeyThread();
        _keyThread.join();
        ::close(_keys);
    }
    BareKeyChain(const BareKeyChain &) = delete;
    BareKeyChain &operator=(const BareKeyChain &) = delete;

    void watch(KeyJourney *journey) override { _journey = journey; }
    double cpuNs() override {
        return cpuNsOf(_inputThread.native_handle()) + cpuNsOf(_keyThread.native_handle());
    }
    void waitForReports(std::size_t reports) const override {
        for (std::size_t read = 0; (read = _read.load(std::memory_order_acquire)) < reports;)
            _read.wait(read);
    }

private:
    void beginThread() const {
        if (_realTime)
            static_cast<void>(Host::processPlatform().setRoundRobinPriority(kPriority));
    }
    void wakeKeyThread() const {
        const std::uint64_t one = 1;
        static_cast<void>(!::write(_keys, &one, sizeof one));
    }

    void readReports() {
        beginThread();
        const int set = epollFor(_link.readEnd());
        epoll_event event{};
        std::array<std::uint8_t, 512> buffer;
        while (::epoll_wait(set, &event, 1, -1) == 1 && _link.read(buffer) != 0) {
            const std::size_t number = _read.fetch_add(1, std::memory_order_release);
            _read.notify_one();
            if ((number + 1) % kReportsForAKey == 0) {
                _trigger = number;
                wakeKeyThread();
            }
        }
        ::close(set);
    }

    void pressKeys() {
        beginThread();
        const int set = epollFor(_keys);
        epoll_event event{};
        while (::epoll_wait(set, &event, 1, -1) == 1 && !_isOver) {
            std::uint64_t count = 0;
            static_cast<void>(!::read(_keys, &count, sizeof count));
            if (KeyJourney *const journey = _journey.load())
                journey->pressed(_trigger);
        }
        ::close(set);
    }

    const Link &_link;
    const bool _realTime;
    const int _keys;
    std::atomic<KeyJourney *> _journey{nullptr};
    std::atomic<std::size_t> _read{0}, _trigger{0};
    std::atomic<bool> _isOver{false};
    std::thread _keyThread, _inputThread;
};

} // namespace

std::unique_ptr<KeyChain> makeBareKeyChain(const Link &link, bool realTime) {
    return std::make_unique<BareKeyChain>(link, realTime);
}

} // namespace ZorvaTouch::Bench
