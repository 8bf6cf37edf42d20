#include "Host/Runtime/AsyncLogs.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>

namespace ZorvaTouch::Host {
namespace {

using Ports::LogLevel;

/// Keeps what is written, once it may.
class Reader final : public TextWriter {
public:
    int write(std::string_view text) noexcept override {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [this] { return _reads || _isGivenUp; });
        if (!_reads)
            return ECANCELED;
        _text.append(text);
        return 0;
    }
    void giveUp() noexcept override {
        const std::lock_guard lock(_mutex);
        _isGivenUp = true;
        _changed.notify_all();
    }
    void read() {
        const std::lock_guard lock(_mutex);
        _reads = true;
        _changed.notify_all();
    }
    [[nodiscard]] std::string text() {
        const std::lock_guard lock(_mutex);
        return _text;
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    bool _reads = false;
    bool _isGivenUp = false;
    std::string _text;
};

class AsyncLogsTest : public ::testing::Test {
protected:
    static std::string format(const LogRecord &record) {
        return std::to_string(static_cast<int>(record.level))
            .append(" ")
            .append(record.subsystem)
            .append("/")
            .append(record.category)
            .append(" ")
            .append(record.text)
            .append("\n");
    }
    /// What was written in the end.
    std::string finished() {
        reader->read();
        logs.reset();
        return reader->text();
    }

    std::shared_ptr<Reader> reader = std::make_shared<Reader>();
    std::unique_ptr<AsyncLogs> logs = std::make_unique<AsyncLogs>(LogLevel::Default, format, reader);
};

TEST_F(AsyncLogsTest, RecordsHaveLevelOriginAndText) {
    const auto log = logs->openLog("s", "c");
    EXPECT_FALSE(log->isEnabled(LogLevel::Debug));
    log->write(LogLevel::Debug, "too low");
    log->write(LogLevel::Default, "one");
    log->write(LogLevel::Error, "two");
    EXPECT_EQ(finished(), "1 s/c one\n2 s/c two\n");
}

TEST_F(AsyncLogsTest, TextsAreOneLineThatDoesNothingToATerminal) {
    logs->openLog("s", "c")->write(LogLevel::Error, "Disjoint image\n\n");
    logs->openLog("s", "c")->write(LogLevel::Error, "a\n\nb\x1b[2J\xC2\x9B");
    EXPECT_EQ(finished(), "2 s/c Disjoint image\n2 s/c a\\n\\nb\\x1b[2J\\u009b\n");
}

TEST_F(AsyncLogsTest, WhoeverWritesDoesNotWaitAndWhatHasNoRoomIsCounted) {
    const auto log = logs->openLog("s", "c");
    for (int i = 0; i < 3000; ++i)
        log->write(LogLevel::Error, "x");
    const std::string text = finished();
    // One record may be on its way already while 1000 wait.
    const bool isOneOnItsWay = text.find("1999 records of the log are missing here") != std::string::npos;
    EXPECT_THAT(text, testing::EndsWith(std::string(isOneOnItsWay ? "1999" : "2000") +
                                        " records of the log are missing here: they came faster than they "
                                        "were read\n"));
    EXPECT_EQ(std::ranges::count(text, '\n'), isOneOnItsWay ? 1002 : 1001);
}

TEST_F(AsyncLogsTest, OfALongTextTheBeginningIsKept) {
    logs->openLog("s", "c")->write(LogLevel::Error, std::string(16'384, 'x'));
    logs->openLog("s", "c")->write(LogLevel::Error, std::string(16'385, 'y'));
    EXPECT_EQ(finished(),
              "2 s/c " + std::string(16'384, 'x') + "\n2 s/c " + std::string(16'384, 'y') + "...\n");
}

TEST_F(AsyncLogsTest, AHandleOutlivesTheProviderAndIsSilent) {
    const auto log = logs->openLog("s", "c");
    finished();
    log->write(LogLevel::Error, "late");
    EXPECT_EQ(reader->text(), "");
}

} // namespace
} // namespace ZorvaTouch::Host
