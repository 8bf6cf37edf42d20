#include "Bench/Daemon/KeyChain.h"
#include "Bench/Latency/BenchPlatform.h"
#include "Host/Linux/HidrawNode.h"
#include "Tools/Daemon/Surface.h"

#include <atomic>
#include <cerrno>
#include <cstdint>
#include <ctime>
#include <thread>

namespace ZorvaTouch::Bench {
namespace {

using namespace Tools;

constexpr int kPriority = 63;
constexpr std::uint64_t kReportPeriodNs = kReportPeriodMs * 1'000'000;

/// Time that goes on by a period with each report, however fast they come.
class ReportClock final : public Ports::Clock {
public:
    std::uint64_t nowTicks() noexcept override { return now.load(std::memory_order_acquire); }
    Ports::TimeBase timeBase() noexcept override { return {1, 1}; }
    void sleepMicroseconds(std::uint64_t) noexcept override {}

    std::atomic<std::uint64_t> now{0};
};

class DaemonPlatform final : public Host::Platform {
public:
    explicit DaemonPlatform(bool realTime) : _bench(realTime) { Host::setProcessPlatform(this); }
    ~DaemonPlatform() override { Host::setProcessPlatform(nullptr); }
    DaemonPlatform(const DaemonPlatform &) = delete;
    DaemonPlatform &operator=(const DaemonPlatform &) = delete;

    Ports::LogProvider &logs() noexcept override { return _bench.logs(); }
    Ports::Clock &clock() noexcept override { return reportClock; }
    Host::TraceSink &trace() noexcept override { return _bench.trace(); }
    std::unique_ptr<Host::Semaphore> createSemaphore() override { return _bench.createSemaphore(); }
    std::unique_ptr<Host::Thread> startThread(const char *name, std::function<void()> body) override {
        return _bench.startThread(name, std::move(body));
    }
    std::shared_ptr<Host::RunLoop> createRunLoop() override { return _bench.createRunLoop(); }
    int setRoundRobinPriority(int priority) noexcept override {
        return _bench.setRoundRobinPriority(priority);
    }

    ReportClock reportClock;

private:
    BenchPlatform _bench;
};

/// A node at the other end of a link.
class LinkNode final : public Linux::HidrawNode {
public:
    explicit LinkNode(const Link &link) : _link(link) {}

    int descriptor() const noexcept override { return _link.readEnd(); }
    Linux::IoResult read(std::span<std::uint8_t> buffer) noexcept override {
        const std::size_t count = _link.read(buffer);
        return {.count = count, .errorNumber = count == 0 ? EIO : 0};
    }
    Linux::IoResult deviceNumber(std::uint64_t &) noexcept override { return {}; }
    Linux::IoResult lock() noexcept override { return {}; }
    Linux::IoResult info(Linux::HidrawInfo &) noexcept override { return {}; }
    Linux::IoResult text(Linux::HidrawText, std::span<std::uint8_t>) noexcept override { return {}; }
    Linux::IoResult reportDescriptor(std::span<std::uint8_t>) noexcept override { return {}; }
    Linux::IoResult featureReport(std::span<std::uint8_t>) noexcept override { return {.errorNumber = EIO}; }

private:
    const Link &_link;
};

/// Where keys are handed over; it knows by the event before which report pressed them.
class KeyEnd final : public DaemonListener {
public:
    std::atomic<KeyJourney *> journey{nullptr};

    void onEvent(const SurfaceName &, const HostEvent &event) noexcept override {
        _report = static_cast<std::size_t>(event.integerField(kDigitizerFieldFrameNumber).value_or(0));
    }

    void press() noexcept {
        if (KeyJourney *const current = journey)
            current->pressed(_report);
    }

private:
    std::size_t _report = 0; ///< number of the one that made the last event
};

class KeyEndOutput final : public Linux::KeyOutput {
public:
    explicit KeyEndOutput(KeyEnd &end) : _end(end) {}
    std::optional<Linux::SystemFailure> press(std::uint16_t) noexcept override {
        _end.press();
        return std::nullopt;
    }
    std::optional<Linux::SystemFailure> release(std::uint16_t) noexcept override { return std::nullopt; }

private:
    KeyEnd &_end;
};

class DaemonChain final : public KeyChain {
public:
    DaemonChain(const Link &link, bool realTime)
        : _platform(realTime), _queue("bench-keys", realTime ? kPriority : 0),
          _keyboard([this] { return std::make_unique<KeyEndOutput>(_end); }, _end, log()),
          _surroundings{.plugIn = openPlugIn(ZORVA_BENCH_PLUGIN),
                        .events = nullptr,
                        .keyQueue = _queue,
                        .keyboard = _keyboard,
                        .keyMap = {},
                        .listener = _end,
                        .loop = _loop,
                        .log = log()},
          _surface(
              _surroundings, {.id = "bench", .node = "bench", .name = "bench"},
              [this, &link](const std::shared_ptr<Linux::HidrawObserver> &observer) {
                  _device = Linux::HidrawDevice::create(
                      [&link] { return Linux::OpenedNode{.node = std::make_shared<LinkNode>(link)}; },
                      observer);
                  return _device;
              },
              _keyboard, nullptr, [](const std::string &) {}) {}

    void watch(KeyJourney *journey) override { _end.journey = journey; }
    void advanceTo(std::size_t report) override {
        _platform.reportClock.now = (report + 1) * kReportPeriodNs;
    }
    double cpuNs() override { return processCpuNs() - threadCpuNs(); }
    void waitForReports(std::size_t reports) const override {
        while (_device->counters().reports < reports)
            std::this_thread::yield();
    }

private:
    static DaemonLog log() { return {Ports::silentLogProvider(), "Bench"}; }

    DaemonPlatform _platform;
    KeyEnd _end;
    Linux::MainLoop _loop;
    Host::SerialQueue _queue;
    Keyboard _keyboard;
    SurfaceSurroundings _surroundings;
    Ref<Linux::HidrawDevice> _device;
    Surface _surface;
};

} // namespace

std::unique_ptr<KeyChain> makeDaemonChain(const Link &link, bool realTime) {
    return std::make_unique<DaemonChain>(link, realTime);
}

} // namespace ZorvaTouch::Bench
