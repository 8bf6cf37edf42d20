#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Interface/Platform.h"
#include "Plugin/ZorvaHIDService.h"
#include "Service/AccelCapture.h"
#include "Service/AccelSystem.h"
#include "Service/DispatchEventInfo.h"
#include "Service/HostHidDevice.h"
#include "Service/ServiceLog.h"
#include "Shared/Pipeline.h"
#include "Shared/PipelineRecording.h"

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <thread>

namespace ZorvaTouch {

/// Category of the service's log.
inline constexpr std::string_view kLogCategoryService = "HIDService";

/// Mode in which the input-report thread runs its run loop.
inline constexpr const char *kHandleInputReportsRunLoopMode = "kHandleInputReportsRunLoopMode";

/// Why a service is not scheduled that the host has not scheduled, or has unscheduled.
inline constexpr std::string_view kUnscheduled = "unscheduled";

/// Domain of the pipeline's state keys among the properties: "Pipeline.Algs.ActivationThreshold".
inline constexpr std::string_view kPipelineDomain = "Pipeline";

/// The service of one touch surface: reads its reports on a thread of its own, recognizes gestures, and hands
/// them to the host's queue.
///
/// One file for each of its sides:
///   ZorvaTouchHIDService.cpp   life cycle: made, started, opened, closed, stopped, gone
///   InputReportThread.cpp      schedule, the thread, its loop, unschedule
///   InputReports.cpp           what the thread does with a report and with an accelerometer sample
///   ServiceProperties.cpp      properties
///
/// Threads: see `ZorvaPlugIn.h`. `_pipelineLock` is the only lock. It is never held while waiting. Of the
///          host's functions one is called under it: `submit` of the queue, with the events of a report.
// NOLINTNEXTLINE(cppcoreguidelines-virtual-class-destructor): the last release alone destroys it
class ZorvaTouchHIDService final : public ZorvaHIDService {
public:
    /// Most frames that the recording keeps: some 40 seconds at 100 Hz with the accelerometer's notes.
    static constexpr std::uint64_t kMaxRecordedFrames = 4350;
    /// Samples a second that the accelerometer is asked for.
    static constexpr std::uint32_t kAccelRateHz = 100;
    /// Round-robin priority of the input-report thread.
    static constexpr int kInputReportThreadPriority = 63;
    /// Largest input report that is read whole, in bytes.
    static constexpr std::size_t kInputReportBufferSize = 512;

    /// @param platform  Borrowed; outlives the service.
    explicit ZorvaTouchHIDService(Host::Platform &platform);

    [[nodiscard]] ZorvaStatus probeWithService(ZorvaService *service, const ZorvaValue *properties,
                                               std::int32_t *outScore) override;
    [[nodiscard]] ZorvaStatus startWithService(ZorvaService *service, const ZorvaValue *properties) override;
    ZorvaStatus stop() override;
    [[nodiscard]] bool openWithOptions(std::uint32_t options) override;
    void closeWithOptions(std::uint32_t options) override;
    [[nodiscard]] PropertyValue getPropertyForKey(const char *key) override ZORVA_EXCLUDES(_pipelineLock);
    bool setPropertyForKey(const PropertyValue &value, const char *key) override
        ZORVA_EXCLUDES(_pipelineLock);
    void setEventCallback(ZorvaEventCallback callback, void *target, void *refcon) override;
    void scheduleWithDispatchQueue(ZorvaQueue *queue) override;
    void unscheduleWithDispatchQueue(ZorvaQueue *queue) override;
    [[nodiscard]] Ref<const ZorvaEvent> copyEventWithType(std::uint32_t type, const ZorvaEvent *matching,
                                                          std::uint32_t options) override;
    ZorvaStatus setOutputEvent(const ZorvaEvent *event) override;
    void reportFailure(const char *operation, const char *reason) noexcept override;

private:
    struct InputReportThreadArguments;
    class HooksCleared;
    class InputReportRegistration;

    ~ZorvaTouchHIDService() override; // by the last release

    // InputReportThread.cpp
    void startInputReportThread();
    void stopInputReportThread();
    void signalInputReportThreadToExit(Host::RunLoop &loop) const noexcept;
    [[nodiscard]] bool refuseOnInputReportThread(const char *operation) const noexcept;
    void runInputReportThread(const InputReportThreadArguments &arguments) noexcept;
    /// Runs a part of the thread's work; what it throws becomes an error line and the status.
    template <typename Step> void runInputReportStep(const Step &step) noexcept;
    void setScheduled() noexcept ZORVA_EXCLUDES(_pipelineLock);
    void setNotScheduled(std::string_view reason) noexcept ZORVA_EXCLUDES(_pipelineLock);
    void handleInputReports(const InputReportThreadArguments &arguments, Host::RunLoop &loop);
    void setInputReportThreadPriority() const noexcept;
    [[nodiscard]] std::unique_ptr<AccelSystem> createAccelSystem(const Ref<ZorvaService> &eventSystem,
                                                                 Host::RunLoop &loop);

    // InputReports.cpp: on the input-report thread
    static void inputReportCallback(void *context, ZorvaStatus result, void *sender, std::uint32_t type,
                                    std::uint32_t reportId, const std::uint8_t *report, std::size_t length,
                                    std::uint64_t timestamp) noexcept;
    void handleInputReport(std::uint32_t type, std::uint32_t reportId, const std::uint8_t *report,
                           std::size_t length, std::uint64_t timestamp) ZORVA_EXCLUDES(_pipelineLock);
    void handleAccelEvent(const HostEvent &event) ZORVA_EXCLUDES(_pipelineLock);
    void installHooks(const DispatchEventInfo &info) ZORVA_EXCLUDES(_pipelineLock);
    void clearHooks() noexcept ZORVA_EXCLUDES(_pipelineLock);
    void installProbes() ZORVA_REQUIRES(_pipelineLock);
    void traceInputReport(const std::uint8_t *data, std::size_t length) const noexcept;
    void traceFirmwareEvent(const InputReport::FirmwareEvent &event) const noexcept;
    void handOverEvents(const HostEventList &events, const DispatchEventInfo &info)
        ZORVA_REQUIRES(_pipelineLock);

    // ServiceProperties.cpp
    struct OwnProperty;
    static const std::array<OwnProperty, 6> kOwnProperties;
    [[nodiscard]] PropertyValue pipelineState(const std::string &key) ZORVA_EXCLUDES(_pipelineLock);
    void setPipelineState(const std::string &key, const PropertyValue &value) ZORVA_EXCLUDES(_pipelineLock);
    [[nodiscard]] PropertyValue version();
    [[nodiscard]] PropertyValue firmwareDebugReports();
    [[nodiscard]] PropertyValue factoryResetHoldDuration();
    [[nodiscard]] PropertyValue recording() ZORVA_EXCLUDES(_pipelineLock);
    [[nodiscard]] PipelineRecording copyOfRecording() ZORVA_EXCLUDES(_pipelineLock);
    [[nodiscard]] PropertyValue servicePluginDebug();
    [[nodiscard]] PropertyValue serviceStatus() ZORVA_EXCLUDES(_pipelineLock);

    // Constant.
    Host::Platform &_platform;
    const ServiceLog _log;

    // The host's thread; the input-report thread has copies of its own.
    HostHidDevice _zorvaDevice;
    Ref<ZorvaService> _eventSystem; ///< what was offered at start: clients for the accelerometer
    std::unique_ptr<Host::Thread> _inputReportThread;
    std::shared_ptr<Host::Semaphore> _inputReportThreadSignal; ///< twice a thread: loop ready, thread done
    DispatchEventInfo _dispatchEventInfo;

    /// Who would wait for itself if it scheduled or unscheduled.
    std::atomic<std::thread::id> _inputReportThreadId{};
    /// Set by the input-report thread before it first signals, else the host's.
    std::shared_ptr<Host::RunLoop> _inputReportRunLoop;

    mutable Host::Mutex _pipelineLock;
    std::shared_ptr<Pipeline> _pipeline ZORVA_GUARDED_BY(_pipelineLock);
    PipelineRecording _recording ZORVA_GUARDED_BY(_pipelineLock);
    AccelCapture _accel ZORVA_GUARDED_BY(_pipelineLock);
    std::string _notScheduledReason ZORVA_GUARDED_BY(_pipelineLock){kUnscheduled}; ///< empty: scheduled
};

} // namespace ZorvaTouch
