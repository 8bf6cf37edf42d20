#include "Host/Runtime/Files.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <memory>
#include <optional>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

/// Owns a file descriptor.
class Descriptor {
public:
    explicit Descriptor(int number) noexcept : _number(number) {}
    Descriptor(Descriptor &&other) noexcept : _number(std::exchange(other._number, -1)) {}
    Descriptor(const Descriptor &) = delete;
    Descriptor &operator=(const Descriptor &) = delete;
    Descriptor &operator=(Descriptor &&) = delete;
    ~Descriptor() {
        if (_number >= 0)
            ::close(_number);
    }

    [[nodiscard]] int number() const noexcept { return _number; }

    /// Some file systems report a failed write only here.
    void close() {
        if (::close(std::exchange(_number, -1)) != 0 && errno != EINTR)
            throw FileFailure("close", errno);
    }

private:
    int _number;
};

/// Calls a system function again while signals interrupt it.
template <typename Call> auto uninterrupted(const Call &call) {
    auto result = call();
    while (result < 0 && errno == EINTR)
        result = call();
    return result;
}

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

void writeAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const auto count = uninterrupted([&] { return ::write(descriptor, text.data(), text.size()); });
        if (count < 0)
            throw FileFailure("write", errno);
        text.remove_prefix(static_cast<std::size_t>(count));
    }
}

/// The file that a link points at, so that renaming replaces that one; `path` itself if it does not exist.
std::string resolveLinks(const std::string &path) {
    const std::unique_ptr<char, decltype(&std::free)> resolved(::realpath(path.c_str(), nullptr), &std::free);
    return resolved ? std::string(resolved.get()) : path;
}

std::string folderOf(const std::string &path) {
    const auto slash = path.rfind('/');
    return slash == std::string::npos ? "" : path.substr(0, slash + 1);
}

/// A new file that removes itself unless it is renamed.
class TemporaryFile {
public:
    TemporaryFile(const std::string &folder, mode_t permissions)
        : _descriptor(create(folder, permissions, _path)) {}
    TemporaryFile(const TemporaryFile &) = delete;
    TemporaryFile &operator=(const TemporaryFile &) = delete;
    ~TemporaryFile() {
        if (!_path.empty())
            ::unlink(_path.c_str());
    }

    void write(std::string_view contents, std::optional<mode_t> permissions) {
        writeAll(_descriptor.number(), contents);
        if (permissions && ::fchmod(_descriptor.number(), *permissions) != 0)
            throw FileFailure("change the permissions", errno);
        if (::fsync(_descriptor.number()) != 0)
            throw FileFailure("write", errno);
        _descriptor.close();
    }

    void renameTo(const std::string &path) {
        if (::rename(_path.c_str(), path.c_str()) != 0)
            throw FileFailure("rename", errno);
        _path.clear();
    }

private:
    static Descriptor create(const std::string &folder, mode_t permissions, std::string &path) {
        const std::string stem = folder + ".zorvatouch-" + std::to_string(::getpid()) + "-";
        for (int attempt = 0;; ++attempt) {
            path = stem + std::to_string(attempt);
            try {
                return openFile(path, O_WRONLY | O_CREAT | O_EXCL, permissions);
            } catch (const FileFailure &failure) {
                path.clear();
                if (failure.code().value() != EEXIST || attempt == 100)
                    throw FileFailure("open a temporary file beside it", failure.code().value());
            }
        }
    }

    std::string _path;
    Descriptor _descriptor;
};

/// @param permissions  Nothing: as the user wants new files.
void writeAndRename(const std::string &target, std::string_view contents, std::optional<mode_t> permissions) {
    // Until it has its permissions nobody else reads what they may keep from others.
    TemporaryFile file(folderOf(target), permissions ? kForTheOwner : kForEverybody);
    file.write(contents, permissions);
    file.renameTo(target);
}

/// @throws FileFailure  There is something that is no regular file.
void requireRegularOrNothing(const std::string &path) {
    struct stat status {};
    if (::lstat(path.c_str(), &status) != 0 || S_ISREG(status.st_mode))
        return; // what hinders us will say so when the file is made
    if (S_ISDIR(status.st_mode))
        throw FileFailure("replace", EISDIR);
    throw FileFailure(S_ISLNK(status.st_mode) ? "replace a symbolic link" : "replace what is no regular file",
                      EPERM);
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
                   old ? std::optional<mode_t>(old->st_mode & 07777) : std::nullopt);
}

void replacePrivateFile(const std::string &path, std::string_view contents) {
    requireRegularOrNothing(path);
    writeAndRename(path, contents, kForTheOwner);
}

void requireReplaceable(const std::string &path) {
    requireRegularOrNothing(path);
    const TemporaryFile file(folderOf(path), kForTheOwner);
}

void writeStandard(StandardStream stream, std::string_view text) { writeAll(static_cast<int>(stream), text); }

bool isTerminal(StandardStream stream) noexcept { return ::isatty(static_cast<int>(stream)) == 1; }

void reportBrokenPipes() noexcept { std::signal(SIGPIPE, SIG_IGN); }

} // namespace ZorvaTouch::Host
