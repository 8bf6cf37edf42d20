#include "Host/Linux/DeviceMonitor.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <poll.h>

#include <filesystem>

namespace ZorvaTouch::Linux {
namespace {

class NoDevices final : public DeviceListener {
public:
    void onAdded(const DeviceIdentity &device) override { ADD_FAILURE() << device.devnode; }
    void onRemoved(const DeviceIdentity &device) override { ADD_FAILURE() << device.devnode; }
};

class DeviceMonitors : public testing::TestWithParam<MonitorSource> {
protected:
    NoDevices listener;
};

TEST_P(DeviceMonitors, FindNothingWhereNothingIsWanted) {
    DeviceMonitor monitor({{}, {}}, listener, GetParam());
    EXPECT_EQ(monitor.source(), GetParam());
    monitor.scan();
    monitor.receive();
    monitor.receive();
}

TEST_P(DeviceMonitors, HaveADescriptorThatIsNotInheritedAndNeverBlocks) {
    const DeviceMonitor monitor({{{0x1234, 0xABCD}}, {}}, listener, GetParam());
    EXPECT_EQ(::fcntl(monitor.descriptor(), F_GETFD) & FD_CLOEXEC, FD_CLOEXEC);
    EXPECT_EQ(::fcntl(monitor.descriptor(), F_GETFL) & O_NONBLOCK, O_NONBLOCK);
    pollfd set{.fd = monitor.descriptor(), .events = POLLIN, .revents = 0};
    EXPECT_GE(::poll(&set, 1, 0), 0);
    EXPECT_EQ(set.revents & (POLLERR | POLLHUP | POLLNVAL), 0);
}

INSTANTIATE_TEST_SUITE_P(Sources, DeviceMonitors,
                         testing::Values(MonitorSource::Udev, MonitorSource::Kernel));

TEST(DeviceMonitorSource, IsUdevWhereUdevdRuns) {
    const bool isRunning = std::filesystem::exists("/run/udev/control");
    EXPECT_EQ(detectMonitorSource(), isRunning ? MonitorSource::Udev : MonitorSource::Kernel);
}

} // namespace
} // namespace ZorvaTouch::Linux
