#include "Host/Linux/IioSetup.h"

#include "Tests/Unit/Host/Linux/SensorFolder.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>

namespace ZorvaTouch::Linux {
namespace {

using Tests::SensorFolder;

/// Says 65536 and lets nobody write, not even root.
constexpr const char *kReadOnlyNumber = "/proc/sys/kernel/ngroups_max";

class IioSetup : public testing::Test {
protected:
    /// What it says, without the folder in front of it.
    std::string failureOf(const std::function<void()> &body) const {
        try {
            body();
        } catch (const IioFailure &failure) {
            std::string text = failure.what();
            if (text.starts_with(folder.path()))
                text.erase(0, folder.path().size());
            return text;
        }
        return "none";
    }
    std::string scanFailure() const {
        return failureOf([this] { static_cast<void>(prepareScan(device)); });
    }
    std::string element(const std::string &name) const { return folder.get("scan_elements/" + name + "_en"); }

    SensorFolder folder;
    IioSysfs device{folder.path()};
};

// --- Scans -------------------------------------------------------------------------------------------------

TEST_F(IioSetup, TurnsOnTheAxesAndTheTimeAndNothingElse) {
    folder.set("scan_elements/in_temp_en", "1");
    folder.set("scan_elements/in_accel_y_en", "1");
    const IioScan scan = prepareScan(device);
    EXPECT_EQ(scan.size(), 24u);
    EXPECT_TRUE(scan.hasTimestamp());
    for (const char *const name : {"in_accel_x", "in_accel_y", "in_accel_z", "in_timestamp"})
        EXPECT_EQ(element(name), "1") << name;
    EXPECT_EQ(element("in_temp"), "0");
}

TEST_F(IioSetup, ReadsPastWhatCannotBeTurnedOff) {
    folder.replace("scan_elements/in_temp_en", kReadOnlyNumber);
    folder.set("scan_elements/in_temp_type", "le:s64/64>>0");
    EXPECT_EQ(prepareScan(device).size(), 32u) << "8, 12, 4 between, 8";
}

TEST_F(IioSetup, DoesWithoutATime) {
    folder.remove("scan_elements/in_timestamp_en");
    const IioScan scan = prepareScan(device);
    EXPECT_EQ(scan.size(), 12u);
    EXPECT_FALSE(scan.hasTimestamp());
}

TEST_F(IioSetup, PrefersTheScaleAndOffsetOfAnAxis) {
    folder.set("in_accel_y_scale", "9.80665");
    folder.set("in_accel_z_offset", "-1000");
    folder.remove("scan_elements/in_timestamp_en");
    const IioScan scan = prepareScan(device);
    const std::vector<std::uint8_t> bytes{0xE8, 3, 0, 0, 2, 0, 0, 0, 0xD0, 7, 0, 0};
    EXPECT_EQ(scan.decode(bytes).g, (std::array<float, 3>{1, 2, 1}));
}

TEST_F(IioSetup, DoesWithoutAnOffsetButNotWithoutAScale) {
    folder.remove("in_accel_offset");
    EXPECT_EQ(scanFailure(), "none");
    folder.remove("in_accel_scale");
    EXPECT_EQ(scanFailure(), " does not say the scale of in_accel_x");
    folder.set("in_accel_scale", "");
    EXPECT_EQ(scanFailure(), R"(/in_accel_scale is no number: "")");
}

TEST_F(IioSetup, RefusesElementsThatMakeNoSense) {
    folder.set("scan_elements/in_accel_z_index", "-1");
    EXPECT_EQ(scanFailure(), R"(/scan_elements/in_accel_z_index is no count: "-1")");
    folder.set("scan_elements/in_accel_z_index", "2");
    EXPECT_EQ(scanFailure(), " has no buffer with an x, a y and a z");
    folder.set("scan_elements/in_accel_z_index", "3");
    folder.set("scan_elements/in_accel_z_type", "le:s0/32>>0");
    EXPECT_EQ(scanFailure(),
              R"(/scan_elements/in_accel_z_type is no format of a scan's value: "le:s0/32>>0")");
    folder.remove("scan_elements");
    EXPECT_EQ(scanFailure(), " has no buffer with an x, a y and a z");
}

TEST_F(IioSetup, SaysWhichElementCannotBeRead) {
    folder.refuseWrites("scan_elements/in_accel_x_en");
    EXPECT_EQ(scanFailure(), "read " + folder.path() + "/scan_elements/in_accel_x_en: Message too long");
}

// --- Triggers ----------------------------------------------------------------------------------------------

TEST_F(IioSetup, LeavesATriggerThatIsThere) {
    folder.set("trigger/current_trigger", "somebody's");
    prepareTrigger(device);
    EXPECT_EQ(folder.get("trigger/current_trigger"), "somebody's");
    folder.remove("trigger");
    prepareTrigger(device);
}

TEST_F(IioSetup, TakesTheTriggerOfTheDeviceItself) {
    folder.set("trigger/current_trigger", "");
    folder.addTrigger(0, "accel_3d-any-motion-dev0");
    folder.addTrigger(1, "accel_3d-dev1");
    folder.addTrigger(2, "accel_3d-trigger");
    prepareTrigger(device);
    EXPECT_EQ(folder.get("trigger/current_trigger"), "accel_3d-trigger");
    folder.set("trigger/current_trigger", "");
    folder.addTrigger(3, "accel_3d-dev0");
    prepareTrigger(device);
    EXPECT_EQ(folder.get("trigger/current_trigger"), "accel_3d-dev0") << "its number is the better sign";
}

TEST_F(IioSetup, SaysThatThereIsNoTrigger) {
    const auto prepare = [this] { prepareTrigger(device); };
    const std::string missing = " has no trigger; write the name of one to its trigger/current_trigger";
    folder.set("trigger/current_trigger", "");
    EXPECT_EQ(failureOf(prepare), missing);
    folder.addTrigger(0, "others-dev0");
    EXPECT_EQ(failureOf(prepare), missing);
    folder.remove("subsystem");
    EXPECT_EQ(failureOf(prepare), missing);
}

// --- Buffer ------------------------------------------------------------------------------------------------

TEST_F(IioSetup, TakesTheMonotonicClock) {
    EXPECT_TRUE(prepareClock(device));
    EXPECT_EQ(folder.get("current_timestamp_clock"), "monotonic");
    folder.refuseWrites("current_timestamp_clock");
    EXPECT_FALSE(prepareClock(device));
    folder.remove("current_timestamp_clock");
    EXPECT_FALSE(prepareClock(device));
}

TEST_F(IioSetup, MakesAShortBufferThatWakesForEachScan) {
    prepareBuffer(device);
    EXPECT_EQ(folder.get("buffer/length"), "32");
    EXPECT_EQ(folder.get("buffer/watermark"), "1");
    folder.remove("buffer/watermark");
    folder.refuseWrites("buffer/length");
    prepareBuffer(device);
}

TEST_F(IioSetup, StartsAndStopsTheBuffer) {
    startBuffer(device);
    EXPECT_EQ(folder.get("buffer/enable"), "1");
    stopBuffer(device);
    EXPECT_EQ(folder.get("buffer/enable"), "0");
    folder.refuseWrites("buffer/enable");
    EXPECT_EQ(failureOf([this] { startBuffer(device); }),
              "write " + folder.path() + "/buffer/enable: No space left on device");
    stopBuffer(device);
    folder.remove("buffer");
    stopBuffer(device);
}

// --- Frequencies -------------------------------------------------------------------------------------------

TEST_F(IioSetup, AsksForTheFrequencyOfAnInterval) {
    EXPECT_EQ(setSamplingInterval(device, 10000), "100");
    EXPECT_EQ(folder.get("in_accel_sampling_frequency"), "100");
    EXPECT_EQ(setSamplingInterval(device, 16384), "61.035156");
    EXPECT_EQ(setSamplingInterval(device, 80000), "12.5");
    EXPECT_EQ(setSamplingInterval(device, 1e9), "0.001");
    EXPECT_EQ(setSamplingInterval(device, 1), "1000000");
}

TEST_F(IioSetup, AsksForNothingThatMakesNoSense) {
    folder.set("in_accel_sampling_frequency", "25");
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const double infinity = std::numeric_limits<double>::infinity();
    for (const double interval : {0.0, -0.0, -10000.0, 0.5, 1.1e9, 1e-320, infinity, -infinity, nan})
        EXPECT_EQ(setSamplingInterval(device, interval), "25") << interval;
}

TEST_F(IioSetup, FindsTheFrequencyWhereverItIs) {
    folder.remove("in_accel_sampling_frequency");
    EXPECT_EQ(setSamplingInterval(device, 10000), std::nullopt);
    folder.set("sampling_frequency", "25");
    EXPECT_EQ(setSamplingInterval(device, 10000), "100");
    folder.set("in_accel_x_sampling_frequency", "25");
    EXPECT_EQ(setSamplingInterval(device, 20000), "50");
    EXPECT_EQ(folder.get("sampling_frequency"), "100");
}

TEST_F(IioSetup, ADeviceThatRefusesKeepsItsFrequency) {
    folder.replace("in_accel_sampling_frequency", kReadOnlyNumber);
    EXPECT_EQ(setSamplingInterval(device, 10000), "65536");
    folder.set("in_accel_sampling_frequency_available", "12.5 25 50");
    EXPECT_EQ(setSamplingInterval(device, 10000), "65536");
}

} // namespace
} // namespace ZorvaTouch::Linux
