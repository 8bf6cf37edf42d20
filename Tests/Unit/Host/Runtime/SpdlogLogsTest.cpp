#include "Host/Runtime/SpdlogLogs.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace ZorvaTouch::Host {
namespace {

using Ports::LogLevel;
using ::testing::MatchesRegex;

/// A stream in memory.
class Stream {
public:
    [[nodiscard]] std::FILE *file() const noexcept { return _file.get(); }

    [[nodiscard]] std::string text() const {
        std::rewind(file());
        std::string text(4096, '\0');
        text.resize(std::fread(text.data(), 1, text.size(), file()));
        return text;
    }

private:
    std::unique_ptr<std::FILE, int (*)(std::FILE *)> _file{std::tmpfile(), &std::fclose};
};

TEST(SpdlogLogs, ARecordHasTimeLevelFieldsAndText) {
    const Stream stream;
    SpdlogLogs logs(LogLevel::Debug, stream.file());
    logs.openLog("org.zorva.hid.ZorvaTouch", "Algs")
        ->write(LogLevel::Default, "100 % {} of it\nand more\n\n");
    EXPECT_THAT(
        stream.text(),
        MatchesRegex("[0-9]{4}-[0-9]{2}-[0-9]{2}T[0-9]{2}:[0-9]{2}:[0-9]{2}\\.[0-9]{3}[+-][0-9]{2}:[0-9]{2} "
                     "default subsystem=org\\.zorva\\.hid\\.ZorvaTouch category=Algs "
                     "100 % \\{\\} of it\\\\nand more\n"));
}

TEST(SpdlogLogs, RecordsBelowTheMinimumAreDropped) {
    const Stream stream;
    SpdlogLogs logs(LogLevel::Default, stream.file());
    const auto log = logs.openLog("s", "c");
    EXPECT_FALSE(log->isEnabled(LogLevel::Debug));
    EXPECT_TRUE(log->isEnabled(LogLevel::Default));
    EXPECT_TRUE(log->isEnabled(LogLevel::Error));
    log->write(LogLevel::Debug, "one");
    log->write(LogLevel::Error, "two");
    EXPECT_THAT(stream.text(), MatchesRegex("[^ ]+ error subsystem=s category=c two\n"));
}

TEST(SpdlogLogs, AHandleOutlivesItsProvider) {
    const Stream stream;
    std::shared_ptr<Ports::Log> log;
    {
        SpdlogLogs logs(LogLevel::Debug, stream.file());
        log = logs.openLog("s", "c");
    }
    log->write(LogLevel::Debug, "still here");
    EXPECT_THAT(stream.text(), MatchesRegex("[^ ]+ debug subsystem=s category=c still here\n"));
}

} // namespace
} // namespace ZorvaTouch::Host
