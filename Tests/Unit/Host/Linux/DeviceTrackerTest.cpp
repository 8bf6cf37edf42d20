#include "Host/Linux/DeviceTracker.h"

#include <gmock/gmock.h>

#include <filesystem>
#include <string>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// --- Identities
// ----------------------------------------------------------------------------------------------

TEST(HidIds, AreReadFromTheKernelsText) {
    EXPECT_EQ(parseHidId("0003:00001234:0000ABCD"), (BusHidId{3, {0x1234, 0xABCD}}));
    EXPECT_EQ(parseHidId("0006:0000ffff:00000000"), (BusHidId{6, {0xFFFF, 0}}));
    EXPECT_EQ(parseHidId("3:1:2"), (BusHidId{3, {1, 2}}));
}

TEST(HidIds, AreNothingElse) {
    for (const char *const text :
         {"", ":", "::", "0003", "0003:00001234", "0003:00001234:", "0003:00001234:0000ABCD:",
          "0003::0000ABCD", "0003:00011234:0000ABCD", "0003:00001234:0001ABCD", "100000000:00001234:0000ABCD",
          "0003:00001234:0000ABCD ", " 0003:00001234:0000ABCD", "0003:-1:0000ABCD", "0003:0x1234:0000ABCD",
          "0003;00001234;0000ABCD", "zorva"})
        EXPECT_EQ(parseHidId(text), std::nullopt) << text;
}

const UeventProperties kProperties{{"HID_ID", "0003:00001234:0000ABCD"},
                                   {"HID_NAME", "Zorva Touch"},
                                   {"HID_PHYS", "usb-1/input0"},
                                   {"HID_UNIQ", "SN1"}};

TEST(DeviceIdentities, ArePutTogetherFromProperties) {
    const auto identity = makeIdentity("/dev/hidraw3", "/sys/h/hidraw/hidraw3", "/sys/h", kProperties);
    ASSERT_TRUE(identity);
    EXPECT_EQ(identity->devnode, "/dev/hidraw3");
    EXPECT_EQ(identity->syspath, "/sys/h/hidraw/hidraw3");
    EXPECT_EQ(identity->hidSyspath, "/sys/h");
    EXPECT_EQ(identity->bus, 3u);
    EXPECT_EQ(identity->id, (HidId{0x1234, 0xABCD}));
    EXPECT_EQ(identity->name, "Zorva Touch");
    EXPECT_EQ(identity->physicalPath, "usb-1/input0");
    EXPECT_EQ(identity->serial, "SN1");
    EXPECT_EQ(identity->stableId(), "SN1");
}

TEST(DeviceIdentities, AreStableByPlaceWithoutASerialNumber) {
    UeventProperties properties = kProperties;
    properties["HID_UNIQ"] = "";
    EXPECT_EQ(makeIdentity("/dev/hidraw3", "/sys/n", "/sys/h", properties)->stableId(), "usb-1/input0");
    properties.erase("HID_UNIQ");
    properties.erase("HID_PHYS");
    EXPECT_EQ(makeIdentity("/dev/hidraw3", "/sys/n", "/sys/h", properties)->stableId(), "/sys/n");
}

TEST(DeviceIdentities, NeedANodeAndAnId) {
    EXPECT_FALSE(makeIdentity("", "/sys/n", "/sys/h", kProperties));
    EXPECT_FALSE(makeIdentity("/dev/hidraw3", "/sys/n", "/sys/h", {}));
    EXPECT_FALSE(makeIdentity("/dev/hidraw3", "/sys/n", "/sys/h", {{"HID_ID", "none"}}));
    EXPECT_EQ(makeIdentity("/dev/hidraw3", "/sys/n", "/sys/h", {{"HID_ID", "3:1:2"}})->name, "");
}

// --- Tracking
// ------------------------------------------------------------------------------------------------

class DeviceTracking : public testing::Test, private DeviceListener {
protected:
    /// The node of that number on the HID device of the same number.
    static DeviceIdentity node(int number, HidId id = {1, 2}) {
        const std::string hid = "/sys/" + std::to_string(number);
        return {.devnode = "/dev/hidraw" + std::to_string(number),
                .syspath = hid + "/hidraw",
                .hidSyspath = hid,
                .id = id,
                .serial = {},
                .physicalPath = {},
                .name = {}};
    }
    std::vector<std::string> takeTold() { return std::exchange(told, {}); }

    std::vector<std::string> told;
    DeviceTracker tracker{{{{1, 2}, {1, 3}}, {"/dev/hidraw7"}}, *this};

private:
    void onAdded(const DeviceIdentity &device) override { told.push_back("+" + device.devnode); }
    void onRemoved(const DeviceIdentity &device) override { told.push_back("-" + device.devnode); }
};

TEST_F(DeviceTracking, TellsOfTheMakesThatAreWanted) {
    tracker.added(node(0, {1, 2}), true);
    tracker.added(node(1, {1, 3}), true);
    tracker.added(node(2, {1, 4}), true);
    tracker.added(node(3, {2, 2}), true);
    for (int number = 0; number < 4; ++number)
        tracker.removed(node(number).syspath);
    EXPECT_THAT(told, ElementsAre("+/dev/hidraw0", "+/dev/hidraw1", "-/dev/hidraw0", "-/dev/hidraw1"));
}

TEST_F(DeviceTracking, TellsOfTheNodesThatAreWantedWhateverTheirMake) {
    tracker.added(node(7, {2, 2}), true);
    tracker.added(node(8, {2, 2}), true);
    EXPECT_THAT(told, ElementsAre("+/dev/hidraw7"));
}

TEST(DeviceFilters, FollowLinksWhenTheDeviceComes) {
    const std::filesystem::path link = testing::TempDir() + "zorva-link";
    std::filesystem::remove(link);
    const DeviceFilter filter{{}, {link}};
    DeviceIdentity device;
    device.devnode = "/dev/null";
    EXPECT_FALSE(filter.matches(device)) << "there is no such link yet";
    std::filesystem::create_symlink("/dev/null", link);
    EXPECT_TRUE(filter.matches(device));
    std::filesystem::remove(link);
}

TEST_F(DeviceTracking, TellsOnce) {
    tracker.added(node(0), true);
    tracker.added(node(0), true);
    tracker.added(node(0), false);
    tracker.bound("/sys/0");
    EXPECT_THAT(takeTold(), ElementsAre("+/dev/hidraw0"));
    tracker.removed("/sys/0/hidraw");
    tracker.removed("/sys/0/hidraw");
    EXPECT_THAT(takeTold(), ElementsAre("-/dev/hidraw0"));
}

TEST_F(DeviceTracking, WaitsUntilTheDriverHasFinished) {
    tracker.added(node(0), false);
    tracker.added(node(1), false);
    EXPECT_THAT(told, IsEmpty());
    tracker.bound("/sys/1");
    EXPECT_THAT(told, ElementsAre("+/dev/hidraw1"));
    tracker.bound("/sys/0");
    EXPECT_THAT(told, ElementsAre("+/dev/hidraw1", "+/dev/hidraw0"));
}

TEST_F(DeviceTracking, DoesNotTellOfADeviceThatGoesBeforeItIsReady) {
    tracker.added(node(0), false);
    tracker.removed("/sys/0/hidraw");
    tracker.bound("/sys/0");
    EXPECT_THAT(told, IsEmpty());
}

TEST_F(DeviceTracking, IgnoresDriversOfOtherDevices) {
    tracker.added(node(0), false);
    tracker.bound("/sys");
    tracker.bound("/sys/00");
    tracker.bound("");
    EXPECT_THAT(told, IsEmpty());
}

TEST_F(DeviceTracking, TellsOfADeviceThatComesBack) {
    tracker.added(node(0), true);
    tracker.removed("/sys/0/hidraw");
    tracker.added(node(0), false);
    EXPECT_THAT(takeTold(), ElementsAre("+/dev/hidraw0", "-/dev/hidraw0"));
    tracker.bound("/sys/0");
    EXPECT_THAT(takeTold(), ElementsAre("+/dev/hidraw0"));
}

TEST_F(DeviceTracking, TellsTheDifferenceToAList) {
    tracker.replaceAll({node(0), node(1), node(9, {9, 9})});
    EXPECT_THAT(takeTold(), ElementsAre("+/dev/hidraw0", "+/dev/hidraw1"));
    tracker.replaceAll({node(1), node(2)});
    EXPECT_THAT(takeTold(), ElementsAre("-/dev/hidraw0", "+/dev/hidraw2"));
    tracker.replaceAll({});
    EXPECT_THAT(takeTold(), ElementsAre("-/dev/hidraw1", "-/dev/hidraw2"));
}

TEST_F(DeviceTracking, KeepsWaitingForDevicesThatAListDoesNotHaveYet) {
    tracker.added(node(0), false);
    tracker.added(node(1), false);
    tracker.replaceAll({node(1)});
    EXPECT_THAT(takeTold(), ElementsAre("+/dev/hidraw1"));
    tracker.bound("/sys/0");
    EXPECT_THAT(takeTold(), ElementsAre("+/dev/hidraw0"));
}

} // namespace
} // namespace ZorvaTouch::Linux
