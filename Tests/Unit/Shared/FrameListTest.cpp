#include "Shared/FrameList.h"

#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>
#include <ranges>
#include <thread>
#include <type_traits>
#include <utility>

// Frames are written in short hand: R7 is a report, M7 a metadata item, a=1 a write of 1 to the state "a".

namespace ZorvaTouch {
namespace {

using Scripted::framesFromShortHand;
using Scripted::framesOf;
using Scripted::listFromShortHand;
using Scripted::metadataFrame;
using Scripted::patternedReport;
using Scripted::reportFrame;
using Scripted::shortHand;
using Scripted::stateFrame;

std::string trimmed(const char *frames, std::uint64_t maxCount) {
    FrameList list = listFromShortHand(frames);
    list.trim(maxCount);
    return shortHand(list);
}

/// A list of `count` one-byte reports at the times 0, 1, 2 ...; the byte is the time modulo 256.
FrameList numberedReports(std::size_t count) {
    FrameList list;
    for (std::size_t i = 0; i < count; ++i)
        list.appendReport(i, std::vector<std::uint8_t>{static_cast<std::uint8_t>(i)});
    return list;
}

void expectNumberedReports(const FrameList &list, std::size_t first, std::size_t count) {
    ASSERT_EQ(list.size(), count);
    std::size_t expected = first;
    for (const FrameView frame : list) {
        ASSERT_EQ(frame.timestampNs, expected);
        ASSERT_EQ(frame.data.size(), 1u);
        ASSERT_EQ(frame.data[0], static_cast<std::uint8_t>(expected));
        ++expected;
    }
    ASSERT_EQ(expected, first + count);
}

// --- Appending and reading -----------------------------------------------------------------------

TEST(FrameList, IsEmptyAtFirst) {
    FrameList list;
    EXPECT_TRUE(list.empty());
    EXPECT_EQ(list.size(), 0u);
    EXPECT_TRUE(list.begin() == list.end());
    list.trim(5);
    list.trim(0);
    list.sort();
    EXPECT_TRUE(list.empty());
}

TEST(FrameList, KeepsFramesOfEveryKindWhole) {
    const std::vector<Frame> frames{
        stateFrame(18446744073709551615u, "Algs.ActivationThreshold", 250.5),
        reportFrame(7, {1, 0, 255}),
        metadataFrame(0, "Accel",
                      PropertyValue::Dictionary{{"x", PropertyValue::Array{1u, "two", PropertyValue()}}}),
        stateFrame(3, "", PropertyValue()),
        metadataFrame(3, std::string("nul\0key", 7), std::string(1000, 'v')),
    };
    FrameList list;
    for (const Frame &frame : frames)
        list.append(frame);
    EXPECT_EQ(framesOf(list), frames);
    for (std::size_t i = 0; i < frames.size(); ++i)
        EXPECT_EQ(list[i].toFrame(), frames[i]) << i;
}

TEST(FrameList, AReportIsTheSameEitherWayItIsAdded) {
    for (const std::size_t length : {0u, 1u, 73u, 76u, 77u, 512u, 600u, 70000u}) {
        FrameList byFrame;
        FrameList byBytes;
        const auto bytes = patternedReport(length, 1);
        byFrame.append(reportFrame(5, bytes));
        byBytes.appendReport(5, bytes);
        EXPECT_EQ(framesOf(byFrame), framesOf(byBytes)) << length;
        EXPECT_EQ(framesOf(byBytes).at(0), reportFrame(5, bytes)) << length;
    }
}

TEST(FrameList, KeepsWhatAFramesKindHasNoUseFor) {
    // The same for a report that would fit a slot and for one that does not.
    for (const std::size_t length : {1u, 76u, 77u, 600u}) {
        const auto bytes = patternedReport(length, 1);
        const std::vector<Frame> frames{{FrameType::InputReport, 5, "key", {}, bytes},
                                        {FrameType::InputReport, 6, "", 7u, bytes},
                                        {FrameType::InputReport, 7, "key", "value", bytes},
                                        {FrameType::State, 8, "key", 7u, bytes}};
        FrameList list;
        for (const Frame &frame : frames)
            list.append(frame);
        EXPECT_EQ(framesOf(list), frames) << length;
    }
}

TEST(FrameList, KeepsReportsOfEveryLengthByteForByte) {
    // Long and short ones side by side, over several chunks, so that each stands next to each.
    const std::vector<std::size_t> lengths{0,  1,  73,  76,  77,  512, 600,   70000,
                                           75, 78, 255, 256, 511, 513, 65535, 65536};
    FrameList list;
    std::vector<Frame> frames;
    for (std::size_t i = 0; i < 200; ++i) {
        const auto bytes = patternedReport(lengths[(i * 7) % lengths.size()], static_cast<std::uint8_t>(i));
        frames.push_back(reportFrame(i, bytes));
        list.appendReport(i, bytes);
    }
    EXPECT_EQ(framesOf(list), frames);
    list.trim(130);
    EXPECT_EQ(framesOf(list), std::vector<Frame>(frames.end() - 130, frames.end()));
}

TEST(FrameList, CopiesTheReport) {
    std::vector<std::uint8_t> bytes{1, 2, 3};
    FrameList list;
    list.appendReport(1, bytes);
    bytes.assign(3, 0);
    EXPECT_EQ(list[0].toFrame(), reportFrame(1, {1, 2, 3}));
}

TEST(FrameList, ASlotUsedAgainShowsNothingOfItsLastFrame) {
    // Every chunk that is dropped comes back: with long reports, keys and values first, then with bare
    // frames.
    FrameList list;
    for (std::size_t round = 0; round < 6; ++round) {
        for (std::size_t i = 0; i < 64; ++i)
            list.append(metadataFrame(i, "key", "value"));
        for (std::size_t i = 0; i < 64; ++i)
            list.appendReport(i, patternedReport(600, 1));
        list.trim(1);
    }
    list.trim(0);
    EXPECT_TRUE(list.empty());
    std::vector<Frame> frames;
    for (std::size_t i = 0; i < 256; ++i) {
        frames.push_back(i % 2 ? reportFrame(i, {}) : stateFrame(i, "", PropertyValue()));
        list.append(frames.back());
    }
    EXPECT_EQ(framesOf(list), frames);
}

TEST(FrameList, ChunkBordersDoNotShow) {
    for (const std::size_t count : {1u, 63u, 64u, 65u, 127u, 128u, 129u, 192u, 8699u, 8700u}) {
        SCOPED_TRACE(count);
        const FrameList list = numberedReports(count);
        expectNumberedReports(list, 0, count);
        for (const std::size_t index : {std::size_t{0}, count / 2, count - 1})
            EXPECT_EQ(list[index].timestampNs, index);
    }
}

// --- Trimming ------------------------------------------------------------------------------------

TEST(FrameList, TrimKeepsTheStateThatTheKeptStretchBeganWith) {
    EXPECT_EQ(trimmed("R1 a=1 R2 a=2 a=3 R3 R4", 2), "a=3 R3 R4");
}

TEST(FrameList, TrimKeepsTheLastWriteBetweenTwoKeptFrames) {
    EXPECT_EQ(trimmed("R1 a=1 a=2 b=1 a=3 R2 a=4 a=5 R3", 2), "b=1 a=3 R2 a=5 R3");
    EXPECT_EQ(trimmed("R1 a=1 a=2 b=1 a=3 R2 a=4 a=5 R3", 3), "R1 b=1 a=3 R2 a=5 R3");
}

TEST(FrameList, TrimKeepsTheNewestWritesAfterTheLastFrame) {
    EXPECT_EQ(trimmed("R1 a=1 b=1 a=2", 5), "R1 b=1 a=2");
    EXPECT_EQ(trimmed("a=1 R1 a=2", 1), "a=1 R1 a=2") << "both matter: one before the report, one after it";
}

TEST(FrameList, TrimToNothingKeepsTheNewestWriteOfEachKey) {
    EXPECT_EQ(trimmed("a=1 R1 b=1 R2 a=2 M3 c=1", 0), "b=1 a=2 c=1");
    EXPECT_EQ(trimmed("R1 R2 M3", 0), "");
}

TEST(FrameList, TrimThinsOutStatesEvenBelowTheBound) {
    EXPECT_EQ(trimmed("a=1 a=2 R1 a=3", 100), "a=2 R1 a=3");
    EXPECT_EQ(trimmed("a=1 b=1 a=2 b=2 a=3", 100), "b=2 a=3");
}

TEST(FrameList, TrimCountsMetadataAsFrames) {
    EXPECT_EQ(trimmed("R1 M2 a=1 R3 M4", 2), "a=1 R3 M4");
    EXPECT_EQ(trimmed("R1 M2 a=1 R3 M4", 3), "M2 a=1 R3 M4");
}

TEST(FrameList, TrimDoesNotCountStates) {
    EXPECT_EQ(trimmed("R1 a=1 b=1 c=1 d=1 R2", 1), "a=1 b=1 c=1 d=1 R2");
    EXPECT_EQ(trimmed("R1 a=1 b=1 c=1 d=1 R2", 2), "R1 a=1 b=1 c=1 d=1 R2");
}

TEST(FrameList, TrimLeavesAListWithinTheBoundAlone) {
    EXPECT_EQ(trimmed("R1 R2 R3", 3), "R1 R2 R3");
    EXPECT_EQ(trimmed("R1 R2 R3", 4), "R1 R2 R3");
    EXPECT_EQ(trimmed("R1 R2 R3", 18446744073709551615u), "R1 R2 R3");
    EXPECT_EQ(trimmed("R1 R2 R3", 2), "R2 R3");
    EXPECT_EQ(trimmed("R1 R2 R3", 1), "R3");
}

TEST(FrameList, TrimTwiceIsTrimOnce) {
    FrameList list = listFromShortHand("R1 a=1 R2 b=1 a=2 a=3 R3 b=2 R4 a=4 b=3");
    list.trim(2);
    EXPECT_EQ(shortHand(list), "b=1 a=3 R3 b=2 R4 a=4 b=3");
    list.trim(2);
    EXPECT_EQ(shortHand(list), "b=1 a=3 R3 b=2 R4 a=4 b=3");
}

TEST(FrameList, AListOfStateWritesShrinksToOneOfEach) {
    FrameList list;
    for (std::uint64_t i = 0; i < 1000; ++i)
        list.append(stateFrame(i, i % 2 ? "odd" : "even", i));
    EXPECT_EQ(list.countKept(7, 500), 2u);
    list.trim(7);
    EXPECT_EQ(framesOf(list),
              (std::vector<Frame>{stateFrame(998, "even", 998u), stateFrame(999, "odd", 999u)}));
}

TEST(FrameList, ManyKeysAreAllKept) {
    // 500 keys, each written three times, then one report: the third round survives.
    FrameList list;
    std::vector<Frame> lastRound;
    for (std::uint64_t i = 0; i < 1500; ++i) {
        const Frame frame = stateFrame(i, "key" + std::to_string(i % 500), i);
        list.append(frame);
        if (i >= 1000)
            lastRound.push_back(frame);
    }
    list.append(reportFrame(1500, {1}));
    lastRound.push_back(reportFrame(1500, {1}));
    list.trim(1);
    EXPECT_EQ(framesOf(list), lastRound);
}

TEST(FrameList, KeysAreComparedWhole) {
    FrameList list;
    const std::string longKey(300, 'k');
    std::vector<Frame> frames;
    for (const std::string &key : {std::string("a"), std::string("a\0", 2), std::string("A"), std::string(),
                                   longKey, longKey + "k", std::string("a\0b", 3)})
        frames.push_back(stateFrame(1, key, key));
    for (const Frame &frame : frames)
        list.append(frame);
    list.trim(1);
    EXPECT_EQ(framesOf(list), frames);
}

TEST(FrameList, TrimWorksAtChunkBorders) {
    for (const std::size_t count : {63u, 64u, 65u, 128u, 8699u, 8700u}) {
        for (const std::size_t bound : {0u, 1u, 62u, 63u, 64u, 65u, 128u, 4350u, 8699u}) {
            SCOPED_TRACE(std::to_string(count) + " frames, bound " + std::to_string(bound));
            FrameList list = numberedReports(count);
            list.trim(bound);
            const std::size_t kept = std::min(count, bound);
            expectNumberedReports(list, count - kept, kept);
            list.appendReport(count, std::vector<std::uint8_t>{static_cast<std::uint8_t>(count)});
            expectNumberedReports(list, count - kept, kept + 1);
        }
    }
}

TEST(FrameList, ABoundedListOfMetadataGoesOnForEver) {
    // Each of the few chunks in use is filled with shared frames more than a thousand times.
    FrameList list;
    for (std::uint64_t i = 0; i < 300000; ++i) {
        list.append(metadataFrame(i, "m", i));
        if (list.size() >= 128)
            list.trim(64);
    }
    list.trim(2);
    EXPECT_EQ(framesOf(list),
              (std::vector<Frame>{metadataFrame(299998, "m", 299998u), metadataFrame(299999, "m", 299999u)}));
}

TEST(FrameList, StatesInDroppedChunksAreCarriedOver) {
    // The one write stands 300 reports before the stretch that is kept.
    FrameList list;
    list.append(stateFrame(0, "a", "early"));
    for (std::uint64_t i = 1; i <= 400; ++i)
        list.appendReport(i, std::vector<std::uint8_t>{1});
    list.trim(100);
    ASSERT_EQ(list.size(), 101u);
    EXPECT_EQ(list[0].toFrame(), stateFrame(0, "a", "early"));
    EXPECT_EQ(list[1].timestampNs, 301u);
    EXPECT_EQ(list[100].timestampNs, 400u);
}

TEST(FrameList, ThinlySpreadStatesSurviveAndStaySharedWithCopies) {
    // 100 keys, 70 reports after each: of every chunk one write or two are left, over and over.
    FrameList list;
    std::vector<Frame> states;
    for (std::uint64_t i = 0; i < 100; ++i) {
        states.push_back(stateFrame(i, "key" + std::to_string(i), i));
        list.append(states.back());
        for (int j = 0; j < 70; ++j)
            list.appendReport(i, patternedReport(73, static_cast<std::uint8_t>(j)));
    }
    const FrameList whole(list);
    list.trim(1);
    std::vector<Frame> expected = states;
    expected.push_back(reportFrame(99, patternedReport(73, 69)));
    EXPECT_EQ(framesOf(list), expected);
    const FrameList thinned(list);
    list.trim(0);
    list.append(reportFrame(7, {7}));
    EXPECT_EQ(framesOf(thinned), expected);
    expected = states;
    expected.push_back(reportFrame(7, {7}));
    EXPECT_EQ(framesOf(list), expected);
    EXPECT_EQ(whole.size(), 7100u);
    EXPECT_EQ(whole[71 * 50].toFrame(), states[50]);
    EXPECT_EQ(whole[7099].toFrame(), reportFrame(99, patternedReport(73, 69)));
}

TEST(FrameList, ABoundedListStaysWhatItIsOverManyRounds) {
    FrameList list;
    for (std::uint64_t i = 0; i < 20000; ++i) {
        if (i % 10 == 0)
            list.append(stateFrame(i, "tens", i));
        list.appendReport(i, patternedReport(i % 100, static_cast<std::uint8_t>(i)));
        if (list.size() >= 200)
            list.trim(100);
    }
    list.trim(100);
    // The reports 19900 to 19999, a write before every tenth of them.
    ASSERT_EQ(list.size(), 110u);
    EXPECT_EQ(list[0].toFrame(), stateFrame(19900, "tens", 19900u));
    EXPECT_EQ(list[1].toFrame(), reportFrame(19900, patternedReport(0, static_cast<std::uint8_t>(19900))));
    EXPECT_EQ(list[109].toFrame(), reportFrame(19999, patternedReport(99, static_cast<std::uint8_t>(19999))));
}

// --- What a trim would keep ----------------------------------------------------------------------

TEST(FrameList, CountsWhatATrimWouldKeepAndChangesNothing) {
    // Kept of R1 a=1 R2 a=2 a=3 R3 R4 are a=3 R3 R4, at 4, 5 and 6.
    const FrameList list = listFromShortHand("R1 a=1 R2 a=2 a=3 R3 R4");
    EXPECT_EQ(list.countKept(2), 3u);
    for (const std::size_t first : {0u, 1u, 2u, 3u, 4u})
        EXPECT_EQ(list.countKept(2, first), 3u) << first;
    EXPECT_EQ(list.countKept(2, 5), 2u);
    EXPECT_EQ(list.countKept(2, 6), 1u);
    EXPECT_EQ(list.countKept(2, 7), 0u);
    EXPECT_EQ(list.countKept(100), 6u) << "a=3 overwrites a=2 before any report";
    EXPECT_EQ(list.countKept(0), 1u) << "the last write";
    EXPECT_EQ(shortHand(list), "R1 a=1 R2 a=2 a=3 R3 R4");
    EXPECT_EQ(FrameList().countKept(5), 0u);
}

TEST(FrameList, CountsWhatATrimWouldKeepAcrossChunks) {
    const FrameList list = numberedReports(1000);
    EXPECT_EQ(list.countKept(500, 499), 500u);
    EXPECT_EQ(list.countKept(500, 500), 500u);
    EXPECT_EQ(list.countKept(500, 501), 499u);
    EXPECT_EQ(list.countKept(500, 999), 1u);
    EXPECT_EQ(list.countKept(500, 1000), 0u);
    EXPECT_EQ(list.countKept(2000, 777), 223u);
    EXPECT_EQ(list.countKept(2000, 0), 1000u);
}

// --- Undoing an append ---------------------------------------------------------------------------

TEST(FrameList, AnAppendCanBeTakenBack) {
    for (const std::size_t count : {0u, 1u, 63u, 64u, 65u, 128u}) {
        FrameList list = numberedReports(count);
        list.appendReport(1000, std::vector<std::uint8_t>{1});
        list.undoAppend();
        expectNumberedReports(list, 0, count);
        list.append(stateFrame(1000, "a", "text"));
        list.undoAppend();
        expectNumberedReports(list, 0, count);
        EXPECT_EQ(list.countKept(0), 0u) << "the state write is not counted any more";
        list.appendReport(count, std::vector<std::uint8_t>{static_cast<std::uint8_t>(count)});
        expectNumberedReports(list, 0, count + 1);
    }
}

TEST(FrameList, AnAppendTakenBackLeavesCopiesAlone) {
    FrameList list = numberedReports(64);
    const FrameList copy(list);
    list.append(metadataFrame(64, "m", 1u));
    list.undoAppend();
    list.appendReport(64, std::vector<std::uint8_t>{64});
    expectNumberedReports(copy, 0, 64);
    expectNumberedReports(list, 0, 65);
}

// --- Walking -------------------------------------------------------------------------------------

static_assert(std::forward_iterator<FrameList::Iterator>);
static_assert(std::ranges::forward_range<const FrameList> && std::ranges::sized_range<const FrameList>);
static_assert(!std::random_access_iterator<FrameList::Iterator>);
static_assert(
    std::is_same_v<std::iterator_traits<FrameList::Iterator>::iterator_category, std::input_iterator_tag>);

TEST(FrameList, IteratorsWalkTheListMoreThanOnce) {
    const FrameList list = numberedReports(65);
    FrameList::Iterator left = list.begin();
    const FrameList::Iterator right = left++;
    EXPECT_TRUE(right == list.begin());
    EXPECT_EQ(right->timestampNs, 0u);
    EXPECT_EQ(left->timestampNs, 1u);
    EXPECT_EQ(std::next(right, 64)->timestampNs, 64u) << "in the second chunk";
    EXPECT_EQ(std::ranges::distance(right, list.end()), 65);
    EXPECT_EQ(right->timestampNs, 0u) << "a pass leaves other iterators where they are";
    left = FrameList::Iterator();
    EXPECT_TRUE(left == FrameList::Iterator());
}

TEST(FrameList, RangesAndAlgorithmsTakeAList) {
    const FrameList list = listFromShortHand("R1@10 a=1@20 M3@20 R4@30");
    const auto isReport = [](const FrameView &frame) { return frame.type == FrameType::InputReport; };
    EXPECT_EQ(std::ranges::count_if(list, isReport), 2);
    EXPECT_EQ(std::count_if(list.begin(), list.end(), isReport), 2);
    EXPECT_EQ(std::ranges::find(list, 20u, &FrameView::timestampNs)->key, "a");
    EXPECT_EQ(std::ranges::adjacent_find(list, {}, &FrameView::timestampNs)->key, "a");
    EXPECT_TRUE(std::ranges::is_sorted(list, {}, &FrameView::timestampNs));
    EXPECT_EQ(std::ranges::max_element(list, {}, &FrameView::timestampNs)->data[0], 4);
    std::vector<std::uint64_t> times;
    // Not through views: clang 14 cannot compile those of libstdc++.
    std::ranges::transform(list, std::back_inserter(times),
                           [](const FrameView &frame) { return frame.timestampNs; });
    EXPECT_EQ(times, (std::vector<std::uint64_t>{10, 20, 20, 30}));
}

// --- Sorting -------------------------------------------------------------------------------------

TEST(FrameList, SortIsByTimeAndStable) {
    FrameList list = listFromShortHand("R1@30 a=1@10 M3@20 R4@10 a=2@20 R6@0 R7@30");
    list.sort();
    EXPECT_EQ(shortHand(list), "R6 a=1 R4 M3 a=2 R1 R7");
}

TEST(FrameList, SortComparesTimesAsUnsigned) {
    FrameList list = listFromShortHand("R1@18446744073709551615 R2@0 R3@9223372036854775808 R4@1");
    list.sort();
    EXPECT_EQ(shortHand(list), "R2 R4 R3 R1");
}

TEST(FrameList, SortTurnsALongListAround) {
    FrameList list;
    for (std::size_t i = 0; i < 1000; ++i) {
        const std::size_t time = 999 - i;
        list.appendReport(time, std::vector<std::uint8_t>{static_cast<std::uint8_t>(time)});
    }
    list.sort();
    expectNumberedReports(list, 0, 1000);
}

TEST(FrameList, SortKeepsALongListOfOneTimeInOrder) {
    FrameList list;
    std::vector<Frame> frames;
    for (std::uint8_t i = 0; i < 200; ++i) {
        frames.push_back(reportFrame(5, {i}));
        list.append(frames.back());
    }
    list.sort();
    EXPECT_EQ(framesOf(list), frames);
}

TEST(FrameList, ASortedListTakesFramesAndTrims) {
    FrameList list = listFromShortHand("R1@30 R2@10 R3@20");
    list.sort();
    list.append(reportFrame(5, {4}));
    EXPECT_EQ(shortHand(list), "R2 R3 R1 R4");
    list.trim(2);
    EXPECT_EQ(shortHand(list), "R1 R4");
}

TEST(FrameList, SortKeepsLongReportsWithTheirFrames) {
    FrameList list;
    for (std::uint8_t i = 0; i < 130; ++i)
        list.appendReport(129u - i, patternedReport(i % 2 ? 600u : 73u, i));
    list.sort();
    for (std::size_t i = 0; i < 130; ++i) {
        const auto number = static_cast<std::uint8_t>(129 - i);
        EXPECT_EQ(list[i].toFrame(), reportFrame(i, patternedReport(number % 2 ? 600u : 73u, number)));
    }
}

// --- Copies and moves ----------------------------------------------------------------------------

/// Frames of all kinds over several chunks, in no order of time.
FrameList mixedList(std::size_t count) {
    FrameList list;
    for (std::size_t i = 0; i < count; ++i) {
        const std::uint64_t time = (i * 37) % 101;
        if (i % 5 == 0)
            list.append(stateFrame(time, "key" + std::to_string(i % 3), static_cast<std::uint64_t>(i)));
        else if (i % 5 == 1)
            list.append(metadataFrame(time, "note", std::to_string(i)));
        else
            list.appendReport(time, patternedReport(i % 3 ? 73 : 600, static_cast<std::uint8_t>(i)));
    }
    return list;
}

using Change = void (*)(FrameList &);
constexpr Change kChanges[] = {
    [](FrameList &list) {
        list.append(reportFrame(1, {1, 2, 3}));
    },
    [](FrameList &list) {
        for (int i = 0; i < 200; ++i)
            list.appendReport(1, patternedReport(600, 9));
    },
    [](FrameList &list) { list.trim(3); },
    [](FrameList &list) { list.trim(70); },
    [](FrameList &list) { list.trim(0); },
    [](FrameList &list) { list.sort(); },
    [](FrameList &list) { list = FrameList(); },
    [](FrameList &list) { FrameList gone = std::move(list); },
    [](FrameList &list) {
        list.trim(1);
        for (int i = 0; i < 300; ++i)
            list.append(metadataFrame(2, "other", "text"));
    },
};

TEST(FrameList, ACopyHasTheSameFrames) {
    for (const std::size_t count : {0u, 1u, 63u, 64u, 65u, 128u, 200u}) {
        const FrameList original = mixedList(count);
        const FrameList copy(original);
        EXPECT_EQ(framesOf(copy), framesOf(original)) << count;
        FrameList assigned = mixedList(10);
        assigned = original;
        EXPECT_EQ(framesOf(assigned), framesOf(original)) << count;
    }
}

TEST(FrameList, AChangeOfTheOriginalLeavesTheCopyAlone) {
    for (const std::size_t count : {0u, 1u, 63u, 64u, 65u, 128u, 200u}) {
        for (std::size_t i = 0; i < std::size(kChanges); ++i) {
            FrameList original = mixedList(count);
            const std::vector<Frame> frames = framesOf(original);
            const FrameList copy(original);
            kChanges[i](original);
            EXPECT_EQ(framesOf(copy), frames) << count << " frames, change " << i;
        }
    }
}

TEST(FrameList, AChangeOfTheCopyLeavesTheOriginalAlone) {
    for (const std::size_t count : {0u, 1u, 63u, 64u, 65u, 128u, 200u}) {
        for (std::size_t i = 0; i < std::size(kChanges); ++i) {
            const FrameList original = mixedList(count);
            const std::vector<Frame> frames = framesOf(original);
            FrameList copy;
            copy = original;
            kChanges[i](copy);
            EXPECT_EQ(framesOf(original), frames) << count << " frames, change " << i;
        }
    }
}

TEST(FrameList, BothSidesOfACopyGoTheirOwnWay) {
    FrameList original = listFromShortHand("R1 R2 R3");
    FrameList copy(original);
    original.append(reportFrame(4, {4}));
    copy.append(reportFrame(4, {5}));
    EXPECT_EQ(shortHand(original), "R1 R2 R3 R4");
    EXPECT_EQ(shortHand(copy), "R1 R2 R3 R5");
    original.trim(2);
    copy.sort();
    EXPECT_EQ(shortHand(original), "R3 R4");
    EXPECT_EQ(shortHand(copy), "R1 R2 R3 R5");
}

TEST(FrameList, ACopyOutlivesItsOriginal) {
    FrameList copy;
    std::vector<Frame> frames;
    {
        const FrameList original = mixedList(200);
        frames = framesOf(original);
        copy = original;
    }
    EXPECT_EQ(framesOf(copy), frames);
}

TEST(FrameList, CopiesOfCopiesStayApart) {
    FrameList first = mixedList(150);
    const std::vector<Frame> frames = framesOf(first);
    std::vector<FrameList> copies(4, first);
    copies.emplace_back(copies.front());
    first.trim(5);
    copies[0].trim(9);
    copies[1].sort();
    copies[2] = copies[0];
    EXPECT_EQ(framesOf(copies[2]), framesOf(copies[0]));
    EXPECT_EQ(framesOf(copies[3]), frames);
    EXPECT_EQ(framesOf(copies[4]), frames);
}

TEST(FrameList, ACopyMayBeUsedOnAnotherThread) {
    FrameList list = mixedList(1000);
    const std::vector<Frame> frames = framesOf(list);
    for (int round = 0; round < 20; ++round) {
        std::vector<Frame> seen;
        std::thread reader([copy = list, &seen]() mutable {
            seen = framesOf(copy);
            copy.trim(100);
            copy.append(reportFrame(1, {1}));
        });
        FrameList other(list);
        list.trim(500);
        for (int i = 0; i < 300; ++i)
            list.appendReport(1, patternedReport(73, 1));
        list.trim(10);
        reader.join();
        EXPECT_EQ(seen, frames);
        list = std::move(other);
    }
}

TEST(FrameList, SelfAssignmentChangesNothing) {
    FrameList list = mixedList(150);
    const std::vector<Frame> frames = framesOf(list);
    FrameList &same = list;
    list = same;
    EXPECT_EQ(framesOf(list), frames);
    list = std::move(same);
    EXPECT_EQ(framesOf(list), frames);
    list.append(reportFrame(1, {1}));
    EXPECT_EQ(list.size(), 151u);
}

TEST(FrameList, AMovedFromListIsEmptyAndOfUse) {
    for (const std::size_t count : {1u, 64u, 200u}) {
        FrameList list = mixedList(count);
        const std::vector<Frame> frames = framesOf(list);
        FrameList target(std::move(list));
        EXPECT_EQ(framesOf(target), frames);
        EXPECT_TRUE(list.empty()); // NOLINT(bugprone-use-after-move): that is what is tested
        EXPECT_TRUE(list.begin() == list.end());
        list.trim(1);
        list.sort();
        list.append(reportFrame(9, {9}));
        EXPECT_EQ(shortHand(list), "R9");

        FrameList assigned = mixedList(70);
        assigned = std::move(target);
        EXPECT_EQ(framesOf(assigned), frames);
        EXPECT_TRUE(target.empty()); // NOLINT(bugprone-use-after-move)
        target.appendReport(8, std::vector<std::uint8_t>{8});
        EXPECT_EQ(shortHand(target), "R8");
        EXPECT_EQ(framesOf(assigned), frames);
    }
}

TEST(FrameList, ListsCanBeSwapped) {
    FrameList left = mixedList(100);
    FrameList right = listFromShortHand("R1 R2");
    const std::vector<Frame> frames = framesOf(left);
    std::swap(left, right);
    EXPECT_EQ(shortHand(left), "R1 R2");
    EXPECT_EQ(framesOf(right), frames);
    left.append(reportFrame(3, {3}));
    EXPECT_EQ(shortHand(left), "R1 R2 R3");
}

TEST(FrameList, FrameViewsTurnIntoFramesThatLast) {
    Frame kept;
    {
        FrameList list;
        list.append(metadataFrame(1, "a key that is longer than a short string", "value"));
        kept = list[0].toFrame();
    }
    EXPECT_EQ(kept, metadataFrame(1, "a key that is longer than a short string", "value"));
}

} // namespace
} // namespace ZorvaTouch
