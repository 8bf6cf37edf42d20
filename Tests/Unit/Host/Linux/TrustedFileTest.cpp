#include "Host/Linux/TrustedFile.h"

#include <gmock/gmock.h>

#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

using testing::HasSubstr;

/// A file in a directory of its own, both of this user's.
class TrustedFile : public testing::Test {
protected:
    TrustedFile() {
        std::string made = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
        EXPECT_NE(::mkdtemp(made.data()), nullptr);
        folder = std::filesystem::canonical(made).string();
        file = folder + "/plugin.so";
        std::ofstream(file) << "not loaded here";
        setModes(0755, 0644);
    }
    ~TrustedFile() override {
        std::error_code ignored;
        std::filesystem::remove_all(folder, ignored);
    }

    void setModes(mode_t ofFolder, mode_t ofFile) const {
        EXPECT_EQ(::chmod(folder.c_str(), ofFolder), 0);
        EXPECT_EQ(::chmod(file.c_str(), ofFile), 0);
    }
    /// A group that is not root's.
    void setGroup(const std::string &path) const {
        const gid_t group = ::getegid() != 0 ? ::getegid() : 1;
        EXPECT_EQ(::chown(path.c_str(), ::geteuid(), group), 0);
    }
    [[nodiscard]] static std::string problemWith(const std::string &path, uid_t owner = ::geteuid()) {
        try {
            (void)requireTrustedFile(path, std::array{owner});
            return {};
        } catch (const std::runtime_error &error) {
            return error.what();
        }
    }

    std::string folder, file;
};

TEST_F(TrustedFile, IsWritableByItsOwnerAlone) {
    EXPECT_EQ(problemWith(file), "");
    EXPECT_EQ(requireTrustedFile(file, std::array{::geteuid()}), file);
}

TEST_F(TrustedFile, BelongsToATrustedUser) {
    EXPECT_EQ(problemWith(file, ::geteuid() + 1), "cannot load as root: " + folder + " belongs to user " +
                                                      std::to_string(::geteuid()) +
                                                      "; it must be writable by root alone");
}

TEST_F(TrustedFile, IsNotWritableByEveryone) {
    setModes(0755, 0646);
    EXPECT_THAT(problemWith(file), HasSubstr(file + " is writable by everyone"));
    setModes(0757, 0644);
    EXPECT_THAT(problemWith(file), HasSubstr(folder + " is writable by everyone"));
}

TEST_F(TrustedFile, IsNotWritableByAGroup) {
    setGroup(folder);
    setGroup(file);
    setModes(0755, 0664);
    EXPECT_THAT(problemWith(file), HasSubstr(file + " is writable by group "));
    setModes(0775, 0644);
    EXPECT_THAT(problemWith(file), HasSubstr(folder + " is writable by group "));
}

TEST_F(TrustedFile, MayLieInADirectoryWhereFilesCannotBeExchanged) {
    setModes(01777, 0644);
    EXPECT_EQ(problemWith(file), "");
}

TEST_F(TrustedFile, IsCheckedWhereALinkLeads) {
    const std::string link = folder + "/link.so";
    std::filesystem::create_symlink(file, link);
    EXPECT_EQ(requireTrustedFile(link, std::array{::geteuid()}), file);
    setModes(0755, 0666);
    EXPECT_THAT(problemWith(link), HasSubstr(file + " is writable by everyone"));
}

TEST_F(TrustedFile, Exists) {
    EXPECT_EQ(problemWith(folder + "/none.so"),
              "cannot load " + folder + "/none.so: No such file or directory");
}

TEST_F(TrustedFile, IsCheckedForRootAlone) {
    setModes(0755, 0666);
    try {
        EXPECT_EQ(trustedPath(file), file);
        EXPECT_NE(::geteuid(), 0u) << "root loads a file that everyone may write to";
    } catch (const std::runtime_error &error) {
        EXPECT_EQ(::geteuid(), 0u);
        EXPECT_THAT(error.what(), HasSubstr("is writable by everyone"));
    }
}

} // namespace
} // namespace ZorvaTouch::Linux
