#include "Host/Runtime/AsyncWriter.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <condition_variable>
#include <future>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace ZorvaTouch::Host {
namespace {

using std::chrono::milliseconds;
using testing::ElementsAre;

/// A reader that takes as many writes as it is told to, and tells how many were begun.
class Reader final : public TextWriter {
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

/// The failures that were reported, as error number and lost lines.
class Failures {
public:
    using List = std::vector<std::pair<int, std::size_t>>;

    void add(int errorNumber, std::size_t lost) {
        const std::lock_guard lock(_mutex);
        _list.emplace_back(errorNumber, lost);
        _changed.notify_all();
    }
    void waitForOne() {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [this] { return !_list.empty(); });
    }
    [[nodiscard]] List list() {
        const std::lock_guard lock(_mutex);
        return _list;
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    List _list;
};

constexpr int kAll = 1'000'000;
constexpr milliseconds kLong{60'000}; ///< only as long as something is wrong
constexpr milliseconds kAtOnce{1};

class AsyncWriterTest : public ::testing::Test {
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
    std::shared_ptr<Failures> failures = std::make_shared<Failures>();
    std::unique_ptr<AsyncWriter> stream = std::make_unique<AsyncWriter>(
        "zorva-print", reader, droppedLine,
        [failures = failures](int errorNumber, std::size_t lost) { failures->add(errorNumber, lost); });
};

TEST_F(AsyncWriterTest, LinesComeOutInTheirOrder) {
    reader->allow(kAll);
    putNumbers(300);
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), numbers(300));
    EXPECT_THAT(failures->list(), ElementsAre());
}

TEST_F(AsyncWriterTest, TheEndWritesWhatWaits) {
    putFirst();
    putNumbers(3);
    reader->allow(kAll);
    stream.reset();
    EXPECT_EQ(reader->text(), "first\n" + numbers(3));
}

TEST_F(AsyncWriterTest, AThousandLinesWaitAndTheRestIsCounted) {
    putFirst();
    putNumbers(1005);
    reader->allow(kAll);
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), "first\n" + numbers(1000) + "(5 lost)\n");
}

TEST_F(AsyncWriterTest, LostLinesAreToldWhereTheyWouldHaveBeen) {
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

TEST_F(AsyncWriterTest, AReaderThatIsGoneIsReportedOnce) {
    reader->errorNumber = EPIPE;
    reader->allow(kAll);
    stream->put("a\n");
    failures->waitForOne();
    putNumbers(10);
    stream->finish(kLong);
    EXPECT_EQ(reader->begun(), 1);
    EXPECT_THAT(failures->list(), ElementsAre(std::pair(EPIPE, std::size_t{1})));
}

TEST_F(AsyncWriterTest, AReaderThatHangsDoesNotHangTheEnd) {
    putFirst();
    putNumbers(2);
    stream->finish(kAtOnce);
    stream.reset();
    EXPECT_EQ(reader->text(), "");
    const std::future<void> gone = reader->gone(); // with the thread, which on a busy machine comes later
    reader.reset();
    gone.wait();
    EXPECT_THAT(failures->list(), ElementsAre(std::pair(ECANCELED, std::size_t{3})));
}

TEST_F(AsyncWriterTest, AWriteThatNothingEndsIsLeftBehind) {
    reader->canBeGivenUp = false;
    putFirst();
    putNumbers(2);
    stream->finish(kAtOnce);
    stream.reset();
    const std::future<void> gone = reader->gone();
    reader->allow(kAll); // or the thread would outlive the test
    reader.reset();
    gone.wait();
    EXPECT_THAT(failures->list(), ElementsAre());
}

TEST_F(AsyncWriterTest, AThreadThatIsLeftBehindReportsNothing) {
    reader->canBeGivenUp = false;
    reader->errorNumber = EIO;
    putFirst();
    stream->finish(kAtOnce);
    stream.reset();
    const std::future<void> gone = reader->gone();
    reader->allow(kAll);
    reader.reset();
    gone.wait();
    EXPECT_THAT(failures->list(), ElementsAre());
}

TEST_F(AsyncWriterTest, LinesAreMadeOnTheWritersThread) {
    reader->allow(kAll);
    std::thread::id maker;
    stream->put(AsyncWriter::Line([&] {
        maker = std::this_thread::get_id();
        return std::string("made\n");
    }));
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), "made\n");
    EXPECT_NE(maker, std::this_thread::get_id());
}

TEST_F(AsyncWriterTest, LinesThatThereIsNoMemoryToPutAreCounted) {
    reader->allow(kAll);
    stream->drop();
    stream->finish(kLong);
    EXPECT_EQ(reader->text(), "(1 lost)\n");
}

TEST_F(AsyncWriterTest, NothingIsTakenAfterTheEnd) {
    reader->allow(kAll);
    stream->finish(kLong);
    stream->put("a\n");
    stream->finish(kLong);
    stream.reset();
    EXPECT_EQ(reader->text(), "");
}

TEST_F(AsyncWriterTest, SeveralThreadsMayPut) {
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
} // namespace ZorvaTouch::Host
