#include "Host/Runtime/Signals.h"
#include "Tests/Daemon/DaemonFixture.h"
#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <gmock/gmock.h>
#include <umockdev.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using Linux::Tests::Bytes;
using Linux::Tests::FakeNode;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;
using Tests::Lines;
using Tests::TouchScript;

/// A text of the library's.
std::string owned(gchar *text) {
    const std::unique_ptr<gchar, void (*)(void *)> owner(text, ::g_free);
    return text;
}

/// The daemon in a /sys of our own, whose device events the kernel might have sent.
class DaemonHotplug : public Tests::DaemonFixture {
protected:
    /// Two syspaths.
    struct Device {
        std::string hid, node;
    };

    /// As the program does, before the first thread: the mock library has threads before the daemon exists.
    static void SetUpTestSuite() { Host::blockForGood(Daemon::kSignals); }

    void SetUp() override {
        ASSERT_TRUE(::umockdev_in_mock_environment()) << "run by umockdev-wrapper";
        for (const char *const node : {"/dev/hidraw1", "/dev/hidraw2", "/dev/hidraw3"})
            openers[node];
        options.accel.choice = AccelOption::Choice::None; // one that listens is enough for the library
    }

    /// Adds a device, with the events of it: its driver is still at work.
    Device add(const std::string &number, const char *serial, const char *id = "0003:00001234:0000ABCD") {
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
    void tell(const std::string &syspath, const char *what) {
        ::umockdev_testbed_uevent(testbed.get(), syspath.c_str(), what);
    }
    void bind(const Device &device) { tell(device.hid, "bind"); }
    Device plug(const std::string &number, const char *serial) {
        const Device device = add(number, serial);
        bind(device);
        return device;
    }
    /// The events of a removal, and no trace of it in /sys.
    void remove(const Device &device) {
        tell(device.node, "remove");
        ::umockdev_testbed_remove_device(testbed.get(), device.node.c_str());
        ::umockdev_testbed_remove_device(testbed.get(), device.hid.c_str());
    }

    [[nodiscard]] std::shared_ptr<FakeNode> node(const std::string &number) {
        return openers.at("/dev/hidraw" + number).node();
    }
    void send(const std::string &number, const std::vector<Bytes> &reports) {
        const auto to = node(number);
        ASSERT_NE(to, nullptr);
        for (const Bytes &report : reports)
            to->send(report);
    }
    /// Waits until so many lines of this state have been told.
    void waitForState(const std::string &state, std::size_t count) {
        output->lines.waitFor("\"state\":\"" + state + "\"", count);
    }
    /// The surface lines, as "opened SN1".
    [[nodiscard]] Lines surfaces() const {
        Lines all;
        for (const std::string &line : linesWith("\"type\":\"surface\""))
            all.push_back(valueOf(line, "state") + " " + valueOf(line, "surface"));
        return all;
    }
    static std::string valueOf(const std::string &line, const std::string &key) {
        const std::string before = "\"" + key + "\":\"";
        const std::size_t begin = line.find(before) + before.size();
        return line.substr(begin, line.find('"', begin) - begin);
    }

    /// It starts threads, which must not take the daemon's signals.
    [[nodiscard]] static UMockdevTestbed *newTestbed() {
        Host::blockForGood(Daemon::kSignals);
        return ::umockdev_testbed_new();
    }

    const std::unique_ptr<UMockdevTestbed, void (*)(void *)> testbed{newTestbed(), ::g_object_unref};
};

TEST_F(DaemonHotplug, UsesWhatIsThereWhenItStarts) {
    plug("1", "SN1");
    add("2", "SN2", "0003:00001234:0000ABCC"); // another make
    start();
    runWhile([this] {
        TouchScript touch;
        waitForState("opened", 1);
        send("1", touch.tapPlay());
        output->lines.waitFor("\"type\":\"key\"", 2);
    });
    finish();
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "opened SN1"));
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +164", "1 -164", "1 unplugged"));
    EXPECT_EQ(node("1"), nullptr);
}

TEST_F(DaemonHotplug, EndsWhenAnotherProgramUsesASurface) {
    plug("1", "SN1");
    openers.at("/dev/hidraw1").errors = {EBUSY};
    start();
    try {
        daemon->run();
        ADD_FAILURE() << "it serves";
    } catch (const SurfaceInUse &error) {
        EXPECT_STREQ(error.what(),
                     "/dev/hidraw1: another program uses it; end that, or wait for it with --wait");
    }
}

TEST_F(DaemonHotplug, WaitsForASurfaceThatAnotherProgramUsesIfTold) {
    options.waits = true;
    plug("1", "SN1");
    openers.at("/dev/hidraw1").errors = {EBUSY};
    start();
    runWhile([this] { waitForState("opened", 1); });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "failed SN1", "opened SN1"));
}

TEST_F(DaemonHotplug, OneThatComesLaterAndIsUsedIsTriedAgain) {
    openers.at("/dev/hidraw1").errors = {EBUSY};
    start();
    runWhile([this] {
        plug("1", "SN1");
        waitForState("opened", 1);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "failed SN1", "opened SN1"));
}

TEST_F(DaemonHotplug, KeepsThePlugInWhenItsFileIsReplaced) {
    const Tests::TemporaryFolder folder;
    const std::string replaced = folder.path("plugin.so");
    std::filesystem::copy_file(plugIn, replaced);
    plugIn = replaced;
    start();
    std::filesystem::remove(replaced); // as an upgrade does: the old file stays as it is
    std::ofstream(replaced) << "no plug-in";
    runWhile([this] {
        TouchScript touch;
        plug("1", "SN1");
        waitForState("opened", 1);
        send("1", touch.tapPlay());
        output->lines.waitFor("\"type\":\"key\"", 2);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "opened SN1"));
}

TEST_F(DaemonHotplug, WaitsForTheDriverAndThenOpens) {
    start();
    EXPECT_EQ(logs.lines().count("Daemon: no touch surface found; waiting for one"), 1u);
    runWhile([this] {
        const Device first = add("1", "SN1");
        plug("2", "SN2");
        waitForState("opened", 1);
        bind(first);
        waitForState("opened", 2);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN2", "opened SN2", "added SN1", "opened SN1"));
}

TEST_F(DaemonHotplug, OneThatComesAndGoesLeavesTheHoldOnAnother) {
    start();
    runWhile([this] {
        TouchScript touch;
        plug("1", "SN1");
        waitForState("opened", 1);
        send("1", touch.holdLouder());
        waitForState("down", 1);
        const Device other = plug("2", "SN2");
        waitForState("opened", 2);
        remove(other);
        waitForState("removed", 1);
        EXPECT_THAT(keys.down(), ElementsAre(kKeyVolumeUp));
        send("1", touch.letGo());
        waitForState("up", 1);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "opened SN1", "added SN2", "opened SN2", "removed SN2"));
}

TEST_F(DaemonHotplug, UnpluggingReleasesAndComingBackWorks) {
    start();
    runWhile([this] {
        TouchScript first, second;
        const Device device = plug("1", "SN1");
        waitForState("opened", 1);
        send("1", first.holdLouder());
        waitForState("down", 1);
        node("1")->unplug();
        waitForState("up", 1);
        remove(device);
        waitForState("removed", 1);
        plug("2", "SN1"); // at another place
        waitForState("opened", 2);
        send("2", second.tapPlay());
        waitForState("up", 2);
    });
    // The input thread and the system tell of it at the same time.
    EXPECT_THAT(surfaces(), testing::AnyOf(ElementsAre("added SN1", "opened SN1", "removed SN1", "added SN1",
                                                       "opened SN1"),
                                           ElementsAre("added SN1", "opened SN1", "lost SN1", "removed SN1",
                                                       "added SN1", "opened SN1")));
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 +164", "1 -164"));
}

TEST_F(DaemonHotplug, ARemovalBeforeTheDriverHasFinishedIsNothing) {
    start();
    runWhile([this] {
        const Device device = add("1", "SN1");
        tell(device.node, "remove");
        bind(device);
        plug("2", "SN2");
        waitForState("opened", 1);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN2", "opened SN2"));
}

TEST_F(DaemonHotplug, RemovingTwiceAndBindingTwiceIsOnce) {
    start();
    runWhile([this] {
        const Device device = plug("1", "SN1");
        bind(device);
        tell(device.node, "change");
        waitForState("opened", 1);
        tell(device.node, "remove");
        tell(device.node, "remove");
        waitForState("removed", 1);
        plug("2", "SN2");
        waitForState("opened", 2);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "opened SN1", "removed SN1", "added SN2", "opened SN2"));
}

TEST_F(DaemonHotplug, ComingBackBeforeTheOldOneIsGoneIsAnotherSurface) {
    start();
    runWhile([this] {
        const Device old = plug("1", "SN1");
        plug("2", "SN1");
        waitForState("opened", 2);
        remove(old);
        waitForState("removed", 1);
    });
    EXPECT_THAT(surfaces(),
                ElementsAre("added SN1", "opened SN1", "added SN1@usb-2", "opened SN1@usb-2", "removed SN1"));
}

TEST_F(DaemonHotplug, OneThatMayNotBeOpenedIsTriedUntilItMay) {
    openers.at("/dev/hidraw1").errors = {EACCES};
    start();
    runWhile([this] {
        plug("1", "SN1");
        waitForState("failed", 1);
        waitForState("opened", 1); // by itself, a quarter of a second later
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "failed SN1", "opened SN1"));
    EXPECT_THAT(linesWith("a udev rule gives access to it"), SizeIs(1));
}

TEST_F(DaemonHotplug, OneThatFailsIsTriedAgain) {
    start();
    runWhile([this] {
        plug("1", "SN1");
        waitForState("opened", 1);
        node("1")->unplug(); // and the system says nothing
        waitForState("opened", 2);
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN1", "opened SN1", "lost SN1", "opened SN1"));
}

TEST_F(DaemonHotplug, ReadsThatOnlyFailDoNotFloodTheLog) {
    for (auto &[path, opener] : openers)
        opener.prepare = [](FakeNode &opened) { opened.readErrors.assign(8, EINVAL); };
    start();
    runWhile([this] {
        for (const char *const number : {"1", "2", "3"})
            plug(number, number);
        waitForState("opened", 3);
        for (const char *const number : {"1", "2", "3"})
            node(number)->send({0});
        waitForState("opened", 6);
    });
    finish();
    EXPECT_EQ(logs.lines().count("Surfaces error: a report was lost: read: Invalid argument"), 5u);
    EXPECT_EQ(logs.lines().count("19 more of this in the last 30 s: a report was lost"), 1u);
}

TEST_F(DaemonHotplug, APathThatIsNamedIsTheOnlyOne) {
    options.devices = {"/dev/hidraw2"};
    start();
    runWhile([this] {
        plug("1", "SN1");
        plug("2", "SN2");
        waitForState("opened", 1);
        plug("3", "SN3");
    });
    EXPECT_THAT(surfaces(), ElementsAre("added SN2", "opened SN2"));
}

TEST_F(DaemonHotplug, FiftyComingsAndGoingsKeepNoDescriptor) {
    start();
    std::ptrdiff_t before = 0;
    std::ptrdiff_t after = -1;
    runWhile([&] {
        for (std::size_t i = 1; i <= 60; ++i) {
            const Device device = plug("1", "SN1");
            waitForState("opened", i); // or the daemon might find no trace of it
            remove(device);
            waitForState("removed", i);
            if (i == 10)
                before = Linux::Tests::openDescriptors();
        }
        after = Linux::Tests::openDescriptors();
    });
    EXPECT_LT(after, before + 10); // the main thread may just be reading something; fifty would be one each
    EXPECT_THAT(logs.lines().count("no touch surface found"), 1u);
}

} // namespace
} // namespace ZorvaTouch::Tools
