#pragma once

#include "Plugin/BoundaryObject.h"

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <mutex>
#include <span>
#include <string>
#include <vector>

/// Objects of a host that does just what a test says.
namespace ZorvaTouch::Testing {

/// A boundary object that knows how many references there are to it.
template <typename Derived, typename Object> class CountingObject : public BoundaryObject<Derived, Object> {
public:
    [[nodiscard]] std::uint32_t references() const { return _references; }

protected:
    using Base = BoundaryObject<Derived, Object>;
    using Base::Base;

    static void retain(Object *object) noexcept {
        ++Base::of(object)._references;
        Base::retain(object);
    }
    static void release(Object *object) noexcept {
        --Base::of(object)._references;
        Base::release(object);
    }

private:
    std::atomic<std::uint32_t> _references = 1;
};

/// A value that cannot be read to its end: an array whose one element is itself. Not counted.
///
/// Threads: any.
class EndlessValue final : public ZorvaValue {
public:
    EndlessValue() : ZorvaValue{&kTable} {}

private:
    static const ZorvaValueTable kTable;
};

/// A serial queue that runs nothing until it is told to, on the thread that tells it.
///
/// Threads: any.
class ManualQueue final : public CountingObject<ManualQueue, ZorvaQueue> {
public:
    [[nodiscard]] static Ref<ManualQueue> create() { return Ref<ManualQueue>::adopt(new ManualQueue); }

    /// Runs what waits, and what comes meanwhile.
    /// @return How many that were.
    std::size_t runAll();
    /// Discards what waits, as a queue does at its end.
    std::size_t discardAll();
    [[nodiscard]] std::size_t waiting() const;
    [[nodiscard]] std::size_t submitted() const; ///< in all, refused ones too
    void refuse(bool isRefused) { _isRefused = isRefused; }

private:
    friend BoundaryObject<ManualQueue, ZorvaQueue>;
    friend CountingObject<ManualQueue, ZorvaQueue>;
    struct Job {
        ZorvaFunction run, discard;
        void *context;
    };
    static const ZorvaQueueTable kTable;

    ManualQueue() : CountingObject(&kTable) {}
    ~ManualQueue() { discardAll(); }
    [[nodiscard]] bool take(Job &job);
    static ZorvaBoolean submit(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard,
                               void *context) noexcept;

    std::atomic<bool> _isRefused = false;
    mutable std::mutex _lock;
    std::deque<Job> _jobs;
    std::size_t _submitted = 0;
};

/// A device that can do anything on the input-report thread.
///
/// Threads: any.
class ProbeDevice final : public CountingObject<ProbeDevice, ZorvaDevice> {
public:
    [[nodiscard]] static Ref<ProbeDevice> create() { return Ref<ProbeDevice>::adopt(new ProbeDevice); }

    /// What a thread finds registered when it is its turn.
    struct Registration {
        std::span<std::uint8_t> buffer;
        ZorvaInputReportCallback callback = nullptr;
        void *context = nullptr;
    };
    using Work = std::function<void(const Registration &registration)>;

    /// Runs something on the input-report thread, once the device is scheduled there, and waits for its end.
    void runOnInputThread(Work work);
    /// The same for one report, passed on with just these arguments.
    void report(std::uint32_t type, std::uint32_t reportId, const std::uint8_t *bytes, std::size_t length,
                std::uint64_t timestamp);

    /// What the service called, in order: "open 5", "close 5", "register 512", "schedule MODE",
    /// "unschedule MODE", "unregister 512".
    [[nodiscard]] std::vector<std::string> calls() const;
    [[nodiscard]] Registration registration() const;
    /// The loop and source that it is scheduled on now.
    [[nodiscard]] bool isScheduled() const;

    /// What `copyProperty` returns: borrowed, handed over as it is.
    std::atomic<const ZorvaValue *> property = nullptr;
    std::atomic<ZorvaStatus> openStatus = ZORVA_STATUS_SUCCESS;
    /// Status and length that every request for a feature report is answered with; nothing is stored.
    std::atomic<ZorvaStatus> featureStatus = ZORVA_STATUS_UNSUPPORTED;
    std::atomic<std::size_t> featureLength = 0;

private:
    friend BoundaryObject<ProbeDevice, ZorvaDevice>;
    friend CountingObject<ProbeDevice, ZorvaDevice>;
    struct Entries;
    static const ZorvaDeviceTable kTable;

    ProbeDevice() : CountingObject(&kTable) {}
    ~ProbeDevice() = default;
    void note(std::string call);
    static void perform(void *device) noexcept;

    mutable std::mutex _lock;
    std::condition_variable _changed;
    std::vector<std::string> _calls;
    Registration _registration;
    Ref<ZorvaRunLoop> _loop;
    std::uint64_t _source = 0;
    std::deque<Work> _work;
    std::size_t _workEnded = 0, _workGiven = 0;
};

/// The place where a device of a test is attached. It has no event system.
class ProbeService final : public CountingObject<ProbeService, ZorvaService> {
public:
    /// @param device  What `createDevice` retains and returns; null for none.
    [[nodiscard]] static Ref<ProbeService> create(ZorvaDevice *device) {
        return Ref<ProbeService>::adopt(new ProbeService(device));
    }

private:
    friend BoundaryObject<ProbeService, ZorvaService>;
    friend CountingObject<ProbeService, ZorvaService>;
    static const ZorvaServiceTable kTable;

    explicit ProbeService(ZorvaDevice *device)
        : CountingObject(&kTable), _device(Ref<ZorvaDevice>::retain(device)) {}
    ~ProbeService() = default;
    static ZorvaDevice *createDevice(ZorvaService *service) noexcept;

    const Ref<ZorvaDevice> _device;
};

} // namespace ZorvaTouch::Testing
