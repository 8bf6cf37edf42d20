#include "Shared/InputReport.h"

#include <array>
#include <bit>
#include <cstring>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using FeatureReport::FactoryResetHoldDuration;
using InputReport::FirmwareEvent;
using InputReport::Image;

/// A report of which every byte after the ID is its own offset. Exactly as long as said, so that the address
/// sanitizer hears of any byte read beyond it.
std::vector<std::uint8_t> countingReport(std::uint8_t id, std::size_t length) {
    std::vector<std::uint8_t> report(length);
    for (std::size_t i = 0; i < length; ++i)
        report[i] = static_cast<std::uint8_t>(i);
    if (length > 0)
        report[0] = id;
    return report;
}

template <typename Report> std::optional<Report> parse(const std::vector<std::uint8_t> &report) {
    return Report::parse(report.data(), report.size());
}

TEST(Image, NeedsSeventyThreeBytes) {
    EXPECT_FALSE(parse<Image>(countingReport(1, 72)));
    EXPECT_TRUE(parse<Image>(countingReport(1, 73)));
}

TEST(Image, ShorterReportsAreNothing) {
    for (std::size_t length = 1; length < 73; ++length)
        EXPECT_FALSE(parse<Image>(countingReport(1, length))) << length << " bytes";
}

TEST(Image, NeedsReportIdOne) {
    for (const std::uint8_t id : std::initializer_list<std::uint8_t>{0, 2, 3, 31, 129, 255})
        EXPECT_FALSE(parse<Image>(countingReport(id, 73))) << "ID " << int{id};
}

TEST(Image, FieldsStandAtTheirOffsetsLittleEndian) {
    const std::optional<Image> image = parse<Image>(countingReport(1, 73));
    ASSERT_TRUE(image);
    EXPECT_EQ(image->frameNumber, 0x04030201u); // bytes 1 to 4
    EXPECT_EQ(image->timeMs, 0x08070605u);      // bytes 5 to 8
    EXPECT_EQ(image->flags, (std::array<std::uint8_t, 4>{9, 10, 11, 12}));
    // Bytes 13 to 42, then 43 to 72, two by two with the low byte first.
    EXPECT_EQ(image->rawCounts,
              (std::array<std::uint16_t, 15>{0x0E0D, 0x100F, 0x1211, 0x1413, 0x1615, 0x1817, 0x1A19, 0x1C1B,
                                             0x1E1D, 0x201F, 0x2221, 0x2423, 0x2625, 0x2827, 0x2A29}));
    EXPECT_EQ(image->signals,
              (std::array<std::int16_t, 15>{0x2C2B, 0x2E2D, 0x302F, 0x3231, 0x3433, 0x3635, 0x3837, 0x3A39,
                                            0x3C3B, 0x3E3D, 0x403F, 0x4241, 0x4443, 0x4645, 0x4847}));
}

TEST(Image, RecordIsTheBytesAfterTheReportId) {
    if constexpr (std::endian::native != std::endian::little)
        GTEST_SKIP() << "the record's fields have the host's byte order";
    const std::vector<std::uint8_t> report = countingReport(1, 73);
    const std::optional<Image> image = parse<Image>(report);
    ASSERT_TRUE(image);
    EXPECT_EQ(std::memcmp(&*image, report.data() + 1, 72), 0);
}

TEST(Image, BytesBeyondSeventyThreeAreIgnored) {
    std::vector<std::uint8_t> report = countingReport(1, 80);
    const std::optional<Image> plain = parse<Image>(report);
    for (std::size_t i = 73; i < 80; ++i)
        report[i] = 0xEE;
    const std::optional<Image> changedTail = parse<Image>(report);
    ASSERT_TRUE(plain && changedTail);
    EXPECT_EQ(std::memcmp(&*plain, &*changedTail, sizeof(Image)), 0);
    EXPECT_EQ(plain->frameNumber, 0x04030201u);
    EXPECT_EQ(plain->signals[14], 0x4847); // bytes 71 and 72
}

TEST(Image, SignalsAreSignedAndRawCountsAreNot) {
    std::vector<std::uint8_t> report = countingReport(1, 73);
    report[13] = report[14] = 0xFF; // electrode A's raw count
    report[43] = report[44] = 0xFF; // electrode A's signal
    report[45] = 0x00;              // electrode B's signal: 8000 hexadecimal
    report[46] = 0x80;
    report[47] = 0xFF; // electrode C's signal: 7FFF hexadecimal
    report[48] = 0x7F;
    const std::optional<Image> image = parse<Image>(report);
    ASSERT_TRUE(image);
    EXPECT_EQ(image->rawCounts[0], 65535);
    EXPECT_EQ(image->signals[0], -1);
    EXPECT_EQ(image->signals[1], -32768);
    EXPECT_EQ(image->signals[2], 32767);
}

TEST(Image, CounterAndTimeUseAllThirtyTwoBits) {
    std::vector<std::uint8_t> report(73, 0xFF);
    report[0] = 1;
    const std::optional<Image> image = parse<Image>(report);
    ASSERT_TRUE(image);
    EXPECT_EQ(image->frameNumber, 4294967295u);
    EXPECT_EQ(image->timeMs, 4294967295u);
    EXPECT_EQ(image->flags, (std::array<std::uint8_t, 4>{255, 255, 255, 255}));
}

TEST(Image, EmptyReportIsNothingWithoutBeingRead) { EXPECT_FALSE(Image::parse(nullptr, 0)); }

TEST(FirmwareEvent, NeedsTenBytes) {
    EXPECT_FALSE(parse<FirmwareEvent>(countingReport(2, 9)));
    EXPECT_TRUE(parse<FirmwareEvent>(countingReport(2, 10)));
}

TEST(FirmwareEvent, ShorterReportsAreNothing) {
    for (std::size_t length = 1; length < 10; ++length)
        EXPECT_FALSE(parse<FirmwareEvent>(countingReport(2, length))) << length << " bytes";
}

TEST(FirmwareEvent, NeedsReportIdTwo) {
    for (const std::uint8_t id : std::initializer_list<std::uint8_t>{0, 1, 3, 31, 130, 255})
        EXPECT_FALSE(parse<FirmwareEvent>(countingReport(id, 10))) << "ID " << int{id};
}

TEST(FirmwareEvent, CodeComesFirstThenEightBytesOfPayload) {
    const std::vector<std::uint8_t> report{2, 0xFE, 10, 11, 12, 13, 14, 15, 16, 0xFF};
    const std::optional<FirmwareEvent> event = parse<FirmwareEvent>(report);
    ASSERT_TRUE(event);
    EXPECT_EQ(event->eventCode, 0xFE);
    EXPECT_EQ(event->payload, (std::array<std::uint8_t, 8>{10, 11, 12, 13, 14, 15, 16, 0xFF}));
}

TEST(FirmwareEvent, BytesBeyondTenAreIgnored) {
    const std::optional<FirmwareEvent> event = parse<FirmwareEvent>(countingReport(2, 73));
    ASSERT_TRUE(event);
    EXPECT_EQ(event->eventCode, 1);
    EXPECT_EQ(event->payload, (std::array<std::uint8_t, 8>{2, 3, 4, 5, 6, 7, 8, 9}));
}

TEST(FirmwareEvent, EmptyReportIsNothingWithoutBeingRead) { EXPECT_FALSE(FirmwareEvent::parse(nullptr, 0)); }

TEST(FactoryResetHoldDuration, NeedsFiveBytes) {
    EXPECT_FALSE(parse<FactoryResetHoldDuration>({0x1F, 0x10, 0x27, 0x00}));
    const auto answer = parse<FactoryResetHoldDuration>({0x1F, 0x10, 0x27, 0x00, 0x00});
    ASSERT_TRUE(answer);
    EXPECT_EQ(answer->duration, 10000u); // 2710 hexadecimal
}

TEST(FactoryResetHoldDuration, ShorterAnswersAreNothing) {
    for (std::size_t length = 1; length < 5; ++length)
        EXPECT_FALSE(parse<FactoryResetHoldDuration>(countingReport(31, length))) << length << " bytes";
}

TEST(FactoryResetHoldDuration, NeedsReportIdThirtyOne) {
    for (const std::uint8_t id : std::initializer_list<std::uint8_t>{0, 1, 2, 30, 32, 159})
        EXPECT_FALSE(parse<FactoryResetHoldDuration>(countingReport(id, 5))) << "ID " << int{id};
}

TEST(FactoryResetHoldDuration, IsLittleEndianAndBytesBeyondFiveAreIgnored) {
    const auto answer = parse<FactoryResetHoldDuration>({31, 0x01, 0x02, 0x03, 0xFF, 0xAA, 0xBB});
    ASSERT_TRUE(answer);
    EXPECT_EQ(answer->duration, 0xFF030201u);
}

TEST(FactoryResetHoldDuration, EmptyAnswerIsNothingWithoutBeingRead) {
    EXPECT_FALSE(FactoryResetHoldDuration::parse(nullptr, 0));
}

TEST(InputReport, RecordsHaveTheSizesOfTheWire) {
    EXPECT_EQ(sizeof(Image), 72u);
    EXPECT_EQ(sizeof(FirmwareEvent), 9u);
    EXPECT_EQ(sizeof(FactoryResetHoldDuration), 4u);
}

TEST(Image, WritesTheReportThatItWasParsedFrom) {
    const std::vector<std::uint8_t> report = countingReport(1, 73);
    const auto written = Image::parse(report.data(), report.size())->toReport();
    EXPECT_EQ(std::vector<std::uint8_t>(written.begin(), written.end()), report);
}

TEST(InputReport, ParsersPromiseNotToThrow) {
    EXPECT_TRUE(noexcept(Image::parse(nullptr, 0)));
    EXPECT_TRUE(noexcept(FirmwareEvent::parse(nullptr, 0)));
    EXPECT_TRUE(noexcept(FactoryResetHoldDuration::parse(nullptr, 0)));
}

} // namespace
} // namespace ZorvaTouch
