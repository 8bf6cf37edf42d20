#include "Host/Linux/HidrawOpeners.h"

#include "Host/Linux/HidrawFile.h"
#include "Host/Linux/SystemFailure.h"
#include "Tests/Unit/Host/Linux/FakeNode.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <string>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

using Tests::FakeNode;
using Tests::FakeOpener;

/// Of a fake node as it is made.
DeviceIdentity identity() {
    return {.devnode = "/dev/hidraw1",
            .syspath = "/sys/hidraw1",
            .hidSyspath = "/sys/hid1",
            .deviceNumber = 0xF300,
            .bus = 3,
            .id = {0x1234, 0xABCD},
            .serial = "SN1",
            .physicalPath = "usb-1",
            .name = "Touch"};
}

class HidrawOpenOnly : public testing::Test {
protected:
    /// @return What became of opening, as the log has it; empty: it is open.
    std::string open(const DeviceIdentity &device) {
        const OpenedNode opened = openOnly(device, nodes.opener())();
        EXPECT_EQ(opened.node == nullptr, nodes.node() == nullptr) << "a refused node is closed";
        return opened.node ? "" : describe({"open", opened.errorNumber, opened.detail});
    }

    FakeOpener nodes;
};

TEST_F(HidrawOpenOnly, OpensTheDeviceThatTheSystemDescribed) { EXPECT_EQ(open(identity()), ""); }

TEST_F(HidrawOpenOnly, ComparesOnlyWhatIsKnown) {
    DeviceIdentity device = identity();
    device.deviceNumber = 0;
    device.bus = 0;
    device.serial = "";
    device.physicalPath = "";
    EXPECT_EQ(open(device), "");
    nodes.prepare = [](FakeNode &node) { node.textError = EINVAL; }; // a kernel without such a request
    EXPECT_EQ(open(identity()), "");
}

TEST_F(HidrawOpenOnly, ComparesTextsUpToALineBreakAsSysfsHasThem) {
    nodes.prepare = [](FakeNode &node) { node.uniqueId = {'S', 'N', '1', '\n', 'X', 0}; };
    EXPECT_EQ(open(identity()), "");
    nodes.prepare = [](FakeNode &node) { node.uniqueId = {'S', 'N', '1', '1', 0}; };
    EXPECT_EQ(open(identity()), "open: another device has taken the node");
}

TEST_F(HidrawOpenOnly, SaysWhyANodeCannotBeOpened) {
    nodes.errors = {EPERM};
    EXPECT_EQ(open(identity()), "open: Operation not permitted");
}

struct OtherNode {
    const char *what;
    std::function<void(FakeNode &)> prepare;
    const char *refusal;
};
void PrintTo(const OtherNode &node, std::ostream *stream) { *stream << node.what; }

class HidrawOpenOnlyRefuses : public HidrawOpenOnly, public testing::WithParamInterface<OtherNode> {};

TEST_P(HidrawOpenOnlyRefuses, AnotherNode) {
    nodes.prepare = GetParam().prepare;
    EXPECT_EQ(open(identity()), GetParam().refusal);
}

constexpr const char *kOther = "open: another device has taken the node";
constexpr const char *kNoHidraw = "open: not a hidraw device node";

INSTANTIATE_TEST_SUITE_P(
    Nodes, HidrawOpenOnlyRefuses,
    testing::Values(
        OtherNode{"device number", [](FakeNode &node) { node.number = 0xF301; }, kOther},
        OtherNode{"bus", [](FakeNode &node) { node.hidrawInfo.bus = 5; }, kOther},
        OtherNode{"vendor", [](FakeNode &node) { node.hidrawInfo.vendor = 0x1235; }, kOther},
        OtherNode{"product", [](FakeNode &node) { node.hidrawInfo.product = 0xABCE; }, kOther},
        OtherNode{"serial number",
                  [](FakeNode &node) {
                      node.uniqueId = {'S', 'N', '2', 0};
                  },
                  kOther},
        OtherNode{"no serial number", [](FakeNode &node) { node.uniqueId = {0}; }, kOther},
        OtherNode{"physical path", [](FakeNode &node) { node.physicalPath = {'u', 's', 'b', '-', '2', 0}; },
                  kOther},
        OtherNode{"not a character device", [](FakeNode &node) { node.numberError = ENOTTY; }, kNoHidraw},
        OtherNode{"no hidraw", [](FakeNode &node) { node.infoError = ENOTTY; }, kNoHidraw},
        OtherNode{"no hidraw either", [](FakeNode &node) { node.infoError = EINVAL; }, kNoHidraw},
        OtherNode{"one that goes", [](FakeNode &node) { node.infoError = ENODEV; }, "open: No such device"}));

// --- Locks -------------------------------------------------------------------------------------------------

TEST_F(HidrawOpenOnly, LocksOnlyTheDeviceThatTheSystemDescribed) {
    nodes.prepare = [](FakeNode &node) {
        node.number = 0xF301;
        node.lockError = EWOULDBLOCK;
    };
    const OpenedNode opened = openLocked(openOnly(identity(), nodes.opener()))();
    EXPECT_EQ(describe({"open", opened.errorNumber, opened.detail}), kOther);
}

TEST(HidrawOpenLocked, RefusesANodeThatAnotherProgramHasLocked) {
    FakeOpener nodes;
    EXPECT_NE(openLocked(nodes.opener())().node, nullptr);
    nodes.prepare = [](FakeNode &node) { node.lockError = EWOULDBLOCK; };
    const OpenedNode busy = openLocked(nodes.opener())();
    EXPECT_EQ(busy.node, nullptr);
    EXPECT_EQ(busy.errorNumber, EBUSY);
    EXPECT_STREQ(busy.detail, "in use by another program");
    nodes.prepare = [](FakeNode &node) { node.lockError = ENOLCK; };
    EXPECT_EQ(openLocked(nodes.opener())().errorNumber, ENOLCK);
}

// --- Nodes of the system -----------------------------------------------------------------------------------

/// What the system has under a path, opened as the device with the unknown number.
std::string openPath(const std::string &path) {
    DeviceIdentity device = identity();
    device.deviceNumber = 0;
    const OpenedNode opened = openOnly(device, HidrawFile::opener(path))();
    return opened.node ? "" : describe({"open", opened.errorNumber, opened.detail});
}

TEST(HidrawOpenOnlyOfFiles, RefusesWhatIsNotAHidrawNodeWithoutWaitingForIt) {
    std::string folder = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
    ASSERT_NE(::mkdtemp(folder.data()), nullptr);
    const std::string fifo = folder + "/fifo"; // without a writer: a blocking open would wait for one
    ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
    const UniqueFd terminal(::posix_openpt(O_RDWR | O_NOCTTY));
    ASSERT_EQ(::grantpt(terminal.get()), 0);
    ASSERT_EQ(::unlockpt(terminal.get()), 0);
    const std::string pty = ::ptsname(terminal.get());
    for (const std::string &path : {fifo, pty, folder, std::string("/etc/passwd"), std::string("/dev/null")})
        EXPECT_EQ(openPath(path), kNoHidraw) << path;
    std::error_code ignored;
    std::filesystem::remove_all(folder, ignored);
}

} // namespace
} // namespace ZorvaTouch::Linux
