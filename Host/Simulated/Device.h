#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Objects/Inbox.h"
#include "Host/Objects/Properties.h"
#include "Host/Simulated/FeatureReports.h"
#include "Plugin/BoundaryObject.h"

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

namespace ZorvaTouch::Simulated {

/// The device is gone.
inline constexpr ZorvaStatus kStatusNoDevice = 0xE00002C0;

/// What has happened to a device so far.
struct DeviceCounters {
    std::uint64_t handled = 0;                 ///< reports that the callback has returned from
    std::uint64_t dropped = 0;                 ///< reports that it never got
    std::uint32_t opened = 0;                  ///< successful opens
    std::uint32_t closed = 0;                  ///< successful closes
    std::optional<std::uint32_t> openOptions;  ///< of the last open, successful or not
    std::optional<std::uint32_t> closeOptions; ///< likewise
    std::uint32_t references = 0; ///< a scheduled device holds one itself, and another during the callback
};

/// A HID device without hardware: it sends the reports it is told to and answers as it is told to.
///
/// Reports are delivered from any thread, wait in a queue as long as a kernel's, and get to the callback on
/// the run loop's thread, one in each pass. They wait even while the device is closed or not scheduled; what
/// waits is dropped when the device is closed or unplugged, and when its turn comes and there is no callback.
///
/// A scheduled device keeps itself until it is unscheduled, so that a pass never finds it gone.
///
/// Threads: any, several at a time. No lock is held while the callback runs.
class Device final : public BoundaryObject<Device, ZorvaDevice> {
public:
    /// Reports that can wait; the newest beyond are dropped.
    static constexpr std::size_t kQueueCapacity = 63;

    /// A device that is plugged, opens and closes, with the feature reports of `FeatureReports::ofDevice` and
    /// the properties "Product", "SerialNumber", "VendorID" 0x1234 and "ProductID" 0xABCD.
    /// @throws std::bad_alloc, std::system_error
    [[nodiscard]] static Ref<Device> create();

    /// Sends an input report.
    /// @param report     Report ID first; copied. Any length, 0 too; the callback gets what fits its buffer.
    /// @param timestamp  Host ticks.
    /// @return Whether it was queued.
    /// @throws std::bad_alloc
    bool deliver(std::span<const std::uint8_t> report, std::uint64_t timestamp);

    /// Waits until every report delivered before has been handled or dropped. Returns at once, or as soon as
    /// that happens, when no source is there to serve them: not scheduled, unplugged; and on the loop's own
    /// thread, in the callback say.
    void waitUntilHandled();

    /// The device disappears: its source goes at once, what waits is dropped, and until it is plugged again
    /// deliveries are dropped, open and feature reports fail with `kStatusNoDevice`. Properties stay. A
    /// callback that has begun, on another thread, may still be going on.
    void unplug();
    /// It comes back, for the next schedule.
    void plug();

    // What the device answers from now on.

    void setOpenStatus(ZorvaStatus status);
    void setCloseStatus(ZorvaStatus status);
    /// @param report  The whole report, report ID first.
    void setFeatureReport(std::uint32_t reportId, std::vector<std::uint8_t> report);
    void failFeatureReport(std::uint32_t reportId, ZorvaStatus status);
    [[nodiscard]] Host::Properties &properties() noexcept { return _properties; }

    [[nodiscard]] DeviceCounters counters() const;

private:
    friend class BoundaryObject<Device, ZorvaDevice>;
    struct Entries; ///< the functions of the table, in DeviceTable.cpp
    static const ZorvaDeviceTable kTable;

    struct Report {
        std::vector<std::uint8_t> bytes;
        std::uint64_t timestamp;
    };
    struct Callback {
        std::span<std::uint8_t> buffer;
        ZorvaInputReportCallback function = nullptr;
        void *context = nullptr;
    };
    /// A report in the callback's buffer.
    struct Delivery {
        Callback callback;
        std::uint32_t reportId;
        std::size_t length;
        std::uint64_t timestamp;
    };

    Device();
    ~Device() = default;

    ZorvaStatus open(std::uint32_t options);
    ZorvaStatus close(std::uint32_t options);
    void setCallback(const Callback &callback);
    void schedule(ZorvaRunLoop *loop, const char *mode);
    void unschedule(const ZorvaRunLoop *loop, const char *mode);
    void leaveLoop() noexcept;
    ZorvaStatus readFeatureReport(std::uint32_t reportId, std::span<std::uint8_t> buffer,
                                  std::size_t &stored) const;

    static void serve(void *device) noexcept;
    void serveOne() noexcept;
    [[nodiscard]] std::optional<Delivery> takeReport();
    void finishReport();
    void dropWaiting() ZORVA_REQUIRES(_lock);

    Host::Properties _properties;
    mutable Host::Mutex _lock;
    std::condition_variable_any _settled; ///< reports were settled, or the source went
    Host::Inbox<Report> _inbox ZORVA_GUARDED_BY(_lock){kQueueCapacity};
    Ref<Device> _scheduled ZORVA_GUARDED_BY(_lock); ///< itself, while it has a place on a loop
    Callback _callback ZORVA_GUARDED_BY(_lock);
    FeatureReports _featureReports ZORVA_GUARDED_BY(_lock) = FeatureReports::ofDevice();
    ZorvaStatus _openStatus ZORVA_GUARDED_BY(_lock) = ZORVA_STATUS_SUCCESS;
    ZorvaStatus _closeStatus ZORVA_GUARDED_BY(_lock) = ZORVA_STATUS_SUCCESS;
    bool _isPlugged ZORVA_GUARDED_BY(_lock) = true;
    DeviceCounters _counters ZORVA_GUARDED_BY(_lock); ///< but for the references
    std::atomic<std::uint32_t> _referenceCount{1};
};

} // namespace ZorvaTouch::Simulated
