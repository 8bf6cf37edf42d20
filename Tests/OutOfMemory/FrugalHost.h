#pragma once

#include "Host/Runtime/SystemPlatform.h"
#include "Plugin/BoundaryObject.h"

#include <array>
#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <memory>
#include <mutex>
#include <span>
#include <string_view>
#include <utility>

/// A host whose own part of a call allocates nothing, so that what is refused is the plug-in's.
namespace ZorvaTouch::Testing {

/// Logs everything to nowhere and counts error records.
class CountedLogs final : public Ports::LogProvider {
public:
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;
    [[nodiscard]] std::uint64_t errors() const { return *_errors; }

private:
    std::shared_ptr<std::atomic<std::uint64_t>> _errors = std::make_shared<std::atomic<std::uint64_t>>(0);
};

/// The system's platform but for logs and priorities.
class FrugalPlatform final : public Host::Platform {
public:
    FrugalPlatform();

    [[nodiscard]] Ports::LogProvider &logs() noexcept override { return counted; }
    [[nodiscard]] Ports::Clock &clock() noexcept override { return _system.clock(); }
    [[nodiscard]] Host::TraceSink &trace() noexcept override { return _system.trace(); }
    [[nodiscard]] std::unique_ptr<Host::Semaphore> createSemaphore() override {
        return _system.createSemaphore();
    }
    [[nodiscard]] std::unique_ptr<Host::Thread> startThread(const char *name,
                                                            std::function<void()> body) override {
        return _system.startThread(name, std::move(body));
    }
    [[nodiscard]] std::shared_ptr<Host::RunLoop> createRunLoop() override { return _system.createRunLoop(); }
    [[nodiscard]] int setRoundRobinPriority(int) noexcept override { return 0; }

    CountedLogs counted;

private:
    const std::unique_ptr<std::FILE, int (*)(std::FILE *)> _nowhere;
    Host::SystemPlatform _system; ///< its run loops log that they refuse
};

/// A queue of a few places that runs its jobs when it is asked to.
class FrugalQueue final : public BoundaryObject<FrugalQueue, ZorvaQueue> {
public:
    [[nodiscard]] static Ref<FrugalQueue> create() { return Ref<FrugalQueue>::adopt(new FrugalQueue); }
    std::size_t runAll();

private:
    friend BoundaryObject<FrugalQueue, ZorvaQueue>;
    struct Job {
        ZorvaFunction run, discard;
        void *context;
    };
    static const ZorvaQueueTable kTable;

    FrugalQueue() : BoundaryObject(&kTable) {}
    ~FrugalQueue();
    static ZorvaBoolean submit(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard,
                               void *context) noexcept;

    std::mutex _lock;
    std::array<Job, 64> _jobs{};
    std::size_t _count = 0;
};

/// A device with one property of its own; it delivers reports when it is asked to.
class FrugalDevice final : public BoundaryObject<FrugalDevice, ZorvaDevice> {
public:
    [[nodiscard]] static Ref<FrugalDevice> create() { return Ref<FrugalDevice>::adopt(new FrugalDevice); }

    /// Delivers one report on the input thread, inside `around`, once the device is scheduled there, and
    /// waits for it.
    using Around = std::function<void(const std::function<void()> &deliver)>;
    void deliver(std::span<const std::uint8_t> report, const Around &around);

    const ZorvaValue *property = nullptr; ///< borrowed
    std::atomic<std::uint64_t> propertyWrites = 0;

private:
    friend BoundaryObject<FrugalDevice, ZorvaDevice>;
    struct Entries;
    static const ZorvaDeviceTable kTable;

    FrugalDevice();
    ~FrugalDevice() = default;

    std::mutex _lock;
    std::condition_variable _isScheduled;
    ZorvaInputReportCallback _callback = nullptr;
    void *_context = nullptr;
    Ref<ZorvaRunLoop> _loop;
    std::uint64_t _source = 0;
    std::span<const std::uint8_t> _report;
    const Around *_around = nullptr;
    std::unique_ptr<Host::Semaphore> _isDelivered;
};

/// An event system of one service; it sends events when it is asked to.
class FrugalEventClient final : public BoundaryObject<FrugalEventClient, ZorvaEventClient> {
public:
    [[nodiscard]] static Ref<FrugalEventClient> create() {
        return Ref<FrugalEventClient>::adopt(new FrugalEventClient);
    }

    /// Only on the input thread.
    void send(const ZorvaEvent *event) const { _callback(_context, event); }

    ZorvaService *found = nullptr; ///< what it finds; borrowed

private:
    friend BoundaryObject<FrugalEventClient, ZorvaEventClient>;
    struct Entries;
    static const ZorvaEventClientTable kTable;

    FrugalEventClient() : BoundaryObject(&kTable) {}
    ~FrugalEventClient() = default;

    ZorvaEventClientCallback _callback = nullptr; ///< the input thread's
    void *_context = nullptr;
};

/// The place where the device is attached, and the event system.
class FrugalService final : public BoundaryObject<FrugalService, ZorvaService> {
public:
    [[nodiscard]] static Ref<FrugalService> create(FrugalDevice &device, FrugalEventClient &client) {
        return Ref<FrugalService>::adopt(new FrugalService(device, client));
    }

private:
    friend BoundaryObject<FrugalService, ZorvaService>;
    static const ZorvaServiceTable kTable;

    FrugalService(FrugalDevice &device, FrugalEventClient &client)
        : BoundaryObject(&kTable), _device(Ref<ZorvaDevice>::retain(&device)),
          _client(Ref<ZorvaEventClient>::retain(&client)) {}
    ~FrugalService() = default;

    const Ref<ZorvaDevice> _device;
    const Ref<ZorvaEventClient> _client;
};

} // namespace ZorvaTouch::Testing
