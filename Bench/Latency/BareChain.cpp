#include "Bench/Latency/Chain.h"
#include "Bench/Latency/Link.h"
#include "Bench/Rounds.h"
#include "Host/Interface/Platform.h"

#include <asio/executor_work_guard.hpp>
#include <asio/io_context.hpp>
#include <asio/posix/stream_descriptor.hpp>
#include <asio/post.hpp>

#include <unistd.h>

#include <array>
#include <atomic>
#include <thread>

namespace ZorvaTouch::Bench {
namespace {

constexpr int kPriority = 63;

/// A thread that runs one context.
class ContextThread {
public:
    explicit ContextThread(bool realTime)
        : _work(context.get_executor()), _thread([this, realTime] {
              if (realTime)
                  static_cast<void>(Host::processPlatform().setRoundRobinPriority(kPriority));
              context.run();
          }) {}
    ~ContextThread() {
        context.stop();
        _thread.join();
    }
    ContextThread(const ContextThread &) = delete;
    ContextThread &operator=(const ContextThread &) = delete;

    asio::io_context context{1};

private:
    asio::executor_work_guard<asio::io_context::executor_type> _work;
    std::thread _thread;
};

class BareChain final : public Chain {
public:
    BareChain(const Link &link, bool realTime)
        : _link(link), _queue(realTime), _input(realTime),
          _descriptor(_input.context, ::dup(link.readEnd())) {
        asio::post(_input.context, [this] { waitForReport(); });
    }

    void watch(Journey *journey) override { _journey.store(journey); }

private:
    void waitForReport() {
        _descriptor.async_wait(asio::posix::descriptor_base::wait_read,
                               [this](const asio::error_code &error) {
                                   if (error || !handleReport())
                                       return;
                                   waitForReport();
                               });
    }

    bool handleReport() {
        std::array<std::uint8_t, 512> buffer;
        if (_link.read(buffer) == 0)
            return false;
        Journey *const journey = _journey.load();
        journey->read(wallNs());
        asio::post(_queue.context, [journey] { journey->arrived(wallNs()); });
        return true;
    }

    const Link &_link;
    std::atomic<Journey *> _journey{nullptr};
    ContextThread _queue;
    ContextThread _input;
    asio::posix::stream_descriptor _descriptor;
};

} // namespace

std::unique_ptr<Chain> makeBareChain(const Link &link, bool realTime) {
    return std::make_unique<BareChain>(link, realTime);
}

} // namespace ZorvaTouch::Bench
