#pragma once

#include "Host/Objects/EventSystem.h"
#include "Tests/Unit/Host/Linux/IioFakes.h"
#include "Tests/Unit/Host/Simulated/LoopThread.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>

namespace ZorvaTouch::Linux::Tests {

/// A client of accelerometers on a thread with a run loop, as a service has one, scheduled for as long as
/// this lives. It writes each sample into a story: "0 0 1 at 77".
class AccelClient {
public:
    /// @param intervalUs  Set before it is scheduled, on the first accelerometer there is.
    AccelClient(const std::shared_ptr<Host::EventSystem> &system, Story &story,
                std::optional<double> intervalUs = std::nullopt);
    ~AccelClient();
    AccelClient(const AccelClient &) = delete;
    AccelClient &operator=(const AccelClient &) = delete;

    /// Accelerometers that it finds.
    [[nodiscard]] std::size_t matchCount();
    [[nodiscard]] std::uint64_t lastTimestamp() const { return _lastTimestamp; }

private:
    static void hear(void *context, const ZorvaEvent *event) noexcept;
    void begin(ZorvaRunLoop *loop, std::optional<double> intervalUs);
    void end(ZorvaRunLoop *loop);
    void setInterval(double intervalUs);

    Story &_story;
    const Ref<ZorvaEventClient> _client;
    std::atomic<std::uint64_t> _lastTimestamp = 0;
    std::uint64_t _idleSource = 0; ///< keeps the loop going while there is no accelerometer
    std::optional<Simulated::LoopThread> _thread;
};

} // namespace ZorvaTouch::Linux::Tests
