#include "Tools/Daemon/ReportHistory.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using Bytes = std::vector<std::uint8_t>;

/// "5:01 7:Accel": times, and reports' first bytes or keys.
std::string textOf(const FrameList &frames) {
    std::string text;
    for (const FrameView &frame : frames)
        text.append(text.empty() ? "" : " ")
            .append(std::to_string(frame.timestampNs))
            .append(":")
            .append(frame.type == FrameType::InputReport ? std::to_string(frame.data[0])
                                                         : std::string(frame.key));
    return text;
}

FrameList reports(std::initializer_list<std::pair<std::uint64_t, std::uint8_t>> all) {
    FrameList list;
    for (const auto &[time, first] : all)
        list.appendReport(time, Bytes{first});
    return list;
}

Frame keyed(FrameType type, std::uint64_t timeNs, const std::string &key) {
    return {.type = type, .timestampNs = timeNs, .key = key, .value = true, .data = {}};
}

TEST(ReportHistory, KeepsAMinuteOfAHundredReportsASecond) {
    ReportHistory history;
    constexpr std::array<std::uint8_t, 73> kReport{1};
    for (std::uint64_t i = 0; i < 20'000; ++i) {
        history.add(i, kReport);
        const FrameList kept = history.reports();
        ASSERT_GE(kept.size(), std::min<std::size_t>(i + 1, 6000));
        ASSERT_LE(kept.size(), 7500u);
        ASSERT_EQ(kept[kept.size() - 1].timestampNs, i);
        ASSERT_EQ(kept[0].timestampNs + kept.size() - 1, i) << "a gap";
    }
}

TEST(ReportHistory, LongReportsAreFewer) {
    ReportHistory history;
    const Bytes longest(16'384, 1); // of the kernel
    for (std::uint64_t i = 0; i < 1000; ++i) {
        history.add(i, longest);
        ASSERT_LE(history.reports().size(), 128u); // 2 MiB
    }
    EXPECT_GE(history.reports().size(), 64u);
    history.add(1000, Bytes((std::size_t{2} << 20) + 1, 1));
    EXPECT_EQ(history.reports().size(), 0u);
}

TEST(OlderReports, GoInFrontOfTheRecording) {
    // The recording's times are a little later.
    EXPECT_EQ(
        textOf(withOlderReports(reports({{31, 3}, {41, 4}}), reports({{10, 1}, {20, 2}, {30, 3}, {40, 4}}))),
        "10:1 20:2 31:3 41:4");
    // Or a little earlier, of a simulated surface.
    EXPECT_EQ(
        textOf(withOlderReports(reports({{29, 3}, {39, 4}}), reports({{10, 1}, {20, 2}, {30, 3}, {40, 4}}))),
        "10:1 20:2 29:3 39:4");
}

TEST(OlderReports, OfEqualReportsTheNearestIsTheFirst) {
    EXPECT_EQ(textOf(withOlderReports(reports({{31, 1}}), reports({{10, 1}, {20, 2}, {30, 1}, {60, 1}}))),
              "10:1 20:2 31:1");
}

TEST(OlderReports, AreNoneForARecordingThatTheHistoryDoesNotKnow) {
    EXPECT_EQ(textOf(withOlderReports(reports({{31, 9}}), reports({{10, 1}}))), "31:9");
    EXPECT_EQ(textOf(withOlderReports(reports({{31, 9}}), FrameList())), "31:9");
    EXPECT_EQ(textOf(withOlderReports(FrameList(), reports({{10, 1}}))), "");
}

TEST(OlderReports, LeaveStateWritesAndSamplesInTheirPlaces) {
    FrameList recorded;
    recorded.append(keyed(FrameType::State, 15, "Algs.X"));
    recorded.append(keyed(FrameType::Metadata, 25, "Accel"));
    recorded.appendReport(30, Bytes{3});
    EXPECT_EQ(textOf(withOlderReports(recorded, reports({{10, 1}, {20, 2}, {30, 3}}))),
              "10:1 15:Algs.X 20:2 25:Accel 30:3");
}

} // namespace
} // namespace ZorvaTouch::Tools
