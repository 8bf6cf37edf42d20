#include "Host/Linux/JournalLogs.h"

#include "Host/Linux/UniqueFd.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using namespace std::string_literals;
using Ports::LogLevel;
using testing::ElementsAre;
using testing::IsEmpty;

/// A journal that keeps the fields of its records.
class FakeJournal final : public Journal {
public:
    void send(std::span<const std::string_view> fields) noexcept override {
        records.emplace_back(fields.begin(), fields.end());
    }

    std::vector<std::vector<std::string>> records;
};

class JournalLogsTest : public testing::Test {
protected:
    /// The field MESSAGE of a text.
    std::string message(std::string_view text) {
        logs.openLog("s", "c")->write(LogLevel::Default, text);
        return journal->records.back().front();
    }

    const std::shared_ptr<FakeJournal> journal = std::make_shared<FakeJournal>();
    JournalLogs logs{LogLevel::Debug, "zorvatouchd", journal};
};

TEST_F(JournalLogsTest, ARecordHasTextPriorityOriginAndProgram) {
    logs.openLog("org.zorva.hid.ZorvaTouch", "Algs")->write(LogLevel::Default, "100 % of it");
    EXPECT_THAT(journal->records,
                ElementsAre(ElementsAre("MESSAGE=100 % of it", "PRIORITY=6",
                                        "ZORVA_SUBSYSTEM=org.zorva.hid.ZorvaTouch", "ZORVA_CATEGORY=Algs",
                                        "SYSLOG_IDENTIFIER=zorvatouchd")));
}

TEST_F(JournalLogsTest, DebugIsSevenDefaultSixAndErrorThree) {
    const auto log = logs.openLog("s", "c");
    for (const LogLevel level : {LogLevel::Debug, LogLevel::Default, LogLevel::Error})
        log->write(level, "");
    ASSERT_EQ(journal->records.size(), 3U);
    EXPECT_EQ(journal->records[0][1], "PRIORITY=7");
    EXPECT_EQ(journal->records[1][1], "PRIORITY=6");
    EXPECT_EQ(journal->records[2][1], "PRIORITY=3");
}

TEST_F(JournalLogsTest, LineBreaksAtTheEndAreLeftOut) {
    EXPECT_EQ(message("one\ntwo\r\n\n"), "MESSAGE=one\ntwo");
    EXPECT_EQ(message(" kept "), "MESSAGE= kept ");
    EXPECT_EQ(message("\r\n"), "MESSAGE=");
    EXPECT_EQ(message(""), "MESSAGE=");
}

TEST_F(JournalLogsTest, AnyBytesArePassedOnInTheOneField) {
    EXPECT_EQ(message("a\0b"s), "MESSAGE=a\0b"s);
    EXPECT_EQ(message("a\nPRIORITY=0\n_UID=0"), "MESSAGE=a\nPRIORITY=0\n_UID=0");
    EXPECT_EQ(message("\xff\xc0\x80"), "MESSAGE=\xff\xc0\x80");
    EXPECT_EQ(journal->records.back().size(), 5U);
}

TEST_F(JournalLogsTest, RecordsBelowTheMinimumAreDropped) {
    JournalLogs few(LogLevel::Default, "p", journal);
    const auto log = few.openLog("s", "c");
    EXPECT_FALSE(log->isEnabled(LogLevel::Debug));
    EXPECT_TRUE(log->isEnabled(LogLevel::Default));
    log->write(LogLevel::Debug, "one");
    EXPECT_THAT(journal->records, IsEmpty());
    log->write(LogLevel::Error, "two");
    EXPECT_THAT(journal->records, ElementsAre(ElementsAre("MESSAGE=two", "PRIORITY=3", "ZORVA_SUBSYSTEM=s",
                                                          "ZORVA_CATEGORY=c", "SYSLOG_IDENTIFIER=p")));
}

TEST_F(JournalLogsTest, AHandleOutlivesItsProvider) {
    auto provider = std::make_unique<JournalLogs>(LogLevel::Debug, "p", journal);
    const auto log = provider->openLog("s", "c");
    provider.reset();
    log->write(LogLevel::Debug, "still here");
    EXPECT_EQ(journal->records.size(), 1U);
}

TEST(SystemJournal, TakesRecordsWhetherOneRunsOrNot) {
    JournalLogs logs(LogLevel::Debug, "zorvatouch-tests");
    logs.openLog("org.zorva.hid.ZorvaTouch", "Tests")->write(LogLevel::Debug, "a\0b\nPRIORITY=0"s);
}

/// Sets JOURNAL_STREAM for a scope.
class JournalStream : public testing::Test {
protected:
    void SetUp() override {
        int ends[2];
        ASSERT_EQ(::pipe(ends), 0);
        stream = UniqueFd(ends[1]);
        other = UniqueFd(ends[0]);
        struct stat status {};
        ASSERT_EQ(::fstat(stream.get(), &status), 0);
        device = std::to_string(status.st_dev);
        inode = std::to_string(status.st_ino);
    }
    void TearDown() override { ::unsetenv("JOURNAL_STREAM"); }

    /// Whether the stream is taken for the journal's.
    bool isNamedBy(const std::string &value) const {
        ::setenv("JOURNAL_STREAM", value.c_str(), 1);
        return JournalLogs::isJournalStream(stream.get());
    }

    UniqueFd stream, other;
    std::string device, inode;
};

TEST_F(JournalStream, IsTheOneThatTheSystemNames) {
    EXPECT_TRUE(isNamedBy(device + ":" + inode));
    EXPECT_FALSE(isNamedBy(device + ":" + inode + "0"));
    EXPECT_FALSE(isNamedBy("1" + device + ":" + inode));
}

TEST_F(JournalStream, IsNoneWithoutAName) {
    ::unsetenv("JOURNAL_STREAM");
    EXPECT_FALSE(JournalLogs::isJournalStream(stream.get()));
}

TEST_F(JournalStream, IsNoneWithANameThatIsNoName) {
    for (const std::string &value :
         {std::string(), ":"s, device, device + ":", ":" + inode, device + ":" + inode + " ",
          " " + device + ":" + inode, device + ";" + inode, device + ":-" + inode,
          device + ":99999999999999999999999"})
        EXPECT_FALSE(isNamedBy(value)) << value;
}

TEST_F(JournalStream, IsNoneThatIsClosed) {
    const int closed = stream.get();
    ::setenv("JOURNAL_STREAM", (device + ":" + inode).c_str(), 1);
    stream.reset();
    EXPECT_FALSE(JournalLogs::isJournalStream(closed));
    EXPECT_FALSE(JournalLogs::isJournalStream(-1));
}

} // namespace
} // namespace ZorvaTouch::Linux
