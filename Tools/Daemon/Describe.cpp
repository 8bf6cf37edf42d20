#include "Tools/Daemon/Describe.h"

#include "Host/Linux/AccelMonitor.h"
#include "Host/Linux/DeviceMonitor.h"
#include "Host/Linux/RealTime.h"
#include "Host/Linux/TrustedFile.h"
#include "Host/Linux/VirtualKeyboard.h"
#include "Host/Objects/Service.h"
#include "Shared/Util/Json.h"
#include "Tools/Daemon/DaemonChoices.h"
#include "Tools/Daemon/IndentedJson.h"
#include "Tools/Hosting/HostedService.h"

#include <array>
#include <stdexcept>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using PlugIn = std::shared_ptr<const Host::PlugInFile>;

constexpr int kRealTimePriority = 63;
constexpr const char *kAllowed = "allowed";

/// What a device says about itself, beside the reports that the service asks it for.
constexpr std::array kDeviceProperties{"Product",  "SerialNumber", "PhysicalPath",    "Transport",
                                       "VendorID", "ProductID",    "ReportDescriptor"};
constexpr std::array kReportProperties{"FirmwareDebugReports", "FactoryResetHoldDuration"};

/// Keeps what a monitor's first look finds.
template <typename Listener, typename Identity> class Found final : public Listener {
public:
    void onAdded(const Identity &found) override { all.push_back(found); }
    void onRemoved(const Identity &) override {}
    std::vector<Identity> all;
};

PropertyValue textOrNull(const std::string &text) {
    return text.empty() ? PropertyValue() : PropertyValue(text);
}

PropertyValue describeAccelerometers() {
    Found<Linux::AccelListener, Linux::AccelIdentity> found;
    Linux::AccelMonitor(found).scan();
    PropertyValue::Array all;
    for (const Linux::AccelIdentity &accelerometer : found.all)
        all.push_back(PropertyValue::Dictionary{{"Node", accelerometer.devnode},
                                                {"Name", textOrNull(accelerometer.name)},
                                                {"Label", textOrNull(accelerometer.label)},
                                                {"Location", textOrNull(accelerometer.location)}});
    return all;
}

template <std::size_t N>
void copyProperties(const HostedService &service, const std::array<const char *, N> &keys,
                    PropertyValue::Dictionary &described) {
    for (const char *const key : keys)
        described[key] = service.property(key).value_or(PropertyValue());
}

/// Opens the device, asks it, and closes it again.
void askDevice(const Linux::DeviceIdentity &device, const PlugIn &plugIn, const DeviceFinder &finder,
               PropertyValue::Dictionary &described) {
    try {
        HostedService service(plugIn);
        service.start(Host::Service::create(finder(device)(nullptr)).get());
        described["Access"] = kAllowed;
        copyProperties(service, kDeviceProperties, described);
        copyProperties(service, kReportProperties, described);
    } catch (const HostingError &error) {
        described["Access"] = error.what();
    }
}

PropertyValue describeSurface(const Linux::DeviceIdentity &device, const PlugIn &plugIn,
                              const DeviceFinder &finder) {
    PropertyValue::Dictionary described{{"Node", device.devnode}, {"Identity", device.stableId()}};
    askDevice(device, plugIn, finder, described);
    return described;
}

PropertyValue describeSurfaces(const DaemonOptions &options, const PlugIn &plugIn, const DeviceFinder &finder,
                               const std::function<void(std::string_view)> &say) {
    Found<Linux::DeviceListener, Linux::DeviceIdentity> found;
    const Linux::DeviceFilter filter = deviceFilterOf(options);
    requireNodes(filter);
    Linux::DeviceMonitor(filter, found).scan();
    PropertyValue::Array all;
    for (const Linux::DeviceIdentity &device : found.all) {
        say("asking " + device.devnode + " for its reports; one that does not answer takes a minute");
        all.push_back(describeSurface(device, plugIn, finder));
    }
    return all;
}

PropertyValue describePlugIn(const PlugIn &plugIn) {
    return PropertyValue::Dictionary{{"File", plugIn->path()}, {"Version", HostedService(plugIn).version()}};
}

PropertyValue allowedOr(const std::optional<Linux::RealTimeRefusal> &refusal) {
    return refusal ? PropertyValue(refusal->line) : PropertyValue(kAllowed);
}

} // namespace

std::string describeSystem(const DaemonOptions &options, const std::string &file, const DeviceFinder &finder,
                           const std::function<void(std::string_view)> &say) {
    const PlugIn plugIn = openPlugIn(Linux::trustedPath(file));
    const bool hasUdev = Linux::detectMonitorSource() == Linux::MonitorSource::Udev;
    return indentedJson(withoutControls(Util::jsonText(PropertyValue::Dictionary{
        {"Program", ZORVA_VERSION},
        {"PlugIn", describePlugIn(plugIn)},
        {"DevicesFrom", hasUdev ? "udev" : "kernel"},
        {"Keyboard", Linux::findKeyboardProblem().value_or(kAllowed)},
        {"RealTime", allowedOr(Linux::tryRoundRobin(kRealTimePriority))},
        {"Accelerometers", describeAccelerometers()},
        {"Surfaces", describeSurfaces(options, plugIn, finder, say)},
    })));
}

} // namespace ZorvaTouch::Tools
