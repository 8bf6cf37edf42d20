#include "Tools/Daemon/RecordingNotes.h"

#include "Host/Objects/Service.h"
#include "Host/Simulated/Device.h"
#include "Shared/RecordingContainer.h"
#include "Shared/Util/Json.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

class RecordingNotesTest : public testing::Test {
protected:
    RecordingNotesTest() {
        device->properties().set("ReportDescriptor", PropertyValue::Bytes{0x06, 0x00, 0xFF});
        service.start(Host::Service::create(device, Host::EventSystem::create()).get());
    }

    [[nodiscard]] std::string note(const char *key, bool withSerial = false) const {
        const RecordingNotes notes = notesOf(service, withSerial);
        const auto found = notes.find(key);
        return found == notes.end() ? "none" : Util::jsonText(found->second);
    }

    const Ref<Simulated::Device> device = Simulated::Device::create();
    HostedService service{openPlugIn(ZORVA_TEST_PLUGIN)};
};

TEST(Fnv1a64, IsAsPublished) {
    const auto hash = [](const std::string &text) {
        return fnv1a64(std::vector<std::uint8_t>(text.begin(), text.end()));
    };
    EXPECT_EQ(hash(""), 0xCBF29CE484222325u);
    EXPECT_EQ(hash("a"), 0xAF63DC4C8601EC8Cu);
    EXPECT_EQ(hash("foobar"), 0x85944171F73967E8u);
}

TEST_F(RecordingNotesTest, HaveTheSoftware) {
    EXPECT_EQ(note("Software"), R"({"Program":"zorvatouchd 0.1.0","Service":"26.0.0"})");
}

TEST_F(RecordingNotesTest, HaveTheDeviceButItsSerialNumberOnlyIfAskedFor) {
    device->properties().set("Product", "Touch");
    device->properties().set("SerialNumber", "SN1");
    EXPECT_EQ(note("Device"), R"({"Name":"Touch","ProductID":43981,"VendorID":4660})");
    EXPECT_EQ(note("Device", true),
              R"({"Name":"Touch","ProductID":43981,"SerialNumber":"SN1","VendorID":4660})");
}

TEST_F(RecordingNotesTest, HaveTheHashOfTheReportDescriptor) {
    EXPECT_EQ(note("ReportDescriptor"), R"({"Bytes":3,"FNV1a64":"c7f9e518623ed4ec"})");
}

TEST_F(RecordingNotesTest, DoWithoutWhatTheDeviceDoesNotHave) {
    device->properties().set("ReportDescriptor", {});
    device->properties().set("Product", {});
    EXPECT_EQ(note("ReportDescriptor"), "none");
    EXPECT_EQ(note("Device"), R"({"ProductID":43981,"VendorID":4660})");
}

TEST_F(RecordingNotesTest, HaveTheTunablesThatDifferFromTheirDefaults) {
    EXPECT_EQ(note("Tunables"), "{}");
    ASSERT_TRUE(service.setProperty("Pipeline.Algs.HoldTimeoutMilliseconds", 300u));
    ASSERT_TRUE(service.setProperty("Pipeline.Algs.EnableTapSuppression", true)); // as it is
    ASSERT_TRUE(service.setProperty("Pipeline.Algs.VirtualNormalizationFactors.22", 0.5));
    EXPECT_EQ(note("Tunables"),
              R"({"Algs.HoldTimeoutMilliseconds":300,"Algs.VirtualNormalizationFactors.22":0.5})");
}

TEST(NotesInRecordings, ComeFirstWithTheTimeOfTheFirstFrame) {
    FrameList frames;
    frames.appendReport(7, std::vector<std::uint8_t>{1});
    EXPECT_EQ(writeRecordingContainer(withNotes({{"A", true}, {"B", 1u}}, frames, 99)),
              R"({"Version":2,"Frames":[{"Type":"Metadata","Timestamp":7,"Key":"A","Value":true},)"
              R"({"Type":"Metadata","Timestamp":7,"Key":"B","Value":1},)"
              R"({"Type":"InputReport","Timestamp":7,"Data":"01 "}]})");
    EXPECT_EQ(writeRecordingContainer(withNotes({{"A", true}}, {}, 99)),
              R"({"Version":2,"Frames":[{"Type":"Metadata","Timestamp":99,"Key":"A","Value":true}]})");
}

} // namespace
} // namespace ZorvaTouch::Tools
