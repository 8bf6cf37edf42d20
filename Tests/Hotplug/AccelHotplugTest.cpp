#include "Host/Linux/AccelMonitor.h"

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

/// IIO devices in a /sys of our own, and a monitor that does not know of that.
class AccelHotplug : public testing::Test, private AccelListener {
protected:
    void SetUp() override { ASSERT_TRUE(::umockdev_in_mock_environment()) << "run by umockdev-wrapper"; }

    /// Adds a device, with the event of it. @return Its syspath.
    std::string plug(int number, const char *element, const char *location = "base") {
        const std::string device = "iio:device" + std::to_string(number);
        const std::string enable = "scan_elements/" + std::string(element) + "_en";
        return owned(::umockdev_testbed_add_device(testbed.get(), "iio", device.c_str(), nullptr, "name",
                                                   "accel_3d", "location", location, enable.c_str(), "0",
                                                   nullptr, "DEVNAME", ("/dev/" + device).c_str(), "DEVTYPE",
                                                   "iio_device", nullptr));
    }
    std::string plugAccelerometer(int number, const char *location = "base") {
        return plug(number, "in_accel_x", location);
    }
    void unplug(const std::string &device) {
        ::umockdev_testbed_uevent(testbed.get(), device.c_str(), "remove");
        ::umockdev_testbed_remove_device(testbed.get(), device.c_str());
    }
    void plugTrigger() {
        owned(::umockdev_testbed_add_device(testbed.get(), "iio", "trigger0", nullptr, "name",
                                            "accel_3d-dev0", nullptr, "DEVTYPE", "iio_trigger", nullptr));
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
        AccelListener &self = *this;
        monitor = std::make_unique<AccelMonitor>(self, source);
    }

    const std::unique_ptr<UMockdevTestbed, void (*)(void *)> testbed{::umockdev_testbed_new(),
                                                                     ::g_object_unref};
    std::unique_ptr<AccelMonitor> monitor;
    std::vector<std::string> told;

private:
    void onAdded(const AccelIdentity &accelerometer) override {
        told.push_back("+ " + describe(accelerometer) + " " + accelerometer.label + accelerometer.location);
    }
    void onRemoved(const AccelIdentity &accelerometer) override {
        told.push_back("- " + accelerometer.devnode);
    }
};

TEST_F(AccelHotplug, FindsWhatIsThere) {
    plugAccelerometer(1, "display");
    plug(2, "in_anglvel_x");
    plugTrigger();
    plugAccelerometer(0);
    listen(MonitorSource::Kernel);
    EXPECT_THAT(told, IsEmpty());
    monitor->scan();
    monitor->scan();
    EXPECT_THAT(told,
                ElementsAre("+ accel_3d at /dev/iio:device0 base", "+ accel_3d at /dev/iio:device1 display"));
}

class AccelHotplugSources : public AccelHotplug, public testing::WithParamInterface<MonitorSource> {};

TEST_P(AccelHotplugSources, HearOfThoseThatComeAndGo) {
    listen(GetParam());
    monitor->scan();
    plugTrigger();
    plug(2, "in_anglvel_x");
    const std::string first = plugAccelerometer(0);
    EXPECT_THAT(take(1), ElementsAre("+ accel_3d at /dev/iio:device0 base"));
    const std::string second = plugAccelerometer(1);
    unplug(first);
    EXPECT_THAT(take(2), ElementsAre("+ accel_3d at /dev/iio:device1 base", "- /dev/iio:device0"));
    plugAccelerometer(0);
    unplug(second);
    EXPECT_THAT(take(2), ElementsAre("+ accel_3d at /dev/iio:device0 base", "- /dev/iio:device1"));
}

INSTANTIATE_TEST_SUITE_P(Sources, AccelHotplugSources,
                         testing::Values(MonitorSource::Udev, MonitorSource::Kernel));

TEST_F(AccelHotplug, TellsOnceOfWhatIsBothFoundAndHeardOf) {
    listen(MonitorSource::Kernel);
    plugAccelerometer(0);
    monitor->scan();
    plugAccelerometer(1);
    EXPECT_THAT(take(2),
                ElementsAre("+ accel_3d at /dev/iio:device0 base", "+ accel_3d at /dev/iio:device1 base"));
}

TEST_F(AccelHotplug, ScanningTellsOfWhatIsGone) {
    const std::string device = plugAccelerometer(0);
    listen(MonitorSource::Kernel);
    monitor->scan();
    ::umockdev_testbed_remove_device(testbed.get(), device.c_str());
    plugAccelerometer(1);
    monitor->scan();
    EXPECT_THAT(told, ElementsAre("+ accel_3d at /dev/iio:device0 base", "- /dev/iio:device0",
                                  "+ accel_3d at /dev/iio:device1 base"));
}

} // namespace
} // namespace ZorvaTouch::Linux
