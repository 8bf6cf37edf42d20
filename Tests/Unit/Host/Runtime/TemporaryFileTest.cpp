#include "Host/Runtime/TemporaryFile.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <functional>
#include <string>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

class TemporaryFileTest : public ::testing::Test {
protected:
    void SetUp() override {
        std::string pattern = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
        ASSERT_NE(::mkdtemp(pattern.data()), nullptr);
        _folder = pattern + "/";
    }
    void TearDown() override { std::filesystem::remove_all(_folder); }

    [[nodiscard]] std::string path(const std::string &name) const { return _folder + name; }
    /// The only file in the folder.
    [[nodiscard]] std::string onlyFile() const {
        return std::filesystem::directory_iterator(_folder)->path().string();
    }

    std::string _folder;
};

int errorOf(const std::function<void()> &call) {
    try {
        call();
        return 0;
    } catch (const FileFailure &failure) {
        return failure.code().value();
    }
}

TEST_F(TemporaryFileTest, HasNoNameThatCanBeForeseen) {
    const Folder folder(_folder);
    std::string first;
    {
        const TemporaryFile file(folder, 0600);
        first = onlyFile();
    }
    EXPECT_TRUE(std::filesystem::is_empty(_folder));
    const TemporaryFile file(folder, 0600);
    EXPECT_NE(onlyFile(), first);
    EXPECT_EQ(SplitPath(first).name.size(), 28u);
}

TEST_F(TemporaryFileTest, WhatAnotherProgramChangesInItIsFound) {
    const Folder folder(_folder);
    const std::string contents((std::size_t{1} << 20) + 1, 'x'); // more than is read at once
    for (const auto &[text, expected] : {std::pair(contents, 0), std::pair(contents + "y", EIO),
                                         std::pair(contents.substr(1), EIO), std::pair(std::string(), EIO)}) {
        TemporaryFile file(folder, 0600);
        file.write(contents, 0600, {});
        const std::string name = onlyFile();
        const Descriptor other(::open(name.c_str(), O_WRONLY | O_TRUNC | O_CLOEXEC));
        writeAll(other.number(), text);
        EXPECT_EQ(errorOf([&] { file.verify(contents); }), expected);
    }
}

TEST_F(TemporaryFileTest, OneThatWasExchangedIsNoSuccess) {
    const Folder folder(_folder);
    TemporaryFile file(folder, 0600);
    file.write("1", 0600, {});
    const std::string name = onlyFile();
    std::filesystem::rename(name, path("away"));
    std::filesystem::create_symlink("away", name);
    EXPECT_EQ(errorOf([&] { file.renameTo("a"); }), EBUSY);
}

TEST_F(TemporaryFileTest, GoesToTheFolderThatWasOpened) {
    std::filesystem::create_directory(path("old"));
    const Folder folder(path("old/"));
    TemporaryFile file(folder, 0600);
    std::filesystem::rename(path("old"), path("moved"));
    file.write("1", 0600, {});
    file.renameTo("a");
    EXPECT_EQ(readFile(path("moved/a")), "1");
}

TEST(SplitPath, KeepsTheSlash) {
    EXPECT_EQ(SplitPath("a").folder, "");
    EXPECT_EQ(SplitPath("a").name, "a");
    EXPECT_EQ(SplitPath("/a").folder, "/");
    EXPECT_EQ(SplitPath("x/y/a.json").folder, "x/y/");
    EXPECT_EQ(SplitPath("x/y/a.json").name, "a.json");
}

} // namespace
} // namespace ZorvaTouch::Host
