#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Linux/DescriptorSource.h"
#include "Host/Linux/HidrawNode.h"
#include "Host/Linux/SystemFailure.h"
#include "Plugin/BoundaryObject.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Util/PropertyValue.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>

namespace ZorvaTouch::Linux {

/// The device is gone, or was never there.
inline constexpr ZorvaStatus kStatusNoDevice = 0xE00002C0;

/// Hears what a device has no other way to say.
///
/// Threads: whichever it happens on: the input thread for reading, the host's for opening. No lock is held;
///          it may call the device back.
class HidrawObserver {
public:
    virtual ~HidrawObserver() = default;
    /// The device sends no more: it was unplugged, or does nothing but fail. Its node is closed and no longer
    /// on the run loop. Once for each open.
    virtual void onGone(const SystemFailure &reason) noexcept = 0;
    /// Opening failed, or one read did.
    virtual void onFailure(const SystemFailure &failure) noexcept = 0;
    /// A report is about to be handed to the callback. Must be quick.
    /// @param timestamp  Host ticks.
    /// @param report     Report ID first. Borrowed for the call.
    virtual void onReport(std::uint64_t /*timestamp*/, std::span<const std::uint8_t> /*report*/) noexcept {}
    /// The device was taken off its run loop: whoever had scheduled it, or scheduled it anew, listens no
    /// more.
    virtual void onUnscheduled() noexcept {}
};

/// What has happened to a device so far.
struct HidrawCounters {
    std::uint64_t reports = 0;  ///< reports handed to the callback
    std::uint64_t dropped = 0;  ///< reports that came while there was no callback
    std::uint64_t failures = 0; ///< reads that failed and did not say that the device is gone
};

/// A HID device through its hidraw node.
///
/// It reads one report in each pass of the run loop, straight into the registered buffer. At removal the
/// kernel still hands out the reports that were waiting; those are delivered before the end is noticed.
///
/// A device that is gone has closed its node: feature reports fail with `kStatusNoDevice`, properties stay,
/// and `open` tries anew. Open, close, schedule and unschedule may come in any order; reports flow while it
/// is both open and scheduled.
///
/// A scheduled device keeps itself until it is unscheduled, so that a pass never finds it gone.
///
/// Threads:  as the boundary says. A feature report, on whichever thread, keeps the node open until the
/// device
///           has answered, also when the device is closed meanwhile; nobody waits for it.
/// Realtime: delivering a report takes three short locks and allocates no memory.
class HidrawDevice final : public BoundaryObject<HidrawDevice, ZorvaDevice> {
public:
    /// Reads that fail one after another until the device counts as gone.
    static constexpr unsigned kFailuresUntilGone = 8;

    /// A closed device. Its reports are stamped by the process's platform.
    /// @param opener    Opens its node.
    /// @param observer  May be null.
    /// @throws std::bad_alloc, std::system_error
    [[nodiscard]] static Ref<HidrawDevice> create(HidrawOpener opener,
                                                  std::shared_ptr<HidrawObserver> observer);

    [[nodiscard]] HidrawCounters counters() const;

private:
    friend class BoundaryObject<HidrawDevice, ZorvaDevice>;
    struct Entries; ///< the functions of the table, in HidrawDeviceTable.cpp
    static const ZorvaDeviceTable kTable;

    struct Callback {
        std::span<std::uint8_t> buffer;
        ZorvaInputReportCallback function = nullptr;
        void *context = nullptr;
    };

    HidrawDevice(HidrawOpener opener, std::shared_ptr<HidrawObserver> observer);
    ~HidrawDevice() = default;

    ZorvaStatus open();
    ZorvaStatus refuse(const SystemFailure &failure) const noexcept;
    void close() noexcept;
    void setCallback(const Callback &callback) noexcept;
    void schedule(ZorvaRunLoop *loop, const char *mode);
    void unschedule(const ZorvaRunLoop *loop, const char *mode) noexcept;
    void leaveLoop() noexcept;
    [[nodiscard]] bool connect() noexcept ZORVA_REQUIRES(_lock);
    ZorvaStatus readFeatureReport(std::uint32_t reportId, std::span<std::uint8_t> buffer,
                                  std::size_t &stored) const noexcept;
    [[nodiscard]] PropertyValue property(const char *key) const;

    static void serve(void *device) noexcept;
    void serveOne() noexcept;
    void deliver(const Callback &callback, std::size_t length) noexcept;
    void drop() noexcept;
    void handleReadFailure(std::shared_ptr<HidrawNode> node, int errorNumber) noexcept;
    /// @param node  The one that was lost; nothing happens if the device has closed it meanwhile.
    void lose(std::shared_ptr<HidrawNode> node, const SystemFailure &reason) noexcept;
    [[nodiscard]] std::shared_ptr<HidrawNode> currentNode() const noexcept;
    [[nodiscard]] Callback currentCallback() const noexcept;

    const HidrawOpener _opener;
    const std::shared_ptr<HidrawObserver> _observer;
    Ports::Clock &_clock;

    mutable Host::Mutex _lock;
    std::shared_ptr<HidrawNode> _node ZORVA_GUARDED_BY(_lock); ///< null: closed, or gone
    DescriptorSource _source ZORVA_GUARDED_BY(_lock);
    Ref<HidrawDevice> _scheduled ZORVA_GUARDED_BY(_lock); ///< itself, while it has a place on a loop
    Callback _callback ZORVA_GUARDED_BY(_lock);
    PropertyValue::Dictionary _properties ZORVA_GUARDED_BY(_lock); ///< as of the last open
    unsigned _failuresInARow ZORVA_GUARDED_BY(_lock) = 0;
    HidrawCounters _counters ZORVA_GUARDED_BY(_lock);
};

} // namespace ZorvaTouch::Linux
