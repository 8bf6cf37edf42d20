#include "Tools/Hosting/SessionPlatform.h"

#include <utility>

namespace ZorvaTouch::Tools {

/// Tells of the first pass.
class SessionPlatform::WatchedRunLoop final : public Host::RunLoop {
public:
    WatchedRunLoop(std::shared_ptr<Host::RunLoop> loop, std::shared_ptr<std::latch> isServing)
        : _loop(std::move(loop)), _isServing(std::move(isServing)) {}
    ~WatchedRunLoop() override { tell(); }
    WatchedRunLoop(const WatchedRunLoop &) = delete;
    WatchedRunLoop &operator=(const WatchedRunLoop &) = delete;

    [[nodiscard]] Host::RunOutcome runOneSource(std::string_view mode) override {
        tell();
        return _loop->runOneSource(mode);
    }
    void stop() noexcept override { _loop->stop(); }
    void perform(std::string_view mode, std::function<void()> closure) override {
        _loop->perform(mode, std::move(closure));
    }
    [[nodiscard]] ZorvaRunLoop *boundary() noexcept override { return _loop->boundary(); }

private:
    void tell() noexcept {
        if (const auto isServing = std::exchange(_isServing, nullptr))
            isServing->count_down();
    }

    const std::shared_ptr<Host::RunLoop> _loop;
    std::shared_ptr<std::latch> _isServing; ///< null once told
};

SessionPlatform::SessionPlatform(std::shared_ptr<Ports::LogProvider> logs, Ports::Clock *clock)
    : _logs(std::move(logs)), _system(Host::processPlatform()), _clock(clock ? *clock : _system.clock()) {
    Host::setProcessPlatform(this);
}

SessionPlatform::~SessionPlatform() { Host::setProcessPlatform(nullptr); }

std::unique_ptr<Host::Semaphore> SessionPlatform::createSemaphore() { return _system.createSemaphore(); }

std::unique_ptr<Host::Thread> SessionPlatform::startThread(const char *name, std::function<void()> body) {
    return _system.startThread(name, std::move(body));
}

std::shared_ptr<Host::RunLoop> SessionPlatform::createRunLoop() {
    const auto isServing = std::make_shared<std::latch>(1);
    auto loop = std::make_shared<WatchedRunLoop>(_system.createRunLoop(), isServing);
    const std::lock_guard lock(_lock);
    _isServing = isServing;
    return loop;
}

void SessionPlatform::waitUntilServing() {
    std::shared_ptr<std::latch> isServing;
    {
        const std::lock_guard lock(_lock);
        isServing = _isServing;
    }
    if (isServing)
        isServing->wait();
}

int SessionPlatform::setRoundRobinPriority(int priority) noexcept {
    return _hasRealTime ? _system.setRoundRobinPriority(priority) : 0;
}

} // namespace ZorvaTouch::Tools
