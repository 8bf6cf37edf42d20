#include "Host/Linux/HidrawFile.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/sysmacros.h>

#include <array>
#include <cerrno>
#include <cstdint>

namespace ZorvaTouch::Linux {
namespace {

// What can be opened here is no HID device: the calls get as far as the system,
// which refuses them.

TEST(HidrawFile, SaysWhyItCannotBeOpened) {
    const OpenedNode opened = HidrawFile::open("/dev/no-such-node");
    EXPECT_EQ(opened.node, nullptr);
    EXPECT_EQ(opened.errorNumber, ENOENT);
    EXPECT_EQ(HidrawFile::open("/dev/null/hidraw0").errorNumber, ENOTDIR);
}

TEST(HidrawFile, IsOpenedForReadingOnlyAndIsNotInherited) {
    const OpenedNode opened = HidrawFile::opener("/dev/null")();
    ASSERT_NE(opened.node, nullptr);
    EXPECT_EQ(::fcntl(opened.node->descriptor(), F_GETFD) & FD_CLOEXEC, FD_CLOEXEC);
    EXPECT_EQ(::fcntl(opened.node->descriptor(), F_GETFL) & (O_ACCMODE | O_NONBLOCK), O_RDONLY | O_NONBLOCK);
}

TEST(HidrawFile, ReadsWhatComes) {
    std::array<std::uint8_t, 4> buffer{1, 2, 3, 4};
    IoResult result = HidrawFile::open("/dev/zero").node->read(buffer);
    EXPECT_EQ(result.errorNumber, 0);
    EXPECT_EQ(result.count, 4u);
    EXPECT_EQ(buffer, (std::array<std::uint8_t, 4>{}));
    result = HidrawFile::open("/dev/null").node->read(buffer);
    EXPECT_EQ(result.errorNumber, 0);
    EXPECT_EQ(result.count, 0u) << "the end";
    EXPECT_EQ(HidrawFile::open("/").node->read(buffer).errorNumber, EISDIR);
}

TEST(HidrawFile, HasADeviceNumberIfItIsACharacterDevice) {
    std::uint64_t number = 0;
    EXPECT_EQ(HidrawFile::open("/dev/null").node->deviceNumber(number).errorNumber, 0);
    EXPECT_EQ(number, makedev(1, 3));
    EXPECT_EQ(HidrawFile::open("/").node->deviceNumber(number).errorNumber, ENOTTY);
    EXPECT_EQ(HidrawFile::open("/etc/passwd").node->deviceNumber(number).errorNumber, ENOTTY);
}

TEST(HidrawFile, CanBeLockedOnceUntilItIsClosed) {
    OpenedNode first = HidrawFile::open("/dev/null");
    const OpenedNode second = HidrawFile::open("/dev/null");
    EXPECT_EQ(first.node->lock().errorNumber, 0);
    EXPECT_EQ(second.node->lock().errorNumber, EWOULDBLOCK);
    std::array<std::uint8_t, 1> buffer{};
    EXPECT_EQ(second.node->read(buffer).errorNumber, 0) << "reading goes on";
    first.node.reset();
    EXPECT_EQ(second.node->lock().errorNumber, 0);
}

TEST(HidrawFile, OfNoHidDeviceAnswersNothing) {
    const OpenedNode opened = HidrawFile::open("/dev/null");
    std::array<std::uint8_t, 64> buffer{4};
    HidrawInfo info;
    EXPECT_EQ(opened.node->info(info).errorNumber, ENOTTY);
    for (const HidrawText which : {HidrawText::Name, HidrawText::PhysicalPath, HidrawText::UniqueId})
        EXPECT_EQ(opened.node->text(which, buffer).errorNumber, ENOTTY);
    EXPECT_EQ(opened.node->reportDescriptor(buffer).errorNumber, ENOTTY);
    EXPECT_EQ(opened.node->featureReport(buffer).errorNumber, ENOTTY);
}

} // namespace
} // namespace ZorvaTouch::Linux
