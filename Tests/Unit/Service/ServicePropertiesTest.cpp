#include "Plugin/ValueObject.h"
#include "Tests/Unit/Service/ServiceFixture.h"

#include <gtest/gtest.h>

#include <cstdint>

namespace ZorvaTouch {
namespace {

using namespace Testing;
using Array = PropertyValue::Array;
using Dictionary = PropertyValue::Dictionary;

const PropertyValue kVersion = Array{std::uint32_t{26}, std::uint32_t{0}, std::uint32_t{0}};

/// Text of the property "Recording".
std::string textOf(const PropertyValue &value) { return value.asString() ? *value.asString() : "no text"; }

class ServiceProperties : public ServiceTest {};

class ServicePropertiesOfADevice : public ServiceTest {
protected:
    ServicePropertiesOfADevice() { start(); }
};

// --- Of a service alone --------------------------------------------------------------------------------

TEST_F(ServiceProperties, OfTheStateAreThereFromTheBeginning) {
    EXPECT_EQ(get("Pipeline.DebugInfo"), PropertyValue(Dictionary{{"ResetCount", std::uint32_t{0}},
                                                                  {"DisjointImageCount", std::uint32_t{0}}}));
    EXPECT_EQ(get("Pipeline.Algs.ActivationThreshold"), PropertyValue(200.0));
    EXPECT_NE(get("Pipeline.Algs.DebugInfo").find("EventStats"), nullptr);
    EXPECT_EQ(get("Version"), kVersion);
    EXPECT_EQ(textOf(get("Recording")), R"({"Version":2,"Frames":[]})");
}

TEST_F(ServiceProperties, OfTheDeviceAreNullAndTakeNothingWithoutOne) {
    EXPECT_TRUE(get("Product").isNull());
    EXPECT_TRUE(get("FactoryResetHoldDuration").isNull());
    EXPECT_FALSE(set("Product", "x"));
    EXPECT_FALSE(set("Version", "x"));
    EXPECT_EQ(get("Version"), kVersion);
}

TEST_F(ServiceProperties, OfTheFirmwareFailWithoutADevice) {
    const PropertyValue reports = get("FirmwareDebugReports");
    ASSERT_TRUE(reports.asDictionary());
    EXPECT_EQ(*reports.asDictionary(), (Dictionary{{"0x04", "Failed to get report ID 0x4: 0xe00002be"},
                                                   {"0x10", "Failed to get report ID 0x10: 0xe00002be"},
                                                   {"0x11", "Failed to get report ID 0x11: 0xe00002be"},
                                                   {"0x12", "Failed to get report ID 0x12: 0xe00002be"},
                                                   {"0x13", "Failed to get report ID 0x13: 0xe00002be"},
                                                   {"0x1d", "Failed to get report ID 0x1d: 0xe00002be"},
                                                   {"0x32", "Failed to get report ID 0x32: 0xe00002be"},
                                                   {"0x3b", "Failed to get report ID 0x3b: 0xe00002be"},
                                                   {"0x3c", "Failed to get report ID 0x3c: 0xe00002be"},
                                                   {"0x3f", "Failed to get report ID 0x3f: 0xe00002be"}}));
}

TEST_F(ServiceProperties, OfANullKeyAreNullAndTakeNothing) {
    EXPECT_EQ((*hid)->copyProperty(hid, nullptr), nullptr);
    EXPECT_EQ((*hid)->setProperty(hid, nullptr, makeValue(true).get()), 0);
    EXPECT_EQ(platform.journal.lines(),
              (Lines{"debug getPropertyForKey:(null)", "debug setProperty:true forKey:(null)"}));
}

TEST_F(ServiceProperties, AreLoggedWithTheirKey) {
    static_cast<void>(get("Version"));
    set("Pipeline.x", "text");
    set("Pipeline.x", std::uint32_t{7});
    set("Pipeline.x", 0.5);
    set("Pipeline.x", PropertyValue::Bytes{1, 2});
    set("Pipeline.x", Array{true});
    set("Pipeline.x", Dictionary{{"a", true}, {"b", true}});
    (*hid)->setProperty(hid, "Pipeline.x", nullptr);
    EXPECT_EQ(platform.journal.lines(),
              (Lines{"debug getPropertyForKey:Version", "debug setProperty:text forKey:Pipeline.x",
                     "debug setProperty:7 forKey:Pipeline.x", "debug setProperty:0.5 forKey:Pipeline.x",
                     "debug setProperty:(2 bytes) forKey:Pipeline.x",
                     "debug setProperty:(1 elements) forKey:Pipeline.x",
                     "debug setProperty:(2 entries) forKey:Pipeline.x",
                     "debug setProperty:(null) forKey:Pipeline.x"}));
}

// --- The pipeline's ------------------------------------------------------------------------------------

TEST_F(ServiceProperties, OfTheRecognizerAreWritten) {
    EXPECT_TRUE(set("Pipeline.Algs.ActivationThreshold", std::uint32_t{150}));
    EXPECT_EQ(get("Pipeline.Algs.ActivationThreshold"), PropertyValue(150.0));
}

TEST_F(ServiceProperties, OfThePipelineThatItDoesNotKnowAreNullAndStillTaken) {
    EXPECT_TRUE(get("Pipeline.NoSuchState").isNull());
    EXPECT_TRUE(get("Pipeline.").isNull());
    EXPECT_TRUE(set("Pipeline.NoSuchState", true));
    EXPECT_TRUE(set("Pipeline.DebugInfo", true));
    EXPECT_TRUE(get("Pipeline.NoSuchState").isNull());
}

TEST_F(ServiceProperties, OfThePipelineAreRecordedWhenTheyAreWritten) {
    platform.testClock.ticks = 12;
    set("Pipeline.Algs.ActivationThreshold", std::uint32_t{150});
    EXPECT_EQ(textOf(get("Recording")),
              R"({"Version":2,"Frames":[{"Type":"State","Timestamp":12,"Key":"Algs.ActivationThreshold",)"
              R"("Value":150}]})");
}

TEST_F(ServicePropertiesOfADevice, OfThePipelineCountWhatTheReportsDid) {
    schedule();
    deliver(Scripted::imageReport(1, 0));
    deliver(Scripted::imageReport(3, 10));
    deliver(Scripted::firmwareReport(0));
    EXPECT_EQ(get("Pipeline.DebugInfo"), PropertyValue(Dictionary{{"ResetCount", std::uint32_t{1}},
                                                                  {"DisjointImageCount", std::uint32_t{1}}}));
}

TEST_F(ServicePropertiesOfADevice, OfAnotherSpellingAreTheDevices) {
    for (const char *key : {"pipeline.DebugInfo", "Pipeline", "PipelineDebugInfo", "version", "recording",
                            "VERSION", "Algs.ActivationThreshold", ""}) {
        EXPECT_TRUE(get(key).isNull()) << key;
        device->properties().set(key, "the device's");
        EXPECT_EQ(get(key), PropertyValue("the device's")) << key;
        EXPECT_TRUE(set(key, "the host's")) << key;
        EXPECT_EQ(device->properties().get(key), PropertyValue("the host's")) << key;
    }
}

// --- The service's own ---------------------------------------------------------------------------------

TEST_F(ServicePropertiesOfADevice, OfItsOwnAreReadOnlyAndWritesGoToTheDevice) {
    for (const char *key : {"Version", "FirmwareDebugReports", "FactoryResetHoldDuration", "Recording",
                            "ServicePluginDebug", "ServiceStatus"}) {
        const PropertyValue before = get(key);
        EXPECT_FALSE(before.isNull()) << key;
        EXPECT_TRUE(set(key, "overwritten")) << key;
        EXPECT_EQ(device->properties().get(key), PropertyValue("overwritten")) << key;
        EXPECT_EQ(get(key), before) << key;
    }
    EXPECT_EQ(get("Version"), kVersion);
}

TEST_F(ServicePropertiesOfADevice, OfTheFirmwareAreItsDebugReports) {
    device->setFeatureReport(0x3F, {0x3F, 0x0A, 0xFF});
    device->setFeatureReport(0x10, {});
    device->failFeatureReport(0x04, 0x1);
    const PropertyValue reports = get("FirmwareDebugReports");
    ASSERT_TRUE(reports.asDictionary());
    EXPECT_EQ(*reports.asDictionary(), (Dictionary{{"0x04", "Failed to get report ID 0x4: 0x1"},
                                                   {"0x10", ""},
                                                   {"0x11", "11 01 02 03 04 "},
                                                   {"0x12", "Failed to get report ID 0x12: 0xe00002c7"},
                                                   {"0x13", "13 01 02 03 04 "},
                                                   {"0x1d", "1d 01 02 03 04 "},
                                                   {"0x32", "32 01 02 03 04 "},
                                                   {"0x3b", "Failed to get report ID 0x3b: 0xe00002c7"},
                                                   {"0x3c", "3c 01 02 03 04 "},
                                                   {"0x3f", "3f 0a ff "}}));
    EXPECT_TRUE(platform.journal.errors().empty());
}

TEST_F(ServicePropertiesOfADevice, OfTheFirmwareHaveAtMost128Bytes) {
    device->setFeatureReport(0x04, Bytes(200, 0xAB));
    const PropertyValue reports = get("FirmwareDebugReports");
    ASSERT_TRUE(reports.find("0x04"));
    EXPECT_EQ(reports.find("0x04")->asString()->size(), 128u * 3);
}

TEST_F(ServicePropertiesOfADevice, TheHoldDurationIsReadFromItsReport) {
    EXPECT_EQ(get("FactoryResetHoldDuration"), PropertyValue(std::uint32_t{10000}));
    device->setFeatureReport(0x1F, {0x1F, 0xFF, 0xFF, 0xFF, 0xFF, 9});
    EXPECT_EQ(get("FactoryResetHoldDuration"), PropertyValue(std::uint32_t{4294967295}));
}

TEST_F(ServicePropertiesOfADevice, TheHoldDurationIsNullWithoutAReportAndNotTheDevicesProperty) {
    device->properties().set("FactoryResetHoldDuration", std::uint32_t{5});
    device->setFeatureReport(0x1F, {0x1F, 1, 2, 3}); // short
    EXPECT_TRUE(get("FactoryResetHoldDuration").isNull());
    device->setFeatureReport(0x1F, {0x20, 1, 2, 3, 4}); // another report
    EXPECT_TRUE(get("FactoryResetHoldDuration").isNull());
    device->failFeatureReport(0x1F, 0xE00002C7);
    EXPECT_TRUE(get("FactoryResetHoldDuration").isNull());
}

TEST_F(ServicePropertiesOfADevice, ForDebuggingGatherTheFive) {
    const PropertyValue gathered = get("ServicePluginDebug");
    ASSERT_TRUE(gathered.asDictionary());
    EXPECT_EQ(*gathered.asDictionary(),
              (Dictionary{{"Version", kVersion},
                          {"FirmwareDebugReports", get("FirmwareDebugReports")},
                          {"Recording", get("Recording")},
                          {"Pipeline.DebugInfo", get("Pipeline.DebugInfo")},
                          {"Pipeline.Algs.DebugInfo", get("Pipeline.Algs.DebugInfo")}}));
}

TEST_F(ServicePropertiesOfADevice, ForDebuggingAreGatheredOneByOne) {
    platform.journal.clear();
    static_cast<void>(get("ServicePluginDebug"));
    EXPECT_EQ(platform.journal.lines(),
              (Lines{"debug getPropertyForKey:ServicePluginDebug", "debug getPropertyForKey:Version",
                     "debug getPropertyForKey:FirmwareDebugReports", "debug getPropertyForKey:Recording",
                     "debug getPropertyForKey:Pipeline.DebugInfo",
                     "debug getPropertyForKey:Pipeline.Algs.DebugInfo"}));
}

TEST_F(ServiceProperties, ForDebuggingAreThereOnADeviceThatAnswersNothing) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    const PropertyValue gathered = get("ServicePluginDebug");
    ASSERT_TRUE(gathered.find("FirmwareDebugReports"));
    const Dictionary &reports = *gathered.find("FirmwareDebugReports")->asDictionary();
    EXPECT_EQ(reports.size(), 10u);
    for (const auto &[key, text] : reports)
        EXPECT_TRUE(text.asString()->starts_with("Failed to get report ID 0x")) << key;
    EXPECT_EQ(*gathered.find("Version"), kVersion);
    EXPECT_EQ(textOf(*gathered.find("Recording")), R"({"Version":2,"Frames":[]})");
}

// --- A device that answers badly -------------------------------------------------------------------------

TEST_F(ServiceProperties, OfADeviceThatClaimsALongerReportEndWithTheBuffer) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    probe->featureStatus = ZORVA_STATUS_SUCCESS;
    probe->featureLength = SIZE_MAX;
    EXPECT_EQ(get("FirmwareDebugReports").find("0x04")->asString()->size(), 128u * 3);
    EXPECT_TRUE(get("FactoryResetHoldDuration").isNull()); // 32 zeros: not report 31
}

TEST_F(ServiceProperties, OfADeviceThatHandsOverAValueThatIsNotWholeAreNull) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    const ZorvaValue hollow{nullptr};
    probe->property = &hollow;
    EXPECT_TRUE(get("anything").isNull());
}

TEST_F(ServiceProperties, BeyondTheLimitsOfAValueAreRefusedWithOneLine) {
    const EndlessValue endless;
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    probe->property = &endless;
    EXPECT_EQ((*hid)->copyProperty(hid, "anything"), nullptr);
    EXPECT_EQ((*hid)->setProperty(hid, "Pipeline.Algs.ActivationThreshold", &endless), 0);
    EXPECT_EQ(platform.journal.errors(), (Lines{"copyProperty failed: a value has more than 64 levels",
                                                "setProperty failed: a value has more than 64 levels"}));
    EXPECT_EQ(textOf(get("Recording")), R"({"Version":2,"Frames":[]})");
}

TEST_F(ServiceProperties, OfADeviceAreReleasedAfterTheyAreRead) {
    const auto probe = ProbeDevice::create();
    const auto offered = ProbeService::create(probe.get());
    start(offered.get());
    auto value = makeValue(Array{"kept"});
    static int releases;
    releases = 0;
    ZorvaValueTable table = *value->table;
    const auto original = value->table;
    static const ZorvaValueTable *plain;
    plain = original;
    table.release = [](const ZorvaValue *object) {
        ++releases;
        plain->release(object);
    };
    const_cast<ZorvaValue *>(value.get())->table = &table;
    value->table->retain(value.get()); // handed over
    probe->property = value.get();
    EXPECT_EQ(get("anything"), PropertyValue(Array{"kept"}));
    EXPECT_EQ(releases, 1);
    const_cast<ZorvaValue *>(value.get())->table = original;
}

} // namespace
} // namespace ZorvaTouch
