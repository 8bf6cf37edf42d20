#include "Host/Runtime/Files.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <functional>

namespace ZorvaTouch::Host {
namespace {

class Files : public ::testing::Test {
protected:
    void SetUp() override {
        std::string pattern = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
        ASSERT_NE(::mkdtemp(pattern.data()), nullptr);
        _folder = pattern;
    }

    void TearDown() override { std::filesystem::remove_all(_folder); }

    [[nodiscard]] std::string path(const std::string &name) const { return _folder + "/" + name; }

    [[nodiscard]] std::size_t fileCount() const {
        const std::filesystem::directory_iterator files(_folder);
        return static_cast<std::size_t>(std::distance(begin(files), end(files)));
    }

    [[nodiscard]] mode_t permissionsOf(const std::string &name) const {
        struct stat status {};
        EXPECT_EQ(::stat(path(name).c_str(), &status), 0);
        return status.st_mode & 07777;
    }

    std::string _folder;
};

/// "operation: reason" of what a call throws.
std::string failureOf(const std::function<void()> &call) {
    try {
        call();
        return "none";
    } catch (const FileFailure &failure) {
        return std::string(failure.operation) + ": " + failure.code().message();
    }
}

TEST_F(Files, WhatIsWrittenIsRead) {
    std::string contents(200'000, 'x'); // more than is read at once
    contents[100'000] = '\0';
    replaceFile(path("a"), contents);
    EXPECT_EQ(readFile(path("a")), contents);
    replaceFile(path("a"), "");
    EXPECT_EQ(readFile(path("a")), "");
}

TEST_F(Files, FilesWithoutASizeAreReadToTheirEnd) {
    EXPECT_NE(readFile("/proc/self/status").find("Name:"), std::string::npos);
}

TEST_F(Files, AFileThatIsNotThereCannotBeOpened) {
    EXPECT_EQ(failureOf([this] { static_cast<void>(readFile(path("a"))); }),
              "open: No such file or directory");
}

TEST_F(Files, AFolderCannotBeRead) {
    EXPECT_EQ(failureOf([this] { static_cast<void>(readFile(_folder)); }), "read: Is a directory");
    EXPECT_EQ(failureOf([this] { replaceFile(_folder, "x"); }), "open: Is a directory");
}

TEST_F(Files, NothingIsLeftBehind) {
    replaceFile(path("a"), "1");
    replaceFile(path("a"), "2");
    EXPECT_EQ(fileCount(), 1u);
    EXPECT_EQ(failureOf([this] { replaceFile(path("no/a"), "3"); }),
              "open a temporary file beside it: No such file or directory");
}

TEST_F(Files, ANewFileIsAsTheUserWantsNewFiles) {
    const mode_t mask = ::umask(027);
    replaceFile(path("a"), "1");
    ::umask(mask);
    EXPECT_EQ(permissionsOf("a"), 0640u);
}

TEST_F(Files, AReplacedFileKeepsItsPermissions) {
    replaceFile(path("a"), "1");
    ASSERT_EQ(::chmod(path("a").c_str(), 0604), 0);
    replaceFile(path("a"), "2");
    EXPECT_EQ(permissionsOf("a"), 0604u);
    EXPECT_EQ(readFile(path("a")), "2");
}

TEST_F(Files, ALinkKeepsPointing) {
    replaceFile(path("a"), "1");
    ASSERT_EQ(::symlink("a", path("link").c_str()), 0);
    replaceFile(path("link"), "2");
    EXPECT_TRUE(std::filesystem::is_symlink(path("link")));
    EXPECT_EQ(readFile(path("a")), "2");
}

TEST_F(Files, ADeviceIsWrittenToAndStaysADevice) {
    replaceFile("/dev/null", "1");
    EXPECT_TRUE(std::filesystem::is_character_file("/dev/null"));
    EXPECT_EQ(failureOf([] { replaceFile("/dev/full", "1"); }), "write: No space left on device");
}

TEST_F(Files, APrivateFileIsItsOwnersAlone) {
    const mode_t mask = ::umask(0);
    replacePrivateFile(path("a"), "1");
    ::umask(mask);
    EXPECT_EQ(permissionsOf("a"), 0600u);
    EXPECT_EQ(readFile(path("a")), "1");
    EXPECT_EQ(fileCount(), 1u);
}

TEST_F(Files, APrivateFileIsItsOwnersWhateverTheMask) {
    const mode_t mask = ::umask(0777);
    replacePrivateFile(path("a"), "1");
    ::umask(mask);
    EXPECT_EQ(permissionsOf("a"), 0600u);
}

TEST_F(Files, APrivateFileReplacesOneThatOthersCouldRead) {
    replaceFile(path("a"), "1");
    ASSERT_EQ(::chmod(path("a").c_str(), 0644), 0);
    const int reader = ::open(path("a").c_str(), O_RDONLY);
    replacePrivateFile(path("a"), "2");
    EXPECT_EQ(permissionsOf("a"), 0600u);
    char old = 0;
    EXPECT_EQ(::read(reader, &old, 1), 1); // who had it open reads what was there
    EXPECT_EQ(old, '1');
    ::close(reader);
}

TEST_F(Files, APrivateFileReplacesNothingButFiles) {
    replaceFile(path("a"), "1");
    ASSERT_EQ(::symlink("a", path("link").c_str()), 0);
    ASSERT_EQ(::symlink("nowhere", path("loose").c_str()), 0);
    ASSERT_EQ(::mkfifo(path("pipe").c_str(), 0600), 0);
    EXPECT_EQ(failureOf([this] { replacePrivateFile(path("link"), "2"); }),
              "replace a symbolic link: Operation not permitted");
    EXPECT_EQ(failureOf([this] { replacePrivateFile(path("loose"), "2"); }),
              "replace a symbolic link: Operation not permitted");
    EXPECT_EQ(failureOf([this] { replacePrivateFile(path("pipe"), "2"); }),
              "replace what is no regular file: Operation not permitted");
    EXPECT_EQ(failureOf([] { replacePrivateFile("/dev/null", "2"); }),
              "replace what is no regular file: Operation not permitted");
    EXPECT_EQ(failureOf([this] { replacePrivateFile(_folder, "2"); }), "replace: Is a directory");
    EXPECT_EQ(failureOf([this] { replacePrivateFile(path("no/a"), "2"); }),
              "open a temporary file beside it: No such file or directory");
    EXPECT_EQ(readFile(path("a")), "1");
    EXPECT_EQ(fileCount(), 4u);
}

TEST_F(Files, WhatCannotBeReplacedIsToldBeforehand) {
    replaceFile(path("a"), "1");
    ASSERT_EQ(::symlink("a", path("link").c_str()), 0);
    EXPECT_EQ(failureOf([this] { requireReplaceable(path("a")); }), "none");
    EXPECT_EQ(failureOf([this] { requireReplaceable(path("new")); }), "none");
    EXPECT_EQ(failureOf([this] { requireReplaceable(path("link")); }),
              "replace a symbolic link: Operation not permitted");
    EXPECT_EQ(failureOf([this] { requireReplaceable(_folder); }), "replace: Is a directory");
    EXPECT_EQ(failureOf([this] { requireReplaceable(path("no/a")); }),
              "open a temporary file beside it: No such file or directory");
    EXPECT_EQ(readFile(path("a")), "1");
    EXPECT_EQ(fileCount(), 2u);
}

TEST_F(Files, ABrokenPipeIsReported) {
    reportBrokenPipes();
    int ends[2];
    ASSERT_EQ(::pipe(ends), 0);
    ASSERT_EQ(::close(ends[0]), 0);
    const ssize_t written = ::write(ends[1], "x", 1); // would have ended the process
    EXPECT_EQ(written, -1);
    EXPECT_EQ(errno, EPIPE);
    ASSERT_EQ(::close(ends[1]), 0);
}

} // namespace
} // namespace ZorvaTouch::Host
