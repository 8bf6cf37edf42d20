#pragma once

#include "Host/Runtime/PlugInFile.h"
#include "Plugin/ZorvaPlugIn.h"
#include "Shared/Util/PropertyValue.h"

#include <memory>
#include <optional>
#include <stdexcept>
#include <string>

namespace ZorvaTouch::Tools {

/// A plug-in that cannot be loaded or a service that cannot be started. `what()` is one line that begins with
/// the file's name.
class HostingError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Loads a plug-in's file. One that is loaded stays as it is for all services that are made from it, also
/// when the file is replaced.
/// @throws HostingError  The file cannot be loaded.
[[nodiscard]] std::shared_ptr<const Host::PlugInFile> openPlugIn(const std::string &file);

/// A HID service from a plug-in's file, driven as any host does: through the factory and the two tables
/// alone. What was begun is undone in the end, in the opposite order.
///
/// Threads: one; the service's own threads are its own affair.
class HostedService {
public:
    /// Makes a service.
    /// @param plugIn  Kept as long as the service.
    /// @throws HostingError  The file is not a plug-in with such a service.
    explicit HostedService(std::shared_ptr<const Host::PlugInFile> plugIn);
    ~HostedService();
    HostedService(const HostedService &) = delete;
    HostedService &operator=(const HostedService &) = delete;

    /// Probes and starts the service, and opens its device.
    /// @param offered  Borrowed; the service keeps what it needs.
    /// @throws HostingError
    void start(ZorvaService *offered);
    /// @param target  Handed back with each event.
    void setEventCallback(ZorvaEventCallback callback, void *target) noexcept;
    /// @throws HostingError  The service cannot read reports, with the reason; it is not scheduled.
    void schedule(ZorvaQueue *queue);
    /// Afterwards no report is handled any more; events may still wait in the queue.
    void unschedule() noexcept;

    /// Nothing: there is no such property.
    [[nodiscard]] std::optional<PropertyValue> property(const std::string &key) const;
    /// @return Whether the service took it.
    [[nodiscard]] bool setProperty(const std::string &key, const PropertyValue &value);

    [[nodiscard]] const std::string &file() const noexcept { return _plugIn->path(); }
    /// The property "Version" as it is written, "26.0.0"; "?" if there is none.
    [[nodiscard]] std::string version() const;

private:
    [[noreturn]] void fail(const std::string &problem) const;
    void require(ZorvaStatus status, const char *operation) const;
    void requireScheduled();

    const std::shared_ptr<const Host::PlugInFile> _plugIn;
    PlugInInterfaceTable **_plug = nullptr;    ///< one reference
    HidServiceInterfaceTable **_hid = nullptr; ///< one reference
    ZorvaQueue *_queue = nullptr;              ///< while scheduled
    bool _isStarted = false;
    bool _isOpen = false;
};

} // namespace ZorvaTouch::Tools
