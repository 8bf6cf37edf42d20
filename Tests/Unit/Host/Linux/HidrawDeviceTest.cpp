#include "Host/Linux/HidrawDevice.h"

#include "Plugin/ObjectCheck.h"
#include "Plugin/ValueObject.h"
#include "Tests/Unit/Host/Linux/DeviceFixture.h"

#include <gmock/gmock.h>

#include <atomic>
#include <cerrno>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using Tests::Bytes;

class HidrawDeviceAnswers : public Tests::DeviceFixture {
protected:
    /// The bytes of a feature report read into a buffer of that size; nothing,
    /// and the status, if it fails.
    Bytes feature(std::uint32_t id, std::size_t bufferSize = 64) {
        Bytes bytes(bufferSize);
        std::size_t length = bufferSize;
        status = device->table->getFeatureReport(device.get(), id, bytes.data(), &length);
        EXPECT_LE(length, bufferSize);
        bytes.resize(length);
        return bytes;
    }
    void answerFeatures(IoResult answer) {
        nodes.prepare = [=](Tests::FakeNode &node) { node.onFeature = [=](auto) { return answer; }; };
    }
    PropertyValue property(const char *key) {
        const ZorvaValue *const value = device->table->copyProperty(device.get(), key);
        return readValue(Ref<const ZorvaValue>::adopt(value).get());
    }

    ZorvaStatus status = 99;
};

TEST_F(HidrawDeviceAnswers, HaveACompleteTable) { EXPECT_TRUE(isComplete(device.get())); }

// --- Open
// ----------------------------------------------------------------------------------------------------

TEST_F(HidrawDeviceAnswers, OpenOpensTheNodeOnce) {
    EXPECT_EQ(open(), 0u);
    EXPECT_EQ(open(), 0u) << "it is open";
    EXPECT_EQ(nodes.opens, 1u);
}

struct OpenError {
    int errorNumber;
    ZorvaStatus status;
};
class HidrawOpenErrors : public HidrawDeviceAnswers, public testing::WithParamInterface<OpenError> {};

TEST_P(HidrawOpenErrors, AreAStatusAndAreTold) {
    nodes.errors = {GetParam().errorNumber};
    EXPECT_EQ(open(), GetParam().status);
    EXPECT_EQ(nodes.opens, 1u) << "no second try";
    EXPECT_THAT(observer->failures, ElementsAre(SystemFailure{"open", GetParam().errorNumber}));
    EXPECT_THAT(observer->gone, IsEmpty());
    EXPECT_EQ(open(), 0u) << "it may be tried again";
}
INSTANTIATE_TEST_SUITE_P(Errno, HidrawOpenErrors,
                         testing::Values(OpenError{ENOENT, 0xE00002C0}, OpenError{ENODEV, 0xE00002C0},
                                         OpenError{ENXIO, 0xE00002C0}, OpenError{EMFILE, 0xE00002BE},
                                         OpenError{EIO, 0xE00002BE}, OpenError{EBUSY, 0xE00002BE},
                                         OpenError{EACCES, 0xE00002BE}, OpenError{EPERM, 0xE00002BE}));

TEST_F(HidrawDeviceAnswers, OpenFailsWhenTheDeviceGoesMeanwhile) {
    int Tests::FakeNode::*const calls[] = {&Tests::FakeNode::infoError, &Tests::FakeNode::textError,
                                           &Tests::FakeNode::descriptorError};
    for (int Tests::FakeNode::*const call : calls) {
        nodes.prepare = [call](Tests::FakeNode &node) { node.*call = ENODEV; };
        EXPECT_EQ(open(), kStatusNoDevice);
        EXPECT_EQ(nodes.node(), nullptr) << "it is closed";
    }
    EXPECT_EQ(observer->failures, std::vector<SystemFailure>(3, {"open", ENODEV}));
}

TEST_F(HidrawDeviceAnswers, CloseAlwaysSucceeds) {
    EXPECT_EQ(close(), 0u);
    open();
    EXPECT_EQ(close(), 0u);
    EXPECT_EQ(close(), 0u);
    EXPECT_EQ(nodes.node(), nullptr);
}

TEST_F(HidrawDeviceAnswers, OpenDevicesThatAreLetGoOfAreClosed) {
    open();
    device.reset();
    EXPECT_EQ(nodes.node(), nullptr);
}

// --- Feature reports
// -----------------------------------------------------------------------------------------

TEST_F(HidrawDeviceAnswers, FeatureReportsHaveTheirIdInTheFirstByteBothWays) {
    Bytes asked;
    nodes.prepare = [&](Tests::FakeNode &node) {
        node.onFeature = [&](std::span<std::uint8_t> bytes) {
            asked.assign(bytes.begin(), bytes.end());
            bytes[1] = 0x10;
            bytes[2] = 0x27;
            return IoResult{.count = 3};
        };
    };
    open();
    EXPECT_EQ(feature(0x1F, 4), (Bytes{0x1F, 0x10, 0x27}));
    EXPECT_EQ(status, 0u);
    EXPECT_EQ(asked, (Bytes{0x1F, 0, 0, 0}));
}

TEST_F(HidrawDeviceAnswers, FeatureReportsMayBeEmpty) {
    answerFeatures({.count = 0});
    open();
    EXPECT_EQ(feature(0x04), Bytes());
    EXPECT_EQ(status, 0u);
}

TEST_F(HidrawDeviceAnswers, FeatureReportsAreNeverLongerThanTheBuffer) {
    answerFeatures({.count = 65});
    open();
    EXPECT_EQ(feature(0x04, 64).size(), 64u);
}

class HidrawFeatureErrors : public HidrawDeviceAnswers, public testing::WithParamInterface<OpenError> {};

TEST_P(HidrawFeatureErrors, AreAStatusAndNoBytes) {
    answerFeatures({.count = 7, .errorNumber = GetParam().errorNumber});
    open();
    EXPECT_EQ(feature(0x04), Bytes());
    EXPECT_EQ(status, GetParam().status);
    EXPECT_THAT(observer->failures, IsEmpty()) << "whoever asked has been told";
}
INSTANTIATE_TEST_SUITE_P(Errno, HidrawFeatureErrors,
                         testing::Values(OpenError{EIO, 0xE00002BE}, OpenError{EINVAL, 0xE00002BE},
                                         OpenError{EINTR, 0xE00002BE}, OpenError{ETIMEDOUT, 0xE00002BE},
                                         OpenError{EPIPE, 0xE00002BE}, OpenError{ENODEV, 0xE00002C0}));

TEST_F(HidrawDeviceAnswers, FeatureReportsNeedABufferAnIdOfOneByteAndAnOpenDevice) {
    answerFeatures({.count = 1});
    EXPECT_EQ(feature(0x04), Bytes());
    EXPECT_EQ(status, kStatusNoDevice);
    open();
    feature(0x104);
    EXPECT_EQ(status, ZORVA_STATUS_NO_RESOURCES);
    feature(0x04, 0);
    EXPECT_EQ(status, ZORVA_STATUS_NO_RESOURCES);
    std::size_t length = 10;
    EXPECT_EQ(device->table->getFeatureReport(device.get(), 4, nullptr, &length), ZORVA_STATUS_NO_RESOURCES);
    EXPECT_EQ(length, 0u);
}

TEST_F(HidrawDeviceAnswers, FeatureReportsThatAreUnderWayKeepTheNodeAndNothingElse) {
    const auto isAsked = Host::processPlatform().createSemaphore();
    const auto mayAnswer = Host::processPlatform().createSemaphore();
    nodes.prepare = [&](Tests::FakeNode &node) {
        node.onFeature = [&](std::span<std::uint8_t>) {
            isAsked->signal();
            mayAnswer->wait();
            return IoResult{.errorNumber = EIO};
        };
    };
    begin();
    nodes.node()->send({1});
    const auto asking = Host::processPlatform().startThread("ask", [this] { feature(0x04); });
    isAsked->wait();
    passes(1);
    EXPECT_EQ(reports.size(), 1u) << "reports go on";
    unschedule();
    EXPECT_EQ(close(), 0u);
    EXPECT_NE(nodes.node(), nullptr);
    mayAnswer->signal();
    asking->join();
    EXPECT_EQ(nodes.node(), nullptr);
    EXPECT_EQ(status, ZORVA_STATUS_NO_RESOURCES);
}

// --- Properties
// ----------------------------------------------------------------------------------------------

TEST_F(HidrawDeviceAnswers, PropertiesAreWhatTheNodeTells) {
    EXPECT_EQ(property("Product"), PropertyValue()) << "not before it is opened";
    open();
    EXPECT_EQ(property("VendorID"), PropertyValue(0x1234u));
    EXPECT_EQ(property("ProductID"), PropertyValue(0xABCDu));
    EXPECT_EQ(property("Product"), PropertyValue("Touch"));
    EXPECT_EQ(property("SerialNumber"), PropertyValue("SN1"));
    EXPECT_EQ(property("PhysicalPath"), PropertyValue("usb-1"));
    EXPECT_EQ(property("Transport"), PropertyValue("USB"));
    EXPECT_EQ(property("ReportDescriptor"), PropertyValue(Bytes{0x06, 0x00, 0xFF}));
    EXPECT_EQ(device->table->copyProperty(device.get(), "product"), nullptr);
    EXPECT_EQ(device->table->copyProperty(device.get(), nullptr), nullptr);
}

TEST_F(HidrawDeviceAnswers, PropertiesStayWhenTheDeviceIsClosed) {
    open();
    close();
    EXPECT_EQ(property("Product"), PropertyValue("Touch"));
}

TEST_F(HidrawDeviceAnswers, PropertiesThatAreEmptyOrCannotBeReadAreMissing) {
    nodes.prepare = [](Tests::FakeNode &node) {
        node.uniqueId = {0};
        node.physicalPath = {};
        node.descriptorError = EINVAL;
        node.infoError = EPERM;
    };
    EXPECT_EQ(open(), 0u);
    for (const char *const key :
         {"SerialNumber", "PhysicalPath", "ReportDescriptor", "VendorID", "ProductID", "Transport"})
        EXPECT_EQ(device->table->copyProperty(device.get(), key), nullptr) << key;
    EXPECT_EQ(property("Product"), PropertyValue("Touch"));
}

TEST_F(HidrawDeviceAnswers, PropertiesOfTextWithoutAnEndAreCut) {
    nodes.prepare = [](Tests::FakeNode &node) { node.name = Bytes(300, 'x'); };
    open();
    EXPECT_EQ(property("Product"), PropertyValue(std::string(256, 'x')));
}

TEST_F(HidrawDeviceAnswers, PropertiesNameTheTransport) {
    const std::pair<std::uint32_t, PropertyValue> transports[] = {
        {3, "USB"}, {5, "Bluetooth"}, {6, "Virtual"}, {0x18, "I2C"}, {0x1C, "SPI"}, {99, {}}};
    for (const auto &[bus, transport] : transports) {
        nodes.prepare = [bus = bus](Tests::FakeNode &node) { node.hidrawInfo.bus = bus; };
        open();
        EXPECT_EQ(property("Transport"), transport) << bus;
        close();
    }
}

TEST_F(HidrawDeviceAnswers, PropertiesAreNotToBeSet) {
    open();
    EXPECT_EQ(device->table->setProperty(device.get(), "Product", makeValue("other").get()), 0);
    EXPECT_EQ(device->table->setProperty(device.get(), nullptr, nullptr), 0);
    EXPECT_EQ(property("Product"), PropertyValue("Touch"));
}

// --- Threads
// -------------------------------------------------------------------------------------------------

TEST_F(HidrawDeviceAnswers, ComeWhileReportsComeAndTheDeviceGoes) {
    nodes.prepare = [](Tests::FakeNode &node) {
        node.onFeature = [](std::span<std::uint8_t>) { return IoResult{.count = 1}; };
    };
    for (int round = 0; round < 50; ++round) {
        begin();
        std::atomic<bool> isOver = false;
        const auto input = Host::processPlatform().startThread(
            "input", [this] { EXPECT_NE(run(), Host::RunOutcome::HandledSource); });
        const auto other = Host::processPlatform().startThread("other", [&] {
            while (!isOver) {
                feature(0x04);
                EXPECT_EQ(property("Product"), PropertyValue("Touch"));
            }
        });
        if (const auto node = nodes.node()) {
            for (std::uint8_t id = 1; id <= 5; ++id)
                node->send({id});
            node->unplug();
        }
        input->join();
        unschedule();
        close();
        isOver = true;
        other->join();
    }
    EXPECT_EQ(observer->gone.size(), 50u);
    EXPECT_EQ(reports.size(), 250u);
}

} // namespace
} // namespace ZorvaTouch::Linux
