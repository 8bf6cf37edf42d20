#include "Tools/Daemon/RecordingSaver.h"

#include "Host/Runtime/Files.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <limits>
#include <stop_token>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

constexpr const char *kTwoReports =
    R"({"Version":2,"Frames":[{"Type":"State","Timestamp":1,"Key":"Algs.ActivationThreshold","Value":200.0},)"
    R"({"Type":"InputReport","Timestamp":2,"Data":"01 ab "},{"Type":"InputReport","Timestamp":3,"Data":""}]})";

constexpr std::uint64_t kWithoutEnd = std::numeric_limits<std::uint64_t>::max();

std::size_t save(const std::string &file, std::string_view text, std::uint64_t mostBytes = kWithoutEnd) {
    return saveRecordingFile(file, {.text = std::string(text), .history = {}, .notes = {}}, mostBytes);
}

class RecordingSaver : public ::testing::Test {
protected:
    void SetUp() override {
        std::string pattern = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
        ASSERT_NE(::mkdtemp(pattern.data()), nullptr);
        _folder = pattern;
    }
    void TearDown() override { std::filesystem::remove_all(_folder); }

    [[nodiscard]] std::string path(const std::string &name) const { return _folder + "/" + name; }

    /// What is said about saving; the folder's name is "@".
    [[nodiscard]] std::string problemWith(const std::string &file, std::string_view text) const {
        try {
            static_cast<void>(save(file, text));
            return {};
        } catch (const SavingError &error) {
            std::string message = error.what();
            if (message.starts_with(_folder))
                message.replace(0, _folder.size(), "@");
            return message;
        }
    }

    std::string _folder;
};

TEST_F(RecordingSaver, CountsTheReports) {
    EXPECT_EQ(save(path("a.json"), kTwoReports), 2u);
    EXPECT_EQ(Host::readFile(path("a.json")), kTwoReports);
    EXPECT_EQ(save(path("a.json"), R"({"Version":2,"Frames":[]})"), 0u);
}

TEST_F(RecordingSaver, NobodyElseReadsIt) {
    Host::replaceFile(path("a.json"), "older");
    ASSERT_EQ(::chmod(path("a.json").c_str(), 0644), 0);
    EXPECT_EQ(save(path("a.json"), kTwoReports), 2u);
    struct stat status {};
    ASSERT_EQ(::stat(path("a.json").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600u);
}

TEST_F(RecordingSaver, WhatIsNoRecordingReplacesNothing) {
    Host::replaceFile(path("a.json"), "older");
    EXPECT_EQ(problemWith(path("a.json"), "{}"),
              "@/a.json: not written, since the service's recording is none: "
              "migrateSerializedContainer failed: invalid version");
    EXPECT_EQ(Host::readFile(path("a.json")), "older");
}

TEST_F(RecordingSaver, FailuresAreOneLine) {
    EXPECT_EQ(problemWith(path("no/a.json"), kTwoReports),
              "@/no/a.json: cannot open a temporary file beside it: No such file or directory");
    EXPECT_EQ(problemWith(_folder, kTwoReports), "@: cannot replace: Is a directory");
    EXPECT_EQ(problemWith("/dev/full", kTwoReports),
              "/dev/full: cannot replace a file that is not regular: Operation not permitted");
}

TEST_F(RecordingSaver, ALinkIsNotFollowed) {
    Host::replaceFile(path("precious"), "x");
    ASSERT_EQ(::symlink("precious", path("a.json").c_str()), 0);
    EXPECT_EQ(problemWith(path("a.json"), kTwoReports),
              "@/a.json: cannot replace a symbolic link: Operation not permitted");
    EXPECT_EQ(Host::readFile(path("precious")), "x");
}

/// The owner of the folder, who exchanges a file and a FIFO again and again.
class Exchanger {
public:
    Exchanger(std::string left, std::string right)
        : _left(std::move(left)), _right(std::move(right)), _thread([this] { exchange(); }) {}
    ~Exchanger() { finish(); }

    void finish() {
        _isOver = true;
        if (_thread.joinable())
            _thread.join();
    }
    /// Readers that were found blocked until the FIFO is opened for writing.
    [[nodiscard]] unsigned caught() const noexcept { return _caught; }

private:
    void exchange() {
        while (!_isOver) {
            ::renameat2(AT_FDCWD, _left.c_str(), AT_FDCWD, _right.c_str(), RENAME_EXCHANGE);
            if (!isFifo(_left) && !isFifo(_right)) { // it was replaced
                ::unlink(_right.c_str());
                ::mkfifo(_right.c_str(), 0600);
            }
            release(_left);
            release(_right);
        }
    }
    [[nodiscard]] static bool isFifo(const std::string &path) {
        struct stat status {};
        return ::lstat(path.c_str(), &status) == 0 && S_ISFIFO(status.st_mode);
    }
    /// Opens a FIFO for writing, which fails unless a reader is blocked in its open call.
    void release(const std::string &path) {
        const int number = ::open(path.c_str(), O_WRONLY | O_NONBLOCK | O_NOFOLLOW | O_CLOEXEC);
        if (number < 0)
            return;
        struct stat status {};
        if (::fstat(number, &status) == 0 && S_ISFIFO(status.st_mode))
            ++_caught;
        ::close(number);
    }

    const std::string _left, _right;
    std::atomic<bool> _isOver = false;
    std::atomic<unsigned> _caught = 0;
    std::thread _thread;
};

TEST_F(RecordingSaver, IsNotBlockedByAFifoThatIsExchangedForTheFile) {
    ASSERT_EQ(::mkfifo(path("pipe").c_str(), 0600), 0);
    Host::replaceFile(path("a.json"), "older");
    Exchanger opponent(path("a.json"), path("pipe"));
    unsigned saved = 0;
    for (int i = 0; i < 150; ++i)
        saved += problemWith(path("a.json"), kTwoReports).empty() ? 1u : 0u;
    opponent.finish();
    EXPECT_EQ(opponent.caught(), 0u);
    EXPECT_GT(saved, 0u);
}

TEST_F(RecordingSaver, NothingIsOpenedUnderTheNameOfTheFile) {
    const int watch = ::inotify_init1(IN_CLOEXEC | IN_NONBLOCK);
    ASSERT_GE(::inotify_add_watch(watch, _folder.c_str(), IN_OPEN | IN_MOVED_TO), 0);
    EXPECT_EQ(save(path("a.json"), kTwoReports), 2u);
    alignas(inotify_event) std::array<char, 4096> buffer{};
    const ssize_t length = ::read(watch, buffer.data(), buffer.size());
    ::close(watch);
    std::string seen;
    for (ssize_t at = 0; at < length;) {
        inotify_event event{};
        std::memcpy(&event, &buffer[static_cast<std::size_t>(at)], sizeof event);
        const std::string name = event.len == 0 ? "" : &buffer[static_cast<std::size_t>(at) + sizeof event];
        if (name == "a.json")
            seen.append((event.mask & IN_OPEN) != 0 ? "opened " : "renamed ");
        at += static_cast<ssize_t>(sizeof event + event.len);
    }
    EXPECT_EQ(seen, "renamed ");
}

TEST_F(RecordingSaver, AFileThatIsLongerThanAllowedIsNotWritten) {
    Host::replaceFile(path("a.json"), "older");
    const std::size_t length = std::string_view(kTwoReports).size();
    EXPECT_EQ(save(path("b.json"), kTwoReports, length), 2u);
    try {
        save(path("a.json"), kTwoReports, length - 1);
        FAIL();
    } catch (const SavingError &error) {
        EXPECT_EQ(error.what(), path("a.json") + ": not written, since its 202 bytes are more than the 201 "
                                                 "that --save-bytes allows");
    }
    EXPECT_EQ(Host::readFile(path("a.json")), "older");
}

TEST_F(RecordingSaver, NothingIsWrittenAfterItWasGivenUp) {
    std::stop_source givenUp;
    givenUp.request_stop();
    EXPECT_THROW(saveRecordingFile(path("a.json"), {.text = kTwoReports, .history = {}, .notes = {}},
                                   kWithoutEnd, givenUp.get_token()),
                 SavingError);
    EXPECT_TRUE(std::filesystem::is_empty(_folder));
}

/// What is said at the start about these names; the folder's name is "@".
std::string problemAtTheStart(const std::string &folder, const std::vector<std::string> &files) {
    try {
        requireSavable(files);
        return {};
    } catch (const SavingError &error) {
        std::string message = error.what();
        return message.replace(message.find(folder), folder.size(), "@");
    }
}

TEST_F(RecordingSaver, WhatCannotBeSavedIsToldAtTheStart) {
    EXPECT_EQ(problemAtTheStart(_folder, {path("a.json"), path("a-2.json")}), "");
    EXPECT_TRUE(std::filesystem::is_empty(_folder));
    EXPECT_EQ(problemAtTheStart(_folder, {path("no/a.json")}),
              "@/no/a.json: cannot open a temporary file beside it: No such file or directory");
    std::filesystem::create_directory(path("a-2.json"));
    EXPECT_EQ(problemAtTheStart(_folder, {path("a.json"), path("a-2.json")}),
              "@/a-2.json: cannot replace: Is a directory");
    const std::string longest(255, 'a');
    EXPECT_EQ(problemAtTheStart(_folder, {path(longest), path(longest + "-2")}),
              "@/" + longest + "-2: cannot replace: File name too long");
}

TEST_F(RecordingSaver, TheOldestGoUntilTheRestFits) {
    using std::chrono::seconds;
    const auto now = std::filesystem::file_time_type::clock::now();
    const std::vector<std::string> files{path("a"), path("b"), path("c"), path("d"), path("e")};
    for (std::size_t i = 0; i < 4; ++i) { // "e" does not exist; "b" is the oldest, then "c", "d", "a"
        Host::replaceFile(files[i], std::string(100, 'x'));
        std::filesystem::last_write_time(files[i], now - seconds(i == 0 ? 0 : 10 - i));
    }
    EXPECT_TRUE(removeOldestRecordings(files, path("a"), 400).empty());
    EXPECT_EQ(removeOldestRecordings(files, path("b"), 399), std::vector{path("c")});
    EXPECT_EQ(removeOldestRecordings(files, path("a"), 150), (std::vector{path("b"), path("d")}));
    EXPECT_EQ(Host::readFile(path("a")).size(), 100u);
}

TEST_F(RecordingSaver, OnlyFilesAreRemoved) {
    Host::replaceFile(path("precious"), std::string(100, 'x'));
    ASSERT_EQ(::symlink("precious", path("a").c_str()), 0);
    std::filesystem::create_directory(path("b"));
    const std::vector<std::string> files{path("a"), path("b"), path("c")};
    EXPECT_TRUE(removeOldestRecordings(files, path("c"), 0).empty());
    EXPECT_EQ(Host::readFile(path("a")).size(), 100u);
}

} // namespace
} // namespace ZorvaTouch::Tools
