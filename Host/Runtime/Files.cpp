#include "Host/Runtime/Files.h"

#include "Host/Runtime/Descriptor.h"
#include "Host/Runtime/TemporaryFile.h"

#include <fcntl.h>
#include <linux/capability.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <memory>
#include <optional>

namespace ZorvaTouch::Host {
namespace {

constexpr mode_t kForEverybody = 0666; ///< as far as the user lets new files be
constexpr mode_t kForTheOwner = 0600;

/// @param permissions  Of a file that is made, before the user's mask.
Descriptor openFile(const std::string &path, int flags, mode_t permissions = 0) {
    const int number = uninterrupted([&] { return ::open(path.c_str(), flags | O_CLOEXEC, permissions); });
    if (number < 0)
        throw FileFailure("open", errno);
    return Descriptor(number);
}

/// What is at `path`, links followed; nothing if that cannot be told.
std::optional<struct stat> statusOf(const std::string &path) {
    struct stat status {};
    return ::stat(path.c_str(), &status) == 0 ? std::optional(status) : std::nullopt;
}

/// Bytes of a regular file; 0 for anything else.
std::uint64_t sizeOf(int descriptor) {
    struct stat status {};
    if (::fstat(descriptor, &status) != 0 || !S_ISREG(status.st_mode) || status.st_size < 0)
        return 0;
    return static_cast<std::uint64_t>(status.st_size);
}

std::size_t readSome(int descriptor, char *to, std::size_t size) {
    const auto count = uninterrupted([&] { return ::read(descriptor, to, size); });
    if (count < 0)
        throw FileFailure("read", errno);
    return static_cast<std::size_t>(count);
}

/// The file that a link points at, so that renaming replaces that one; `path` itself if it does not exist.
std::string resolveLinks(const std::string &path) {
    const std::unique_ptr<char, decltype(&std::free)> resolved(::realpath(path.c_str(), nullptr), &std::free);
    return resolved ? std::string(resolved.get()) : path;
}

/// @param permissions  Nothing: as the user wants new files.
/// @param isVerified   The file is read again before it gets its name.
void writeAndRename(const std::string &target, std::string_view contents, std::optional<mode_t> permissions,
                    bool isVerified, const std::stop_token &abandoned) {
    const SplitPath path(target);
    const Folder folder(path.folder);
    // Until it has its permissions, other users cannot read what the permissions may hide.
    TemporaryFile file(folder, permissions ? kForTheOwner : kForEverybody);
    file.write(contents, permissions, abandoned);
    if (isVerified)
        file.verify(contents);
    file.renameTo(path.name);
}

/// Whether this process may replace other users' files in folders with the sticky bit.
bool mayReplaceForeignFiles() noexcept {
    __user_cap_header_struct header{.version = _LINUX_CAPABILITY_VERSION_3, .pid = 0};
    std::array<__user_cap_data_struct, _LINUX_CAPABILITY_U32S_3> sets{};
    return ::syscall(SYS_capget, &header, sets.data()) == 0 &&
           (sets[CAP_TO_INDEX(CAP_FOWNER)].effective & CAP_TO_MASK(CAP_FOWNER)) != 0;
}

/// @throws FileFailure  The file is another user's, and the folder keeps it for that user.
void requireOurs(const std::string &path, const struct stat &file) {
    const auto folder = statusOf(SplitPath(path).folder.empty() ? "." : SplitPath(path).folder);
    if (!folder || (folder->st_mode & S_ISVTX) == 0)
        return;
    const uid_t user = ::geteuid();
    if (file.st_uid != user && folder->st_uid != user && !mayReplaceForeignFiles())
        throw FileFailure("replace another user's file in a folder with the sticky bit", EPERM);
}

} // namespace

Input openInput(const std::string &path) {
    const auto file = std::make_shared<Descriptor>(openFile(path, O_RDONLY));
    return {.read = [file](char *to, std::size_t size) { return readSome(file->number(), to, size); },
            .size = sizeOf(file->number())};
}

Input openStandardInput() {
    constexpr int kDescriptor = static_cast<int>(StandardStream::Input);
    return {.read = [](char *to, std::size_t size) { return readSome(kDescriptor, to, size); },
            .size = sizeOf(kDescriptor)};
}

std::string readAll(const Input &input) {
    constexpr std::size_t kLeast = 64 * 1024;
    // A regular file is read in one go and its end is seen in the next.
    std::string text(std::max<std::size_t>(input.size + 1, kLeast), '\0');
    std::size_t length = 0;
    while (const std::size_t count = input.read(text.data() + length, text.size() - length)) {
        length += count;
        if (length == text.size())
            text.resize(text.size() * 2);
    }
    text.resize(length);
    return text;
}

std::string readFile(const std::string &path) { return readAll(openInput(path)); }

void replaceFile(const std::string &path, std::string_view contents) {
    const std::optional<struct stat> old = statusOf(path);
    if (old && !S_ISREG(old->st_mode)) {
        Descriptor descriptor = openFile(path, O_WRONLY);
        writeAll(descriptor.number(), contents);
        descriptor.close();
        return;
    }
    writeAndRename(resolveLinks(path), contents,
                   old ? std::optional<mode_t>(old->st_mode & 07777) : std::nullopt, false, {});
}

void replacePrivateFile(const std::string &path, std::string_view contents,
                        const std::stop_token &abandoned) {
    requireReplaceableName(path);
    writeAndRename(path, contents, kForTheOwner, true, abandoned);
}

void requireReplaceable(const std::string &path) {
    requireReplaceableName(path);
    const Folder folder(SplitPath(path).folder);
    const TemporaryFile file(folder, kForTheOwner);
}

void requireReplaceableName(const std::string &path) {
    struct stat status {};
    if (::lstat(path.c_str(), &status) != 0) {
        if (errno == ENAMETOOLONG)
            throw FileFailure("replace", errno);
        return; // every other reason is found when the folder is opened
    }
    if (S_ISREG(status.st_mode))
        return requireOurs(path, status);
    if (S_ISDIR(status.st_mode))
        throw FileFailure("replace", EISDIR);
    throw FileFailure(
        S_ISLNK(status.st_mode) ? "replace a symbolic link" : "replace a file that is not regular", EPERM);
}

void removeLeftovers(const std::string &path) noexcept {
    try {
        TemporaryFile::removeLeftovers(Folder(SplitPath(path).folder));
    } catch (const std::exception &) { // a folder that cannot be opened keeps what is in it
    }
}

void writeStandard(StandardStream stream, std::string_view text) { writeAll(static_cast<int>(stream), text); }

bool isTerminal(StandardStream stream) noexcept { return ::isatty(static_cast<int>(stream)) == 1; }

void reportFailedWrites() noexcept {
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
}

} // namespace ZorvaTouch::Host
