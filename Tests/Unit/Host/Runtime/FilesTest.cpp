#include "Host/Runtime/Files.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <functional>
#include <stop_token>
#include <string>

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
              "replace a file that is not regular: Operation not permitted");
    EXPECT_EQ(failureOf([] { replacePrivateFile("/dev/null", "2"); }),
              "replace a file that is not regular: Operation not permitted");
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

TEST_F(Files, ANameThatIsTooLongIsToldBeforehand) {
    EXPECT_EQ(failureOf([this] { requireReplaceable(path(std::string(255, 'a'))); }), "none");
    EXPECT_EQ(failureOf([this] { requireReplaceable(path(std::string(256, 'a'))); }),
              "replace: File name too long");
}

/// Another user's file, as that user's own process sees it.
TEST_F(Files, AnotherUsersFileInAStickyFolderIsToldBeforehand) {
    if (::geteuid() != 0)
        GTEST_SKIP() << "only root can be two users";
    constexpr uid_t kUser = 65534;
    replaceFile(path("foreign"), "1");
    replaceFile(path("own"), "1");
    ASSERT_EQ(::chown(path("own").c_str(), kUser, kUser), 0);
    ASSERT_EQ(::chmod(_folder.c_str(), 01777), 0);
    EXPECT_EQ(failureOf([this] { requireReplaceable(path("own")); }), "none") << "root may";
    ASSERT_EQ(::seteuid(kUser), 0);
    const std::string foreign = failureOf([this] { requireReplaceable(path("foreign")); });
    const std::string own = failureOf([this] { requireReplaceable(path("own")); });
    const std::string saved = failureOf([this] { replacePrivateFile(path("foreign"), "2"); });
    ASSERT_EQ(::seteuid(0), 0);
    EXPECT_EQ(foreign,
              "replace another user's file in a folder with the sticky bit: Operation not permitted");
    EXPECT_EQ(saved, foreign);
    EXPECT_EQ(own, "none");
}

TEST_F(Files, NamesThatWereTakenBeforehandDoNotHinder) {
    for (int i = 0; i <= 100; ++i)
        replaceFile(path(".zorvatouch-" + std::to_string(::getpid()) + "-" + std::to_string(i)), "planted");
    replacePrivateFile(path("a"), "1");
    EXPECT_EQ(readFile(path("a")), "1");
}

TEST_F(Files, AFileBeyondTheLimitIsAnErrorAndLeavesNothing) {
    reportFailedWrites();
    rlimit before{};
    ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &before), 0);
    rlimit limited = before;
    limited.rlim_cur = 100'000;
    replaceFile(path("a"), "older");
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &limited), 0);
    const std::string failure =
        failureOf([this] { replacePrivateFile(path("a"), std::string(100'001, 'x')); });
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &before), 0);
    EXPECT_EQ(failure, "write: File too large");
    EXPECT_EQ(readFile(path("a")), "older");
    EXPECT_EQ(fileCount(), 1u);
}

TEST_F(Files, AnAbandonedFileLeavesNothing) {
    replaceFile(path("a"), "older");
    std::stop_source abandoned;
    abandoned.request_stop();
    EXPECT_EQ(failureOf([&] { replacePrivateFile(path("a"), "newer", abandoned.get_token()); }),
              "write: Operation canceled");
    EXPECT_EQ(readFile(path("a")), "older");
    EXPECT_EQ(fileCount(), 1u);
}

TEST_F(Files, OnlyLeftoversThatNobodyWritesAreRemoved) {
    const std::string left = ".zorvatouch-0123456789abcdef", written = ".zorvatouch-fedcba9876543210";
    replaceFile(path(left), "left");
    replaceFile(path(written), "written");
    replaceFile(path(".zorvatouch-0123456789abcdeF"), "another's name");
    replaceFile(path("a"), "1");
    ASSERT_EQ(::symlink("a", path(".zorvatouch-0000000000000000").c_str()), 0);
    ASSERT_EQ(::mkfifo(path(".zorvatouch-0000000000000001").c_str(), 0600), 0);
    const int writer = ::open(path(written).c_str(), O_WRONLY | O_CLOEXEC);
    ASSERT_EQ(::flock(writer, LOCK_EX), 0);
    removeLeftovers(path("a"));
    EXPECT_FALSE(std::filesystem::exists(path(left)));
    EXPECT_EQ(fileCount(), 5u);
    ::close(writer);
    removeLeftovers(path("a"));
    EXPECT_FALSE(std::filesystem::exists(path(written)));
    EXPECT_EQ(fileCount(), 4u);
    removeLeftovers(path("no/a")); // nothing to be done
}

TEST_F(Files, ABrokenPipeIsReported) {
    reportFailedWrites();
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
