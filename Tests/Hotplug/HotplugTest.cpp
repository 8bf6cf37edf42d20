#include "Host/Linux/DeviceMonitor.h"

#include <gmock/gmock.h>
#include <umockdev.h>

#include <poll.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// A text of the library's.
std::string owned(gchar *text) {
    const std::unique_ptr<gchar, void (*)(void *)> owner(text, ::g_free);
    return text;
}

/// HID devices in a /sys of our own, and a monitor that does not know of that.
class Hotplug : public testing::Test, private DeviceListener {
protected:
    /// Two syspaths.
    struct Device {
        std::string hid, node;
    };

    void SetUp() override { ASSERT_TRUE(::umockdev_in_mock_environment()) << "run by umockdev-wrapper"; }

    /// Adds a device, with the events of it, and its driver as long as that is at work.
    Device plug(const char *id, const std::string &number, const char *serial) {
        Device device;
        device.hid = owned(::umockdev_testbed_add_device(
            testbed.get(), "hid", ("0003:0000:0000." + number).c_str(), nullptr, nullptr, "HID_ID", id,
            "HID_NAME", "Zorva Touch", "HID_PHYS", ("usb-" + number).c_str(), "HID_UNIQ", serial, nullptr));
        ::umockdev_testbed_set_attribute_link(testbed.get(), device.hid.c_str(), "driver",
                                              "../../bus/hid/drivers/hid-generic");
        device.node = owned(::umockdev_testbed_add_device(
            testbed.get(), "hidraw", ("hidraw" + number).c_str(), device.hid.c_str(), nullptr, "DEVNAME",
            ("/dev/hidraw" + number).c_str(), nullptr));
        return device;
    }
    void bind(const Device &device) { ::umockdev_testbed_uevent(testbed.get(), device.hid.c_str(), "bind"); }
    void unplug(const Device &device) {
        ::umockdev_testbed_uevent(testbed.get(), device.node.c_str(), "remove");
    }

    /// Waits until the monitor has told this much since the last time.
    std::vector<std::string> take(std::size_t count) {
        while (told.size() < count) {
            pollfd set{.fd = monitor->descriptor(), .events = POLLIN, .revents = 0};
            if (::poll(&set, 1, -1) == 1)
                monitor->receive();
        }
        return std::exchange(told, {});
    }
    void listen(MonitorSource source) {
        DeviceListener &self = *this;
        monitor = std::make_unique<DeviceMonitor>(DeviceFilter{{{0x1234, 0xABCD}}, {}}, self, source);
    }

    const std::unique_ptr<UMockdevTestbed, void (*)(void *)> testbed{::umockdev_testbed_new(),
                                                                     ::g_object_unref};
    std::unique_ptr<DeviceMonitor> monitor;
    std::vector<std::string> told;

private:
    void onAdded(const DeviceIdentity &device) override {
        told.push_back("+ " + device.devnode + " " + device.name + " " + device.stableId());
    }
    void onRemoved(const DeviceIdentity &device) override { told.push_back("- " + device.devnode); }
};

constexpr const char *kOurs = "0003:00001234:0000ABCD";
constexpr const char *kOthers = "0003:00001234:0000ABCC";

TEST_F(Hotplug, FindsWhatIsThere) {
    plug(kOurs, "1", "SN1");
    plug(kOthers, "2", "SN2");
    listen(MonitorSource::Kernel);
    EXPECT_THAT(told, IsEmpty());
    monitor->scan();
    monitor->scan();
    EXPECT_THAT(told, ElementsAre("+ /dev/hidraw1 Zorva Touch SN1"));
}

TEST_F(Hotplug, HearsFromUdevOnceTheNodeIsThere) {
    listen(MonitorSource::Udev);
    monitor->scan();
    plug(kOthers, "1", "SN1");
    const Device ours = plug(kOurs, "2", "");
    EXPECT_THAT(take(1), ElementsAre("+ /dev/hidraw2 Zorva Touch usb-2"));
    bind(ours);
    unplug(ours);
    EXPECT_THAT(take(1), ElementsAre("- /dev/hidraw2"));
}

TEST_F(Hotplug, HearsFromTheKernelOnceTheDriverHasFinished) {
    listen(MonitorSource::Kernel);
    monitor->scan();
    const Device first = plug(kOurs, "1", "SN1");
    const Device second = plug(kOurs, "2", "SN2");
    bind(second);
    EXPECT_THAT(take(1), ElementsAre("+ /dev/hidraw2 Zorva Touch SN2"));
    bind(first);
    EXPECT_THAT(take(1), ElementsAre("+ /dev/hidraw1 Zorva Touch SN1"));
    unplug(second);
    unplug(first);
    EXPECT_THAT(take(2), ElementsAre("- /dev/hidraw2", "- /dev/hidraw1"));
}

TEST_F(Hotplug, TellsOnceOfADeviceThatCameBetweenListeningAndScanning) {
    listen(MonitorSource::Kernel);
    const Device first = plug(kOurs, "1", "SN1");
    monitor->scan();
    bind(first);
    bind(plug(kOurs, "2", "SN2"));
    EXPECT_THAT(take(2), ElementsAre("+ /dev/hidraw1 Zorva Touch SN1", "+ /dev/hidraw2 Zorva Touch SN2"));
}

TEST_F(Hotplug, LeavesNodesThatUdevHasNotSeenAndMayNotBeOpenedToUdev) {
    listen(MonitorSource::Udev);
    plug(kOurs, "1", "SN1");
    monitor->scan();
    EXPECT_THAT(told, IsEmpty());
    EXPECT_THAT(take(1), ElementsAre("+ /dev/hidraw1 Zorva Touch SN1"));
}

} // namespace
} // namespace ZorvaTouch::Linux
