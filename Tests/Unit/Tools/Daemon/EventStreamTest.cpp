#include "Tools/Daemon/EventStream.h"

#include "Shared/Ports/Log.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <condition_variable>
#include <future>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using std::chrono::milliseconds;
using testing::ElementsAre;

/// A reader that takes as many writes as it is told to, and tells how many were begun.
class Reader final : public Host::TextWriter {
public:
    ~Reader() override { _isGone.set_value(); }

    int write(std::string_view text) noexcept override {
        std::unique_lock lock(_mutex);
        ++_begun;
        _changed.notify_all();
        _changed.wait(lock, [this] { return _allowed > 0 || (_isGivenUp && canBeGivenUp); });
        if (_allowed == 0)
            return ECANCELED;
        --_allowed;
        if (errorNumber == 0)
            _text.append(text);
        return errorNumber;
    }
    void giveUp() noexcept override {
        const std::lock_guard lock(_mutex);
        _isGivenUp = true;
        _changed.notify_all();
    }

    void allow(int writes) {
        const std::lock_guard lock(_mutex);
        _allowed += writes;
        _changed.notify_all();
    }
    void waitUntilBegun(int writes) {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [&] { return _begun >= writes; });
    }
    [[nodiscard]] std::string text() {
        const std::lock_guard lock(_mutex);
        return _text;
    }
    [[nodiscard]] int begun() {
        const std::lock_guard lock(_mutex);
        return _begun;
    }
    [[nodiscard]] std::future<void> gone() { return _isGone.get_future(); }

    int errorNumber = 0; ///< what a write comes to
    bool canBeGivenUp = true;

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    std::promise<void> _isGone;
    int _allowed = 0;
    int _begun = 0;
    bool _isGivenUp = false;
    std::string _text;
};

class NotedLog final : public Ports::Log {
public:
    [[nodiscard]] bool isEnabled(Ports::LogLevel) const noexcept override { return true; }
    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        EXPECT_EQ(level, Ports::LogLevel::Error);
        const std::lock_guard lock(_mutex);
        _records.emplace_back(text);
        _changed.notify_all();
    }

    void waitForRecord() {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [this] { return !_records.empty(); });
    }
    [[nodiscard]] std::vector<std::string> records() {
        const std::lock_guard lock(_mutex);
        return _records;
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    std::vector<std::string> _records;
};

constexpr int kAll = 1'000'000;
constexpr milliseconds kLong{60'000}; ///< only as long as something is wrong
constexpr milliseconds kAtOnce{1};

class EventStreamTest : public ::testing::Test {
protected:
    static std::string droppedLine(std::uint64_t lines) { return "(" + std::to_string(lines) + " lost)\n"; }

    /// Puts numbers as lines.
    void putNumbers(std::size_t count) {
        for (std::size_t number = 0; number < count; ++number)
            stream->put(std::to_string(number) + "\n");
    }
    static std::string numbers(std::size_t count) {
        std::string text;
        for (std::size_t number = 0; number < count; ++number)
            text.append(std::to_string(number)).append("\n");
        return text;
    }
    /// A line that is being written, with nothing behind it.
    void putFirst() {
        stream->put("first\n");
        reader->waitUntilBegun(1);
    }

    std::shared_ptr<Reader> reader = std::make_shared<Reader>();
    std::shared_ptr<NotedLog> log = std::make_shared<NotedLog>();
    std::unique_ptr<EventStream> stream = std::make_unique<EventStream>(reader, droppedLine, log);
};

TEST_F(EventStreamTest, LinesComeOutInTheirOrder) {
    reader->allow(kAll);
    putNumbers(300);
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), numbers(300));
    EXPECT_THAT(log->records(), ElementsAre());
}

TEST_F(EventStreamTest, TheEndWritesWhatWaits) {
    putFirst();
    putNumbers(3);
    reader->allow(kAll);
    stream.reset();
    EXPECT_EQ(reader->text(), "first\n" + numbers(3));
}

TEST_F(EventStreamTest, AThousandLinesWaitAndTheRestIsCounted) {
    putFirst();
    putNumbers(1005);
    reader->allow(kAll);
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), "first\n" + numbers(1000) + "(5 lost)\n");
}

TEST_F(EventStreamTest, LostLinesAreToldWhereTheyWouldHaveBeen) {
    putFirst();
    putNumbers(1002);
    reader->allow(1);
    reader->waitUntilBegun(2); // the next one is on its way and waits no more
    stream->put("late\n");
    stream->put("too late\n");
    reader->allow(kAll);
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), "first\n" + numbers(1000) + "(2 lost)\nlate\n(1 lost)\n");
}

TEST_F(EventStreamTest, AReaderThatIsGoneIsToldOnceInTheLog) {
    reader->errorNumber = EPIPE;
    reader->allow(kAll);
    stream->put("a\n");
    log->waitForRecord();
    putNumbers(10);
    stream->finish(kLong);
    EXPECT_EQ(reader->begun(), 1);
    EXPECT_THAT(log->records(),
                ElementsAre("standard output: cannot write: Broken pipe; nothing is shown any more"));
}

TEST_F(EventStreamTest, AReaderThatHangsDoesNotHangTheEnd) {
    putFirst();
    putNumbers(2);
    stream->finish(kAtOnce);
    stream.reset();
    EXPECT_EQ(reader->text(), "");
    const std::future<void> gone = reader->gone(); // with the thread, which on a busy machine comes later
    reader.reset();
    gone.wait();
    EXPECT_THAT(log->records(),
                ElementsAre("standard output: its reader hangs; lines that it does not get: 3"));
}

TEST_F(EventStreamTest, AWriteThatNothingEndsIsLeftBehind) {
    reader->canBeGivenUp = false;
    putFirst();
    putNumbers(2);
    stream->finish(kAtOnce);
    stream.reset();
    const std::future<void> gone = reader->gone();
    reader->allow(kAll); // or the thread would outlive the test
    reader.reset();
    gone.wait();
}

TEST_F(EventStreamTest, NothingIsTakenAfterTheEnd) {
    reader->allow(kAll);
    stream->finish(kLong);
    stream->put("a\n");
    stream->finish(kLong);
    stream.reset();
    EXPECT_EQ(reader->text(), "");
}

TEST_F(EventStreamTest, SeveralThreadsMayPut) {
    reader->allow(kAll);
    std::vector<std::thread> threads;
    for (int count = 0; count < 4; ++count)
        threads.emplace_back([this] { putNumbers(200); });
    for (std::thread &thread : threads)
        thread.join();
    stream->finish(kLong);
    EXPECT_EQ(reader->text().size(), 4 * numbers(200).size());
}

} // namespace
} // namespace ZorvaTouch::Tools
