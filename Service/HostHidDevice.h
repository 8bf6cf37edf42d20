#pragma once

#include "Host/Interface/RunLoop.h"
#include "Plugin/Ref.h"
#include "Plugin/ZorvaPlugIn.h"
#include "Shared/Util/PropertyValue.h"

#include <cstddef>
#include <cstdint>
#include <span>

namespace ZorvaTouch {

/// The service's handle of its device. It may be empty; then every operation fails as its text says.
///
/// Copies refer to the same device.
class HostHidDevice {
public:
    HostHidDevice() noexcept = default;

    /// Creates the device that a service of the host stands for.
    /// @return An empty handle if the host has none to give, or one that is not whole.
    [[nodiscard]] static HostHidDevice create(ZorvaService *service) noexcept;

    [[nodiscard]] explicit operator bool() const noexcept { return static_cast<bool>(_device); }
    void reset() noexcept { _device.reset(); }

    /// @return Whether the device was opened; false without one.
    [[nodiscard]] bool open(std::uint32_t options) const noexcept;
    void close(std::uint32_t options) const noexcept;

    void registerInputReportCallback(std::span<std::uint8_t> buffer, ZorvaInputReportCallback callback,
                                     void *context) const noexcept;
    void scheduleWithRunLoop(Host::RunLoop &loop, const char *mode) const noexcept;
    void unscheduleFromRunLoop(Host::RunLoop &loop, const char *mode) const noexcept;

    /// An answer to a request for a feature report.
    struct FeatureReportResult {
        ZorvaStatus status; ///< ZORVA_STATUS_NO_RESOURCES without a device
        std::size_t length; ///< bytes stored, at most the buffer's
    };
    [[nodiscard]] FeatureReportResult getFeatureReport(std::uint32_t reportId,
                                                       std::span<std::uint8_t> buffer) const noexcept;

    /// Null without a device, and for a property that it does not have.
    [[nodiscard]] PropertyValue property(const char *key) const;
    /// @return Whether the device took it; false without one.
    bool setProperty(const char *key, const PropertyValue &value) const;

private:
    Ref<ZorvaDevice> _device;
};

} // namespace ZorvaTouch
