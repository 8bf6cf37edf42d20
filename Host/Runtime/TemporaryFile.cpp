#include "Host/Runtime/TemporaryFile.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/random.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <memory>

namespace ZorvaTouch::Host {
namespace {

constexpr std::string_view kPrefix = ".zorvatouch-";
constexpr std::size_t kRandomDigits = 16; ///< hexadecimal, 64 bits
constexpr int kAttempts = 100;
constexpr std::size_t kPiece = std::size_t{1} << 20;
constexpr const char *kOpenOperation = "open a temporary file beside it";

std::string randomName() {
    std::uint64_t number = 0;
    if (::getrandom(&number, sizeof number, 0) != ssize_t{sizeof number})
        throw FileFailure(kOpenOperation, errno);
    std::array<char, kRandomDigits + 1> digits{};
    std::snprintf(digits.data(), digits.size(), "%016llx", static_cast<unsigned long long>(number));
    return std::string(kPrefix).append(digits.data());
}

bool isOurName(std::string_view name) {
    return name.size() == kPrefix.size() + kRandomDigits && name.starts_with(kPrefix) &&
           name.find_first_not_of("0123456789abcdef", kPrefix.size()) == std::string_view::npos;
}

bool isSameFile(const struct stat &left, const struct stat &right) noexcept {
    return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}

int openFolder(const std::string &path) {
    const char *const name = path.empty() ? "." : path.c_str();
    const int number = ::open(name, O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    // To make files in it, the folder need not be readable.
    return number < 0 && errno == EACCES ? ::open(name, O_PATH | O_DIRECTORY | O_CLOEXEC) : number;
}

Descriptor ownedFolder(const std::string &path) {
    const int number = openFolder(path);
    if (number < 0)
        throw FileFailure(kOpenOperation, errno);
    return Descriptor(number);
}

/// Whether the new file is ours: a program that removes leftovers may have found it before it was locked.
bool lockNew(int number) noexcept {
    struct stat status {};
    if (::flock(number, LOCK_EX | LOCK_NB) != 0 && errno == EWOULDBLOCK)
        return false;
    return ::fstat(number, &status) != 0 || status.st_nlink != 0;
}

void requireNotAbandoned(const std::stop_token &abandoned) {
    if (abandoned.stop_requested())
        throw FileFailure("write", ECANCELED);
}

/// Removes a file of this user that no process has locked.
void removeLeftover(const Folder &folder, const char *name) {
    const int number =
        ::openat(folder.number(), name, O_RDWR | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (number < 0)
        return;
    const Descriptor file(number);
    struct stat status {};
    if (::fstat(number, &status) != 0 || !S_ISREG(status.st_mode) || status.st_uid != ::geteuid() ||
        status.st_nlink != 1 || ::flock(number, LOCK_EX | LOCK_NB) != 0)
        return;
    const auto named = folder.statusOf(name);
    if (named && isSameFile(*named, status))
        ::unlinkat(folder.number(), name, 0);
}

} // namespace

// --- Folder ------------------------------------------------------------------------------------------------

SplitPath::SplitPath(const std::string &path)
    : folder(path.substr(0, path.rfind('/') + 1)), name(path.substr(path.rfind('/') + 1)) {}

Folder::Folder(const std::string &path) : _descriptor(ownedFolder(path)) {}

std::optional<struct stat> Folder::statusOf(const std::string &name) const noexcept {
    struct stat status {};
    const int result = ::fstatat(number(), name.c_str(), &status, AT_SYMLINK_NOFOLLOW);
    return result == 0 ? std::optional(status) : std::nullopt;
}

void Folder::flush() const {
    if (uninterrupted([this] { return ::fsync(number()); }) == 0)
        return;
    if (errno != EINVAL && errno != EBADF && errno != EROFS)
        throw FileFailure("flush its folder", errno);
}

// --- TemporaryFile -----------------------------------------------------------------------------------------

TemporaryFile::TemporaryFile(const Folder &folder, mode_t permissions)
    : _folder(folder), _descriptor(create(folder, permissions, _name)) {}

TemporaryFile::~TemporaryFile() {
    if (!_name.empty())
        ::unlinkat(_folder.number(), _name.c_str(), 0);
}

Descriptor TemporaryFile::create(const Folder &folder, mode_t permissions, std::string &name) {
    for (int attempt = 0; attempt < kAttempts; ++attempt) {
        name = randomName();
        const int number = uninterrupted([&] {
            return ::openat(folder.number(), name.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC,
                            permissions);
        });
        if (number < 0 && errno != EEXIST)
            throw FileFailure(kOpenOperation, errno);
        if (number < 0)
            continue;
        Descriptor file(number);
        if (lockNew(number))
            return file;
    }
    throw FileFailure(kOpenOperation, EEXIST);
}

void TemporaryFile::write(std::string_view contents, std::optional<mode_t> permissions,
                          const std::stop_token &abandoned) {
    for (std::string_view rest = contents; !rest.empty(); rest.remove_prefix(std::min(rest.size(), kPiece))) {
        requireNotAbandoned(abandoned);
        writeAll(_descriptor.number(), rest.substr(0, kPiece));
    }
    if (permissions && ::fchmod(_descriptor.number(), *permissions) != 0)
        throw FileFailure("change the permissions", errno);
    requireNotAbandoned(abandoned);
    if (uninterrupted([this] { return ::fsync(_descriptor.number()); }) != 0)
        throw FileFailure("write", errno);
    requireNotAbandoned(abandoned);
}

void TemporaryFile::verify(std::string_view contents) const {
    const auto buffer = std::make_unique<std::array<char, kPiece>>();
    std::size_t offset = 0;
    for (;;) {
        const auto count = uninterrupted([&] {
            return ::pread(_descriptor.number(), buffer->data(), buffer->size(), static_cast<off_t>(offset));
        });
        if (count < 0)
            throw FileFailure("read it again", errno);
        const std::string_view found(buffer->data(), static_cast<std::size_t>(count));
        if (contents.substr(offset, found.size()) != found)
            throw FileFailure("read it again as it was written", EIO);
        offset += found.size();
        if (count == 0)
            break;
    }
    if (offset != contents.size())
        throw FileFailure("read it again as it was written", EIO);
}

bool TemporaryFile::isNamed(const std::string &name) const noexcept {
    struct stat own {};
    const auto named = _folder.statusOf(name);
    return named && ::fstat(_descriptor.number(), &own) == 0 && isSameFile(*named, own);
}

void TemporaryFile::renameTo(const std::string &name) {
    if (::renameat(_folder.number(), _name.c_str(), _folder.number(), name.c_str()) != 0)
        throw FileFailure("rename", errno);
    _name.clear();
    if (!isNamed(name))
        throw FileFailure("replace it while another program changes its folder", EBUSY);
    _folder.flush();
    _descriptor.close();
}

void TemporaryFile::removeLeftovers(const Folder &folder) noexcept {
    const int again = ::openat(folder.number(), ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (again < 0)
        return;
    DIR *const opened = ::fdopendir(again);
    if (!opened) {
        ::close(again);
        return;
    }
    const std::unique_ptr<DIR, int (*)(DIR *)> entries(opened, &::closedir);
    while (const dirent *const entry = ::readdir(entries.get()))
        if (isOurName(static_cast<const char *>(entry->d_name)))
            removeLeftover(folder, static_cast<const char *>(entry->d_name));
}

} // namespace ZorvaTouch::Host
