#include "Host/Linux/TrustedFile.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <filesystem>
#include <stdexcept>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

constexpr uid_t kRoot = 0;
constexpr gid_t kRootGroup = 0;

[[noreturn]] void refuse(const std::string &path, const std::string &problem) {
    throw std::runtime_error("cannot load as root: " + path + " " + problem +
                             "; it must be writable by root alone");
}

void requireTrustedEntry(const std::string &path, std::span<const uid_t> owners) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0)
        refuse(path, "cannot be checked (" + std::generic_category().message(errno) + ")");
    if (std::ranges::find(owners, status.st_uid) == owners.end())
        refuse(path, "belongs to user " + std::to_string(status.st_uid));
    if (S_ISDIR(status.st_mode) && (status.st_mode & S_ISVTX) != 0)
        return; // others may add files, and not exchange this one
    if ((status.st_mode & S_IWOTH) != 0)
        refuse(path, "is writable by everyone");
    if ((status.st_mode & S_IWGRP) != 0 && status.st_gid != kRootGroup)
        refuse(path, "is writable by group " + std::to_string(status.st_gid));
}

/// A user who may exchange the program itself gains nothing by exchanging what it loads.
uid_t programOwner() noexcept {
    struct stat status {};
    return ::stat("/proc/self/exe", &status) == 0 ? status.st_uid : kRoot;
}

} // namespace

std::string requireTrustedFile(const std::string &file, std::span<const uid_t> owners) {
    std::error_code error;
    const std::filesystem::path path = std::filesystem::canonical(file, error);
    if (error)
        throw std::runtime_error("cannot load " + file + ": " + error.message());
    requireTrustedEntry(path.parent_path().string(), owners);
    requireTrustedEntry(path.string(), owners);
    return path.string();
}

std::string trustedPath(const std::string &file) {
    return ::geteuid() == kRoot ? requireTrustedFile(file, std::array{kRoot, programOwner()}) : file;
}

} // namespace ZorvaTouch::Linux
