#include "Host/Linux/RateLimitedLogs.h"

#include "Host/Simulated/VirtualClock.h"
#include "Tests/Support/RecordingFakes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <thread>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using namespace std::chrono_literals;
using Ports::LogLevel;
using Scripted::CapturingLogProvider;
using Simulated::VirtualClock;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

/// Limited logs in front of some that take everything down; times in seconds.
class Limited {
public:
    explicit Limited(RateLimitedLogs::Scope scope = RateLimitedLogs::Scope::Everything)
        : logs(std::make_unique<RateLimitedLogs>(
              sink, clock,
              [this] {
                  ++timersNeeded;
                  (void)logs->nextDue(); // as a program does: no lock is held
              },
              scope)),
          log(logs->openLog("s", "c")) {
        for (const LogLevel level : {LogLevel::Debug, LogLevel::Default, LogLevel::Error})
            sink.enable(level);
    }

    void write(const std::string &text, int times = 1, LogLevel level = LogLevel::Default) {
        for (int i = 0; i < times; ++i)
            log->write(level, text);
    }
    void at(std::uint64_t seconds) { clock.advanceToNanoseconds(seconds * 1'000'000'000); }

    /// The texts that have come through since the last time.
    std::vector<std::string> take() {
        std::vector<std::string> texts;
        for (const Scripted::LogRecord &record : std::exchange(sink.switches->records, {}))
            texts.push_back(record.text);
        return texts;
    }

    CapturingLogProvider sink;
    VirtualClock clock;
    int timersNeeded = 0;
    std::unique_ptr<RateLimitedLogs> logs;
    std::shared_ptr<Ports::Log> log;
};

TEST(RateLimitedLogs, FiveOfACausePassAndTheRestIsCounted) {
    Limited limited;
    limited.write("lost", 12);
    EXPECT_THAT(limited.take(), ElementsAre("lost", "lost", "lost", "lost", "lost"));
    limited.at(30);
    limited.logs->flush();
    EXPECT_THAT(limited.take(), ElementsAre("7 more of this in the last 30 s: lost"));
    limited.logs->flush();
    EXPECT_THAT(limited.take(), IsEmpty());
}

TEST(RateLimitedLogs, NothingIsCountedOfFive) {
    Limited limited;
    limited.write("lost", 5);
    EXPECT_THAT(limited.take(), SizeIs(5));
    EXPECT_EQ(limited.logs->nextDue(), std::nullopt);
    limited.at(30);
    limited.logs->flush();
    EXPECT_THAT(limited.take(), IsEmpty());
    EXPECT_EQ(limited.timersNeeded, 0);
}

TEST(RateLimitedLogs, TheNextRecordBringsTheCountAndBeginsAnotherThirtySeconds) {
    Limited limited;
    limited.at(100);
    limited.write("frame 1");
    limited.at(129);
    limited.write("frame 2", 5);
    (void)limited.take();
    limited.at(130);
    limited.write("frame 3", 6);
    EXPECT_THAT(limited.take(), ElementsAre("1 more of this in the last 30 s: frame 2", "frame 3", "frame 3",
                                            "frame 3", "frame 3", "frame 3"));
    limited.at(159);
    limited.write("frame 4");
    EXPECT_THAT(limited.take(), IsEmpty());
    limited.at(160);
    limited.write("frame 5");
    EXPECT_THAT(limited.take(), ElementsAre("2 more of this in the last 30 s: frame 4", "frame 5"));
}

TEST(RateLimitedLogs, NumbersMakeNoOtherCause) {
    Limited limited;
    for (const char *const text :
         {"image (5 -> 9)", "image (123 -> 0)", "image (0xDEADbeef -> 7)", "image (1 -> 0X0)",
          "image (7 -> 7)", "image (9 -> 10)", "image (0x1F -> 2)"})
        limited.write(text);
    EXPECT_THAT(limited.take(), SizeIs(5));
    limited.logs->finish();
    EXPECT_THAT(limited.take(), ElementsAre("2 more of this in the last 30 s: image (0x1F -> 2)"));
}

TEST(RateLimitedLogs, OtherWordsAreAnotherCause) {
    for (const char *const other :
         {"image (-1, 1)", "image (1, 1", "image (0x, 1)", "image (0x1g, 1)", "image", "image (1, 1) ", ""}) {
        Limited limited;
        limited.write("image (1, 1)", 6);
        (void)limited.take();
        limited.write(other);
        EXPECT_THAT(limited.take(), ElementsAre(other));
    }
}

TEST(RateLimitedLogs, LevelSubsystemAndCategoryMakeAnotherCause) {
    Limited limited;
    limited.write("lost", 6);
    limited.write("lost", 1, LogLevel::Error);
    limited.logs->openLog("s", "d")->write(LogLevel::Default, "lost");
    limited.logs->openLog("t", "c")->write(LogLevel::Default, "lost");
    limited.logs->openLog("", "sc")->write(LogLevel::Default, "lost");
    EXPECT_THAT(limited.take(), SizeIs(9));
    limited.logs->openLog("s", "c")->write(LogLevel::Default, "lost"); // another handle, the same cause
    EXPECT_THAT(limited.take(), IsEmpty());
}

TEST(RateLimitedLogs, ACountHasTheLevelOfWhatItCounts) {
    Limited limited;
    limited.write("lost", 6, LogLevel::Error);
    limited.logs->finish();
    ASSERT_THAT(limited.sink.switches->records, SizeIs(6));
    EXPECT_EQ(limited.sink.switches->records[5].level, LogLevel::Error);
    EXPECT_EQ(limited.sink.switches->records[5].text, "1 more of this in the last 30 s: lost");
}

TEST(RateLimitedLogs, ATimerIsNeededOnceForEachThirtySecondsThatHoldBack) {
    Limited limited;
    limited.write("lost", 5);
    EXPECT_EQ(limited.timersNeeded, 0);
    limited.write("lost", 3);
    EXPECT_EQ(limited.timersNeeded, 1);
    EXPECT_EQ(limited.logs->nextDue(), 30s);
    limited.at(10);
    limited.write("torn", 6);
    EXPECT_EQ(limited.timersNeeded, 2);
    EXPECT_EQ(limited.logs->nextDue(), 20s);
    limited.at(30);
    EXPECT_EQ(limited.logs->nextDue(), 0s);
    limited.logs->flush();
    EXPECT_EQ(limited.logs->nextDue(), 10s); // the other one's
    limited.at(45);
    EXPECT_EQ(limited.logs->nextDue(), 0s);
    limited.logs->flush();
    EXPECT_EQ(limited.logs->nextDue(), std::nullopt);
    limited.write("lost", 6);
    EXPECT_EQ(limited.timersNeeded, 3);
}

TEST(RateLimitedLogs, WhatIsDueIsRoundedUpToTheMicrosecond) {
    Limited limited;
    limited.write("lost", 6);
    limited.clock.advanceTicks(1); // a nanosecond
    EXPECT_EQ(limited.logs->nextDue(), 30s);
    limited.clock.advanceTicks(29'999'999'998);
    EXPECT_EQ(limited.logs->nextDue(), 1us);
    limited.logs->flush();
    EXPECT_THAT(limited.take(), SizeIs(5));
    limited.clock.advanceTicks(1);
    limited.logs->flush();
    EXPECT_THAT(limited.take(), SizeIs(1));
}

TEST(RateLimitedLogs, AFlushLeavesWhatIsNotDue) {
    Limited limited;
    limited.write("early", 6);
    limited.at(1);
    limited.write("late", 6);
    (void)limited.take();
    limited.at(30);
    limited.logs->flush();
    EXPECT_THAT(limited.take(), ElementsAre("1 more of this in the last 30 s: early"));
    limited.logs->finish();
    EXPECT_THAT(limited.take(), ElementsAre("1 more of this in the last 30 s: late"));
}

/// Texts that no number makes the same.
std::string kind(int number) {
    std::string text = "kind ";
    for (; number > 0; number /= 26)
        text += static_cast<char>('a' + number % 26);
    return text;
}

TEST(RateLimitedLogs, BeyondTwoHundredAndFiftySixCausesTheOthersShareFiveRecords) {
    Limited limited;
    for (int number = 0; number < 300; ++number)
        limited.write(kind(number));
    EXPECT_THAT(limited.take(), SizeIs(256 + 5));
    EXPECT_EQ(limited.timersNeeded, 1);
    limited.write(kind(0)); // one of the 256
    EXPECT_THAT(limited.take(), SizeIs(1));
    limited.at(30);
    limited.logs->flush();
    EXPECT_THAT(limited.take(),
                ElementsAre("39 more of other kinds in the last 30 s, such as: " + kind(299)));
}

TEST(RateLimitedLogs, TheOldestCauseWhoseTimeIsOverMakesRoom) {
    Limited limited;
    limited.write("oldest", 7);
    limited.at(1);
    for (int number = 0; number < 255; ++number)
        limited.write(kind(number));
    (void)limited.take();
    limited.at(30); // only the oldest is over
    limited.write("new", 6);
    EXPECT_THAT(limited.take(),
                ElementsAre("2 more of this in the last 30 s: oldest", "new", "new", "new", "new", "new"));
    limited.write("newer"); // there is no room for it
    limited.at(31);
    limited.write("newer"); // now there is
    EXPECT_THAT(limited.take(), ElementsAre("newer", "newer"));
    limited.logs->finish();
    EXPECT_THAT(limited.take(), ElementsAre("1 more of this in the last 30 s: new"));
}

TEST(RateLimitedLogs, LongTextsPassWholeAndAreHeldBackInPart) {
    Limited limited;
    const std::string text(3000, 'x');
    limited.write(text, 6);
    EXPECT_THAT(limited.take(), ElementsAre(text, text, text, text, text));
    limited.logs->finish();
    EXPECT_THAT(limited.take(),
                ElementsAre("1 more of this in the last 30 s: " + std::string(1024, 'x') + "..."));
}

TEST(RateLimitedLogs, TextsThatDifferAfterTwoHundredAndFiftySixCharactersAreOneCause) {
    Limited limited;
    limited.write(std::string(256, 'x'), 5);
    limited.write(std::string(256, 'x') + 'y');
    limited.write(std::string(255, 'x') + "1234567" + 'y'); // a number is one character
    EXPECT_THAT(limited.take(), SizeIs(6));
}

TEST(RateLimitedLogs, WhoAsksForDebugRecordsGetsThemAll) {
    Limited limited(RateLimitedLogs::Scope::ExceptDebug);
    limited.write("lost", 9, LogLevel::Debug);
    EXPECT_THAT(limited.take(), SizeIs(9));
    limited.write("lost", 9, LogLevel::Default);
    EXPECT_THAT(limited.take(), SizeIs(5));
    Limited all;
    all.write("lost", 9, LogLevel::Debug);
    EXPECT_THAT(all.take(), SizeIs(5));
}

TEST(RateLimitedLogs, WhatIsDisabledIsNotCounted) {
    Limited limited;
    limited.sink.enable(LogLevel::Debug, false);
    EXPECT_FALSE(limited.log->isEnabled(LogLevel::Debug));
    EXPECT_TRUE(limited.log->isEnabled(LogLevel::Error));
    limited.write("lost", 9, LogLevel::Debug);
    EXPECT_EQ(limited.timersNeeded, 0);
    limited.logs->finish();
    EXPECT_THAT(limited.take(), IsEmpty());
}

TEST(RateLimitedLogs, TheEndWritesTheCountsAndHandlesGoOn) {
    Limited limited;
    limited.write("lost", 6);
    (void)limited.take();
    limited.logs.reset();
    EXPECT_THAT(limited.take(), ElementsAre("1 more of this in the last 30 s: lost"));
    limited.write("lost", 2); // asks for no timer: nobody would serve it
    EXPECT_EQ(limited.timersNeeded, 1);
    limited.at(30);
    limited.write("lost");
    EXPECT_THAT(limited.take(), ElementsAre("2 more of this in the last 30 s: lost", "lost"));
}

TEST(RateLimitedLogs, ACallbackMayBeMissingOrThrow) {
    CapturingLogProvider sink;
    sink.enable(LogLevel::Error);
    VirtualClock clock;
    RateLimitedLogs without(sink, clock, nullptr);
    RateLimitedLogs throwing(sink, clock, [] { throw 1; });
    for (RateLimitedLogs *const logs : {&without, &throwing}) {
        const auto log = logs->openLog("s", "c");
        for (int i = 0; i < 7; ++i)
            log->write(LogLevel::Error, "lost");
        logs->finish();
    }
    EXPECT_THAT(sink.switches->records, SizeIs(12));
}

TEST(RateLimitedLogs, TimeGoesOnWhenTheClockWraps) {
    CapturingLogProvider sink;
    sink.enable(LogLevel::Error);
    Scripted::FakeClock clock;
    clock.ticks = UINT64_MAX - 9;
    RateLimitedLogs logs(sink, clock, nullptr);
    const auto log = logs.openLog("s", "c");
    for (int i = 0; i < 6; ++i)
        log->write(LogLevel::Error, "lost");
    clock.ticks = 29'999'999'989;
    EXPECT_EQ(logs.nextDue(), 1us);
    clock.ticks = 29'999'999'990;
    EXPECT_EQ(logs.nextDue(), 0us);
}

/// A log that may be written by several threads and only counts.
class CountingLogs final : public Ports::LogProvider,
                           public Ports::Log,
                           public std::enable_shared_from_this<CountingLogs> {
public:
    std::shared_ptr<Ports::Log> openLog(std::string_view, std::string_view) override {
        return shared_from_this();
    }
    bool isEnabled(LogLevel) const noexcept override { return true; }
    void write(LogLevel, std::string_view text) noexcept override {
        ++records;
        if (text.size() > 1)
            heldBack += std::stoi(std::string(text));
    }

    std::atomic<int> records = 0, heldBack = 0;
};

TEST(RateLimitedLogs, ThreadsShareTheLimit) {
    const auto sink = std::make_shared<CountingLogs>();
    VirtualClock clock;
    std::atomic<int> timersNeeded = 0;
    RateLimitedLogs logs(*sink, clock, [&] { ++timersNeeded; });
    const auto log = logs.openLog("s", "c");
    std::vector<std::thread> threads;
    threads.reserve(4);
    for (int i = 0; i < 4; ++i)
        threads.emplace_back([&] {
            for (int record = 0; record < 250; ++record)
                log->write(LogLevel::Error, "x");
        });
    for (std::thread &thread : threads)
        thread.join();
    EXPECT_EQ(sink->records, 5);
    logs.finish();
    EXPECT_EQ(sink->records, 6);
    EXPECT_EQ(sink->heldBack, 995);
    EXPECT_EQ(timersNeeded, 1);
}

/// What a property writes down: how much of each cause, and when its records passed, in seconds.
struct Tally {
    void write(Limited &limited, const std::string &cause, int times) {
        limited.write(cause, times);
        if (times > 0)
            written[cause] += static_cast<std::uint64_t>(times);
    }

    /// @param texts  Causes of one letter, and counts of them.
    void take(const std::vector<std::string> &texts, std::uint64_t seconds) {
        for (const std::string &text : texts) {
            const std::string cause = text.substr(text.size() - 1);
            told[cause] += text.size() > 1 ? std::stoull(text) : 1;
            if (text.size() == 1)
                passedAt[cause].push_back(seconds);
        }
    }

    std::map<std::string, std::uint64_t> written, told;
    std::map<std::string, std::vector<std::uint64_t>> passedAt;
};

/// The most records in 30 s, which follow one another and each begin with a record.
std::ptrdiff_t mostInAWindow(const std::vector<std::uint64_t> &times) {
    std::ptrdiff_t most = 0;
    for (auto first = times.begin(); first != times.end();) {
        const auto next = std::find_if(first, times.end(), [&](auto time) { return time >= *first + 30; });
        most = std::max(most, next - first);
        first = next;
    }
    return most;
}

RC_GTEST_PROP(RateLimitedLogs, NoWindowHasMoreThanFiveAndTheCountsAddUp, ()) {
    Limited limited;
    Tally tally;
    std::uint64_t seconds = 0;
    const auto steps = *rc::gen::container<std::vector<std::pair<int, int>>>(
        rc::gen::pair(rc::gen::inRange(0, 6), rc::gen::inRange(0, 12)));
    for (const auto &[what, amount] : steps) {
        if (what == 0)
            limited.at(seconds += static_cast<std::uint64_t>(amount));
        else if (what == 1)
            limited.logs->flush();
        else
            tally.write(limited, std::string(1, static_cast<char>('a' + what)), amount);
        tally.take(limited.take(), seconds);
        RC_ASSERT(limited.logs->nextDue().value_or(0us) <= std::chrono::microseconds(30s));
    }
    limited.logs->finish();
    tally.take(limited.take(), seconds);
    RC_ASSERT(tally.told == tally.written);
    for (const auto &[cause, times] : tally.passedAt)
        RC_ASSERT(mostInAWindow(times) <= 5);
}

} // namespace
} // namespace ZorvaTouch::Linux
