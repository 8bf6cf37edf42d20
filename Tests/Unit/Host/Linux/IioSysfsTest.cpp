#include "Host/Linux/IioSysfs.h"

#include "Tests/Unit/Host/Linux/SensorFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <functional>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using Tests::SensorFolder;

struct Failed {
    std::string text; ///< without the folder in front of it
    int errorNumber = 0;

    friend bool operator==(const Failed &, const Failed &) = default;
};

class IioAttributes : public testing::Test {
protected:
    Failed failureOf(const std::function<void()> &body) const {
        try {
            body();
        } catch (const IioFailure &failure) {
            std::string text = failure.what();
            if (const auto begin = text.find(folder.path() + '/'); begin != std::string::npos)
                text.erase(begin, folder.path().size() + 1);
            return {text, failure.errorNumber};
        }
        return {"none"};
    }
    Failed failureToRead(std::string_view text, const std::function<void()> &body) const {
        folder.set("attribute", text);
        return failureOf(body);
    }

    SensorFolder folder;
    IioSysfs device{folder.path()};
};

TEST_F(IioAttributes, AreReadWithoutWhatIsAroundThem) {
    EXPECT_EQ(device.text("name"), "accel_3d");
    EXPECT_EQ(device.number("in_accel_scale"), 0.00980665);
    EXPECT_EQ(device.count("scan_elements/in_timestamp_index"), 4u);
    EXPECT_EQ(device.scanType("scan_elements/in_accel_x_type").bits, 32u);
    folder.set("attribute", " \t two words \r");
    EXPECT_EQ(device.text("attribute"), "two words");
    folder.set("attribute", "");
    EXPECT_EQ(device.text("attribute"), "");
}

TEST_F(IioAttributes, MayBeMissing) {
    EXPECT_TRUE(device.has("name"));
    EXPECT_FALSE(device.has("label"));
    EXPECT_EQ(device.firstOf({"in_accel_x_scale", "in_accel_scale"}), "in_accel_scale");
    EXPECT_EQ(device.firstOf({"in_accel_x_scale"}), std::nullopt);
    EXPECT_EQ(failureOf([&] { static_cast<void>(device.text("label")); }),
              (Failed{"read label: No such file or directory", ENOENT}));
    EXPECT_EQ(failureOf([&] { static_cast<void>(device.text("buffer")); }),
              (Failed{"read buffer: Is a directory", EISDIR}));
}

TEST_F(IioAttributes, OfTheWrongKindAreAFailureOfOneLine) {
    EXPECT_EQ(failureToRead("fast", [&] { static_cast<void>(device.number("attribute")); }),
              (Failed{R"(attribute is no number: "fast")", 0}));
    EXPECT_EQ(failureToRead("-1", [&] { static_cast<void>(device.count("attribute")); }),
              (Failed{R"(attribute is no count: "-1")", 0}));
    EXPECT_EQ(failureToRead("le:s65/64", [&] { static_cast<void>(device.scanType("attribute")); }),
              (Failed{R"(attribute is no format of a scan's value: "le:s65/64")", 0}));
    EXPECT_EQ(failureToRead("two\nlines\x1b[2J", [&] { static_cast<void>(device.number("attribute")); }),
              (Failed{R"(attribute is no number: "two\nlines\x1b[2J")", 0}));
    EXPECT_EQ(
        failureToRead(std::string(41, '7') + 'x', [&] { static_cast<void>(device.number("attribute")); }),
        (Failed{"attribute is no number: \"" + std::string(40, '7') + "...\"", 0}));
}

TEST_F(IioAttributes, ThatAreTooLongAreRefused) {
    folder.set("attribute", std::string(IioSysfs::kLongestText - 1, '1'));
    EXPECT_EQ(device.text("attribute").size(), IioSysfs::kLongestText - 1);
    EXPECT_EQ(failureToRead(std::string(IioSysfs::kLongestText, '1'),
                            [&] { static_cast<void>(device.text("attribute")); }),
              (Failed{"read attribute: Message too long", EMSGSIZE}));
    folder.refuseWrites("endless");
    EXPECT_EQ(failureOf([&] { static_cast<void>(device.text("endless")); }),
              (Failed{"read endless: Message too long", EMSGSIZE}));
}

TEST_F(IioAttributes, AreWrittenButNeverMade) {
    device.set("buffer/length", "7");
    EXPECT_EQ(folder.get("buffer/length"), "7");
    EXPECT_EQ(failureOf([&] { device.set("label", "x"); }),
              (Failed{"write label: No such file or directory", ENOENT}));
    EXPECT_FALSE(device.has("label"));
    folder.refuseWrites("full");
    EXPECT_EQ(failureOf([&] { device.set("full", "x"); }),
              (Failed{"write full: No space left on device", ENOSPC}));
}

TEST_F(IioAttributes, MayBeTriedToSet) {
    EXPECT_TRUE(device.trySet("buffer/length", "7"));
    EXPECT_EQ(folder.get("buffer/length"), "7");
    EXPECT_TRUE(device.trySet("name", "accel_3d"));
    EXPECT_FALSE(device.trySet("label", "x"));
    folder.refuseWrites("full");
    EXPECT_FALSE(device.trySet("full", "x"));
}

TEST_F(IioAttributes, AreListedSorted) {
    EXPECT_THAT(device.names("scan_elements", "in_", "_en"),
                ElementsAre("accel_x", "accel_y", "accel_z", "temp", "timestamp"));
    EXPECT_THAT(device.names("scan_elements", "in_timestamp_en", "_en"), IsEmpty()) << "they do not overlap";
    EXPECT_THAT(device.names("events", "", ""), IsEmpty());
}

} // namespace
} // namespace ZorvaTouch::Linux
