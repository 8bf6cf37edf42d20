#include "Service/ZorvaTouchHIDService.h"

#include <stdexcept>
#include <utility>

namespace ZorvaTouch {

/// What the thread takes along. The service may be stopped and released while it runs.
struct ZorvaTouchHIDService::InputReportThreadArguments {
    ServiceReference<ZorvaTouchHIDService> service;
    HostHidDevice device;
    Ref<ZorvaService> eventSystem;
    DispatchEventInfo info;
    std::shared_ptr<Host::Semaphore> signal;
};

/// Takes the service's hooks out of the pipeline in the end, however many of them were put in.
class ZorvaTouchHIDService::HooksCleared {
public:
    explicit HooksCleared(ZorvaTouchHIDService &service) : _service(service) {}
    ~HooksCleared() { _service.clearHooks(); }
    HooksCleared(const HooksCleared &) = delete;
    HooksCleared &operator=(const HooksCleared &) = delete;

private:
    ZorvaTouchHIDService &_service;
};

/// The device's reports come to this thread for as long as it lives. The buffer is the device's to fill.
class ZorvaTouchHIDService::InputReportRegistration {
public:
    InputReportRegistration(ZorvaTouchHIDService &service, const HostHidDevice &device, Host::RunLoop &loop)
        : _device(device), _loop(loop) {
        _device.registerInputReportCallback(_buffer, inputReportCallback, &service);
        _device.scheduleWithRunLoop(_loop, kHandleInputReportsRunLoopMode);
    }
    ~InputReportRegistration() {
        _device.unscheduleFromRunLoop(_loop, kHandleInputReportsRunLoopMode);
        _device.registerInputReportCallback(_buffer, nullptr, nullptr);
    }
    InputReportRegistration(const InputReportRegistration &) = delete;
    InputReportRegistration &operator=(const InputReportRegistration &) = delete;

private:
    const HostHidDevice &_device;
    Host::RunLoop &_loop;
    std::array<std::uint8_t, kInputReportBufferSize> _buffer{};
};

// ---- The host's thread

void ZorvaTouchHIDService::scheduleWithDispatchQueue(ZorvaQueue *queue) {
    _log.debug("{}", "scheduleWithDispatchQueue:");
    if (refuseOnInputReportThread("scheduleWithDispatchQueue:"))
        return;
    if (_inputReportThread)
        unscheduleWithDispatchQueue(queue);
    _dispatchEventInfo.queue = Ref<ZorvaQueue>::retain(queue);
    _dispatchEventInfo.sender = getServiceInterface();
    try {
        startInputReportThread();
    } catch (const std::exception &error) {
        _log.error("Failed to start the input report thread: {}", error.what());
        setNotScheduled(error.what());
        _inputReportThreadSignal.reset();
        _dispatchEventInfo.queue.reset();
        return;
    }
    _inputReportThreadSignal->wait();
}

void ZorvaTouchHIDService::startInputReportThread() {
    _inputReportThreadSignal = _platform.createSemaphore();
    // Shared, since a closure is copied: the references are let go of when the thread is done with it.
    const auto arguments = std::make_shared<const InputReportThreadArguments>(
        InputReportThreadArguments{ServiceReference<ZorvaTouchHIDService>(*this), _zorvaDevice, _eventSystem,
                                   _dispatchEventInfo, _inputReportThreadSignal});
    _inputReportThread = _platform.startThread(
        "zorva-input", [arguments] { arguments->service->runInputReportThread(*arguments); });
}

void ZorvaTouchHIDService::unscheduleWithDispatchQueue(ZorvaQueue * /*queue*/) {
    _log.debug("{}", "unscheduleWithDispatchQueue:");
    if (refuseOnInputReportThread("unscheduleWithDispatchQueue:"))
        return;
    stopInputReportThread();
    setNotScheduled(kUnscheduled);
    _dispatchEventInfo.queue.reset();
}

void ZorvaTouchHIDService::stopInputReportThread() {
    if (const auto loop = std::exchange(_inputReportRunLoop, nullptr)) {
        _log.debug("signalling input report thread to exit");
        signalInputReportThreadToExit(*loop);
        _log.debug("waiting for input report thread to exit");
        _inputReportThreadSignal->wait();
        _log.debug("input report thread exited");
    }
    _inputReportThreadSignal.reset();
    // Its last steps come after the signal. Once it is joined, none of this file's code runs on it any more.
    if (const auto thread = std::exchange(_inputReportThread, nullptr))
        thread->join();
}

void ZorvaTouchHIDService::signalInputReportThreadToExit(Host::RunLoop &loop) const noexcept {
    try {
        // The loop itself, not a share in it: a closure that is never run must not keep its loop alive.
        loop.perform(kHandleInputReportsRunLoopMode, [&loop] { loop.stop(); });
    } catch (const std::exception &) { // no memory for a closure; the stop itself needs none
        loop.stop();
    }
}

bool ZorvaTouchHIDService::refuseOnInputReportThread(const char *operation) const noexcept {
    if (_inputReportThreadId != std::this_thread::get_id())
        return false;
    _log.error("{} refused: it was called on the input report thread, which would wait for itself",
               operation);
    return true;
}

// ---- What "ServiceStatus" says

void ZorvaTouchHIDService::setScheduled() noexcept {
    const Host::MutexLock lock(_pipelineLock);
    _notScheduledReason.clear();
}

void ZorvaTouchHIDService::setNotScheduled(std::string_view reason) noexcept {
    const Host::MutexLock lock(_pipelineLock);
    try {
        _notScheduledReason = reason;
    } catch (const std::bad_alloc &) {
        _notScheduledReason = "no memory"; // short enough to need none
    }
}

// ---- The input-report thread

void ZorvaTouchHIDService::runInputReportThread(const InputReportThreadArguments &arguments) noexcept {
    _log.debug("input report thread start");
    _inputReportThreadId = std::this_thread::get_id();
    std::shared_ptr<Host::RunLoop> loop;
    runInputReportStep([&] {
        loop = _platform.createRunLoop();
        setScheduled();
    });
    _inputReportRunLoop = loop;
    arguments.signal->signal();
    if (loop)
        runInputReportStep([&] { handleInputReports(arguments, *loop); });
    _inputReportThreadId = std::thread::id(); // the system gives numbers away again
    arguments.signal->signal();
    _log.debug("input report thread end");
}

template <typename Step> void ZorvaTouchHIDService::runInputReportStep(const Step &step) noexcept {
    runGuarded(_log, "input report thread", [&] {
        try {
            step();
        } catch (const std::exception &error) {
            setNotScheduled(error.what());
            throw;
        } catch (...) {
            setNotScheduled("unknown exception");
            throw;
        }
    });
}

void ZorvaTouchHIDService::handleInputReports(const InputReportThreadArguments &arguments,
                                              Host::RunLoop &loop) {
    setInputReportThreadPriority();
    // Undone in reverse order, whichever way this ends.
    const std::unique_ptr<AccelSystem> accelSystem = createAccelSystem(arguments.eventSystem, loop);
    const HooksCleared hooksCleared(*this);
    installHooks(arguments.info);
    const InputReportRegistration registration(*this, arguments.device, loop);
    while (loop.runOneSource(kHandleInputReportsRunLoopMode) == Host::RunOutcome::HandledSource) {
    }
}

void ZorvaTouchHIDService::setInputReportThreadPriority() const noexcept {
    if (const int error = _platform.setRoundRobinPriority(kInputReportThreadPriority))
        _log.error("pthread_setschedparam failed: {}", error);
}

std::unique_ptr<AccelSystem> ZorvaTouchHIDService::createAccelSystem(const Ref<ZorvaService> &eventSystem,
                                                                     Host::RunLoop &loop) {
    try {
        return std::make_unique<AccelSystem>(eventSystem, _log, &loop, kHandleInputReportsRunLoopMode,
                                             kAccelRateHz,
                                             [this](const HostEvent &event) { handleAccelEvent(event); });
    } catch (const std::exception &error) {
        _log.error("Failed to create accel system: {}", error.what());
        return nullptr;
    }
}

} // namespace ZorvaTouch
