#include "Host/Linux/Journal.h"

#include "Host/Linux/UniqueFd.h"
#include "Tests/Unit/Host/Linux/JournalSocket.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <future>
#include <memory>
#include <string>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using namespace std::string_literals;
using Ports::LogLevel;
using testing::ElementsAre;
using Tests::JournalSocket;

TEST(JournalFormat, ARecordHasTextPriorityOriginAndProgram) {
    const Host::LogFormat format = journalFormat("zorvatouchd");
    const auto datagram = [&](LogLevel level) {
        return format({.time = {},
                       .level = level,
                       .subsystem = "org.zorva.hid.ZorvaTouch",
                       .category = "Algs",
                       .text = "100 % of it"});
    };
    EXPECT_EQ(datagram(LogLevel::Default),
              "MESSAGE=100 % of it\nPRIORITY=6\nZORVA_SUBSYSTEM=org.zorva.hid.ZorvaTouch\n"
              "ZORVA_CATEGORY=Algs\nSYSLOG_IDENTIFIER=zorvatouchd\n");
    EXPECT_THAT(datagram(LogLevel::Debug), testing::HasSubstr("\nPRIORITY=7\n"));
    EXPECT_THAT(datagram(LogLevel::Error), testing::HasSubstr("\nPRIORITY=3\n"));
}

TEST(JournalWriter, SendsEachTextAsADatagram) {
    const JournalSocket journal;
    JournalWriter writer(journal.path());
    EXPECT_EQ(writer.write("one\n"), 0);
    EXPECT_EQ(writer.write("two\n"), 0);
    EXPECT_EQ(journal.receive(), "one\n");
    EXPECT_EQ(journal.receive(), "two\n");
}

TEST(JournalWriter, WaitsForAJournalThatDoesNotReadUntilItIsGivenUp) {
    const JournalSocket journal;
    JournalWriter writer(journal.path());
    auto result = std::async(std::launch::async, [&] {
        for (;;)
            if (const int errorNumber = writer.write("full\n"))
                return errorNumber;
    });
    journal.waitUntilFull();
    writer.giveUp();
    EXPECT_EQ(result.get(), ECANCELED);
    EXPECT_EQ(writer.write("later\n"), ECANCELED);
}

TEST(JournalWriter, LosesTextsWhileNoJournalRunsAndFindsTheNextOne) {
    auto journal = std::make_unique<JournalSocket>();
    const std::string path = journal->path();
    JournalWriter writer(path);
    journal->close();
    EXPECT_EQ(writer.write("lost\n"), 0);
    journal->open();
    EXPECT_EQ(writer.write("one\n"), 0);
    journal->close();
    journal->open();
    EXPECT_EQ(writer.write("two\n"), 0);
    EXPECT_EQ(journal->receive(), "two\n");
}

TEST(JournalWriter, ATextThatIsTooLongForADatagramIsLost) {
    const JournalSocket journal;
    JournalWriter writer(journal.path());
    EXPECT_EQ(writer.write(std::string(64'000'000, 'x')), 0);
    EXPECT_EQ(writer.write("next\n"), 0);
    EXPECT_EQ(journal.receive(), "next\n");
}

TEST(JournalWriter, RefusesAPathThatNoSocketCanHave) {
    EXPECT_THROW(JournalWriter(std::string(108, 'x')), std::system_error);
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
        return isJournalStream(stream.get());
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
    EXPECT_FALSE(isJournalStream(stream.get()));
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
    EXPECT_FALSE(isJournalStream(closed));
    EXPECT_FALSE(isJournalStream(-1));
}

} // namespace
} // namespace ZorvaTouch::Linux
