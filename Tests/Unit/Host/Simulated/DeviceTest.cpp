#include "Host/Simulated/Device.h"

#include "Plugin/ValueObject.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Simulated {
namespace {

using Bytes = std::vector<std::uint8_t>;

class SimulatedDevice : public testing::Test {
protected:
    /// The bytes of a feature report read into a buffer of that size; nothing, and the status, if it fails.
    Bytes feature(std::uint32_t id, std::size_t bufferSize = 64) {
        Bytes buffer(bufferSize);
        std::size_t length = bufferSize;
        status = device->table->getFeatureReport(device.get(), id, buffer.data(), &length);
        EXPECT_LE(length, bufferSize);
        buffer.resize(length);
        return buffer;
    }
    PropertyValue property(const char *key) {
        const ZorvaValue *const value = device->table->copyProperty(device.get(), key);
        return readValue(Ref<const ZorvaValue>::adopt(value).get());
    }
    bool setProperty(const char *key, const PropertyValue &value) {
        return device->table->setProperty(device.get(), key, makeValue(value).get()) != 0;
    }
    ZorvaStatus open(std::uint32_t options) { return device->table->open(device.get(), options); }
    ZorvaStatus close(std::uint32_t options) { return device->table->close(device.get(), options); }

    Ref<Device> device = Device::create();
    ZorvaStatus status = 0;
};

TEST_F(SimulatedDevice, OpensAndClosesAndKeepsTheOptions) {
    EXPECT_EQ(device->counters().openOptions, std::nullopt);
    EXPECT_EQ(device->counters().closeOptions, std::nullopt);
    EXPECT_EQ(open(5), 0u);
    EXPECT_EQ(close(6), 0u);
    EXPECT_EQ(device->counters().openOptions, 5u);
    EXPECT_EQ(device->counters().closeOptions, 6u);
    EXPECT_EQ(device->counters().opened, 1u);
    EXPECT_EQ(device->counters().closed, 1u);
}

TEST_F(SimulatedDevice, FailsToOpenAndCloseWhenItIsTold) {
    device->setOpenStatus(0xE00002C5);
    device->setCloseStatus(0xE00002C6);
    EXPECT_EQ(open(7), 0xE00002C5u);
    EXPECT_EQ(close(8), 0xE00002C6u);
    EXPECT_EQ(device->counters().openOptions, 7u);
    EXPECT_EQ(device->counters().closeOptions, 8u);
    EXPECT_EQ(device->counters().opened, 0u);
    EXPECT_EQ(device->counters().closed, 0u);
}

TEST_F(SimulatedDevice, AnswersEightDebugReportsAndRefusesTwo) {
    for (const std::uint8_t id : Bytes{0x04, 0x10, 0x11, 0x13, 0x1D, 0x32, 0x3C, 0x3F}) {
        EXPECT_EQ(feature(id), (Bytes{id, 1, 2, 3, 4})) << int{id};
        EXPECT_EQ(status, 0u) << int{id};
    }
    for (const std::uint32_t id : {0x12u, 0x3Bu}) {
        EXPECT_EQ(feature(id), Bytes()) << id;
        EXPECT_EQ(status, 0xE00002C7u) << id;
    }
}

TEST_F(SimulatedDevice, HoldsItsResetGestureForTenThousand) {
    EXPECT_EQ(feature(31), (Bytes{0x1F, 0x10, 0x27, 0, 0}));
}

TEST_F(SimulatedDevice, HasNoOtherFeatureReports) {
    EXPECT_EQ(feature(0x05), Bytes());
    EXPECT_EQ(status, 0xE00002C7u);
    EXPECT_EQ(feature(0x11F), Bytes()) << "IDs are compared whole";
    EXPECT_EQ(status, 0xE00002C7u);
}

TEST_F(SimulatedDevice, AnswersFeatureReportsAsItIsTold) {
    device->setFeatureReport(0x12, {0x12, 9});
    device->failFeatureReport(0x04, 0xE00002BC);
    EXPECT_EQ(feature(0x12), (Bytes{0x12, 9}));
    EXPECT_EQ(feature(0x04), Bytes());
    EXPECT_EQ(status, 0xE00002BCu);
}

TEST_F(SimulatedDevice, CutsAFeatureReportToTheBufferAndSaysSo) {
    EXPECT_EQ(feature(0x04, 3), (Bytes{0x04, 1, 2}));
    EXPECT_EQ(feature(0x04, 5), (Bytes{0x04, 1, 2, 3, 4}));
    EXPECT_EQ(feature(0x04, 0), Bytes());
    EXPECT_EQ(status, 0u);
    std::size_t length = 10;
    EXPECT_EQ(device->table->getFeatureReport(device.get(), 0x04, nullptr, &length), 0u);
    EXPECT_EQ(length, 0u) << "no buffer holds nothing";
}

TEST_F(SimulatedDevice, HasAProductASerialNumberAndIds) {
    EXPECT_EQ(property("Product"), PropertyValue("Simulated touch sensor"));
    EXPECT_EQ(property("SerialNumber"), PropertyValue("SIM0001"));
    EXPECT_EQ(property("VendorID"), PropertyValue(0x1234u));
    EXPECT_EQ(property("ProductID"), PropertyValue(0xABCDu));
}

TEST_F(SimulatedDevice, HasNoPropertyThatNobodySet) {
    EXPECT_EQ(device->table->copyProperty(device.get(), "product"), nullptr);
    EXPECT_EQ(device->table->copyProperty(device.get(), ""), nullptr);
    EXPECT_EQ(device->table->copyProperty(device.get(), nullptr), nullptr);
}

TEST_F(SimulatedDevice, TakesProperties) {
    EXPECT_TRUE(setProperty("Product", "other"));
    EXPECT_TRUE(setProperty("New", 5u));
    EXPECT_EQ(property("Product"), PropertyValue("other"));
    EXPECT_EQ(device->properties().get("New"), PropertyValue(5u));
    EXPECT_FALSE(setProperty(nullptr, 5u));
}

TEST_F(SimulatedDevice, NullTakesAPropertyAway) {
    EXPECT_EQ(device->table->setProperty(device.get(), "Product", nullptr), 1);
    EXPECT_TRUE(setProperty("Never", PropertyValue()));
    EXPECT_EQ(device->table->copyProperty(device.get(), "Product"), nullptr);
    EXPECT_EQ(device->table->copyProperty(device.get(), "Never"), nullptr);
}

TEST_F(SimulatedDevice, RefusesWritesOfReadOnlyProperties) {
    device->properties().makeReadOnly("VendorID");
    device->properties().makeReadOnly("Absent");
    EXPECT_FALSE(setProperty("VendorID", 1u));
    EXPECT_FALSE(setProperty("Absent", 1u));
    EXPECT_EQ(property("VendorID"), PropertyValue(0x1234u));
    device->properties().set("VendorID", 2u);
    EXPECT_EQ(property("VendorID"), PropertyValue(2u)) << "the device's own side may";
}

TEST_F(SimulatedDevice, APropertyOutlivesIt) {
    const auto value = Ref<const ZorvaValue>::adopt(device->table->copyProperty(device.get(), "VendorID"));
    device.reset();
    EXPECT_EQ(readValue(value.get()), PropertyValue(0x1234u));
}

TEST_F(SimulatedDevice, OpensAndAnswersNothingWhileItIsUnplugged) {
    device->unplug();
    EXPECT_EQ(open(0), 0xE00002C0u);
    EXPECT_EQ(feature(0x04), Bytes());
    EXPECT_EQ(status, 0xE00002C0u);
    EXPECT_EQ(property("VendorID"), PropertyValue(0x1234u));
    EXPECT_EQ(device->counters().opened, 0u);
    device->plug();
    EXPECT_EQ(open(0), 0u);
    EXPECT_EQ(feature(0x04), (Bytes{0x04, 1, 2, 3, 4}));
}

TEST_F(SimulatedDevice, CountsItsReferences) {
    EXPECT_EQ(device->counters().references, 1u);
    {
        const Ref<ZorvaDevice> other = device->ref();
        EXPECT_EQ(device->counters().references, 2u);
    }
    EXPECT_EQ(device->counters().references, 1u);
}

TEST_F(SimulatedDevice, HasATableThatIsWhole) { EXPECT_EQ(device->table->size, sizeof(ZorvaDeviceTable)); }

} // namespace
} // namespace ZorvaTouch::Simulated
