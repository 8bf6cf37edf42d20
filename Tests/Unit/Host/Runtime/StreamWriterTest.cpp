#include "Host/Runtime/StreamWriter.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <string>
#include <thread>

namespace ZorvaTouch::Host {
namespace {

/// More than any pipe, socket or terminal takes without a reader.
constexpr std::size_t kTooMuch = 8 * 1024 * 1024;

/// Puts another file in the place of standard output.
class StreamWriterTest : public ::testing::Test {
protected:
    void SetUp() override {
        reportFailedWrites();
        std::fflush(stdout);
        _saved = ::dup(STDOUT_FILENO);
        ASSERT_GE(_saved, 0);
    }
    void TearDown() override {
        _writer.reset();
        closeReader();
        EXPECT_EQ(::dup2(_saved, STDOUT_FILENO), STDOUT_FILENO);
        ::close(_saved);
    }

    /// Takes the descriptors over.
    void begin(int reader, int output) {
        _reader = reader;
        ASSERT_EQ(::dup2(output, STDOUT_FILENO), STDOUT_FILENO);
        ::close(output);
        _flags = ::fcntl(STDOUT_FILENO, F_GETFL);
        _writer.emplace(StandardStream::Output);
    }
    void beginPipe() {
        int ends[2];
        ASSERT_EQ(::pipe(ends), 0);
        begin(ends[0], ends[1]);
    }
    void beginSocket() {
        int ends[2];
        ASSERT_EQ(::socketpair(AF_UNIX, SOCK_STREAM, 0, ends), 0);
        begin(ends[0], ends[1]);
    }
    void beginTerminal() {
        const int reader = ::posix_openpt(O_RDWR | O_NOCTTY);
        ASSERT_GE(reader, 0);
        ASSERT_EQ(::grantpt(reader), 0);
        ASSERT_EQ(::unlockpt(reader), 0);
        const int output = ::open(::ptsname(reader), O_RDWR | O_NOCTTY);
        ASSERT_GE(output, 0);
        begin(reader, output);
    }

    void closeReader() {
        if (_reader >= 0)
            ::close(_reader);
        _reader = -1;
    }

    /// The next characters that come out.
    std::string take(std::size_t count) {
        std::string text(count, '\0');
        for (std::size_t length = 0; length < count;) {
            const ssize_t got = ::read(_reader, text.data() + length, count - length);
            if (got <= 0)
                return text.substr(0, length) + " and no more";
            length += static_cast<std::size_t>(got);
        }
        return text;
    }

    /// Whether what is shared with other processes is as it was.
    [[nodiscard]] bool isLeftAlone() const { return ::fcntl(STDOUT_FILENO, F_GETFL) == _flags; }

    void expectWritingWaitsForTheReader(std::size_t length) {
        const std::string text(length, 'x');
        std::string taken;
        std::thread reader([&] { taken = take(length); });
        EXPECT_EQ(_writer->write(text), 0);
        reader.join();
        EXPECT_TRUE(taken == text);
        EXPECT_TRUE(isLeftAlone());
    }

    void expectGivingUpEndsAWrite() {
        std::thread other([this] {
            static_cast<void>(take(1)); // so it has begun
            _writer->giveUp();
        });
        EXPECT_EQ(_writer->write(std::string(kTooMuch, 'x')), ECANCELED);
        other.join();
        EXPECT_EQ(_writer->write("x"), ECANCELED);
        EXPECT_TRUE(isLeftAlone());
    }

    std::optional<StreamWriter> _writer;
    int _reader = -1;

private:
    int _saved = -1;
    int _flags = 0;
};

TEST_F(StreamWriterTest, APipeGetsEverythingHoweverSlowlyItIsRead) {
    beginPipe();
    expectWritingWaitsForTheReader(300'000);
}

TEST_F(StreamWriterTest, ASocketGetsEverythingHoweverSlowlyItIsRead) {
    beginSocket();
    expectWritingWaitsForTheReader(300'000);
}

TEST_F(StreamWriterTest, ATerminalGetsEverything) {
    beginTerminal();
    expectWritingWaitsForTheReader(30'000);
}

TEST_F(StreamWriterTest, AWriteToAPipeThatNobodyReadsIsGivenUp) {
    beginPipe();
    expectGivingUpEndsAWrite();
}

TEST_F(StreamWriterTest, AWriteToASocketThatNobodyReadsIsGivenUp) {
    beginSocket();
    expectGivingUpEndsAWrite();
}

TEST_F(StreamWriterTest, AWriteToATerminalThatStandsStillIsGivenUp) {
    beginTerminal();
    expectGivingUpEndsAWrite();
}

TEST_F(StreamWriterTest, AReaderThatIsGoneIsAnError) {
    beginPipe();
    closeReader();
    EXPECT_EQ(_writer->write("x"), EPIPE);
}

TEST_F(StreamWriterTest, AReaderThatWasGoneBeforeIsAnError) {
    int ends[2];
    ASSERT_EQ(::pipe(ends), 0);
    ::close(ends[0]);
    begin(-1, ends[1]); // such a pipe cannot be opened anew
    EXPECT_EQ(_writer->write("x"), EPIPE);
}

TEST_F(StreamWriterTest, ASocketsReaderThatIsGoneIsAnError) {
    beginSocket();
    closeReader();
    EXPECT_EQ(_writer->write("x"), EPIPE);
}

TEST_F(StreamWriterTest, AFileIsWrittenWhereItsSharersAre) {
    std::FILE *const file = std::tmpfile();
    ASSERT_NE(file, nullptr);
    begin(-1, ::dup(::fileno(file)));
    EXPECT_EQ(_writer->write("one "), 0);
    EXPECT_EQ(::write(STDOUT_FILENO, "two ", 4), 4); // somebody who shares the place in it
    EXPECT_EQ(_writer->write("three"), 0);
    char text[32]{};
    std::rewind(file);
    EXPECT_EQ(std::fread(text, 1, sizeof text, file), 13u);
    EXPECT_STREQ(text, "one two three");
    EXPECT_EQ(std::fclose(file), 0);
}

TEST_F(StreamWriterTest, AFullDeviceIsAnError) {
    const int full = ::open("/dev/full", O_WRONLY);
    ASSERT_GE(full, 0);
    begin(-1, full);
    EXPECT_EQ(_writer->write("x"), ENOSPC);
}

} // namespace
} // namespace ZorvaTouch::Host
