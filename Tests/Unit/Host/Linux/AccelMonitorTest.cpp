#include "Host/Linux/AccelMonitor.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <poll.h>

namespace ZorvaTouch::Linux {
namespace {

/// Whatever this machine has.
class AnyAccelerometers final : public AccelListener {
public:
    void onAdded(const AccelIdentity &accelerometer) override {
        EXPECT_FALSE(accelerometer.devnode.empty());
        EXPECT_LT(last, accelerometer.syspath) << "in order, each once";
        last = accelerometer.syspath;
    }
    void onRemoved(const AccelIdentity &accelerometer) override { ADD_FAILURE() << accelerometer.devnode; }

    std::string last;
};

class AccelMonitors : public testing::TestWithParam<MonitorSource> {
protected:
    AnyAccelerometers listener;
};

TEST_P(AccelMonitors, TellOfEachOnceAndInOrder) {
    AccelMonitor monitor(listener, GetParam());
    monitor.scan();
    monitor.scan();
    monitor.receive();
}

TEST_P(AccelMonitors, HaveADescriptorThatIsNotInheritedAndNeverBlocks) {
    const AccelMonitor monitor(listener, GetParam());
    EXPECT_EQ(::fcntl(monitor.descriptor(), F_GETFD) & FD_CLOEXEC, FD_CLOEXEC);
    EXPECT_EQ(::fcntl(monitor.descriptor(), F_GETFL) & O_NONBLOCK, O_NONBLOCK);
    pollfd set{.fd = monitor.descriptor(), .events = POLLIN, .revents = 0};
    EXPECT_GE(::poll(&set, 1, 0), 0);
    EXPECT_EQ(set.revents & (POLLERR | POLLHUP | POLLNVAL), 0);
}

INSTANTIATE_TEST_SUITE_P(Sources, AccelMonitors, testing::Values(MonitorSource::Udev, MonitorSource::Kernel));

} // namespace
} // namespace ZorvaTouch::Linux
