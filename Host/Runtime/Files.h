#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <stop_token>
#include <string>
#include <string_view>
#include <system_error>

/// Whole files in and out, and the standard streams. Failures are `std::system_error`: the code is the
/// system's and the operation that failed is a verb, "open" or "write", kept with it.
namespace ZorvaTouch::Host {

/// An operation on a file and the reason why it failed.
class FileFailure : public std::system_error {
public:
    FileFailure(const char *failedOperation, int errorNumber)
        : std::system_error(errorNumber, std::generic_category(), failedOperation),
          operation(failedOperation) {}
    const char *operation; ///< a literal: "open", "read", "write", "rename", "replace a symbolic link"
};

/// Descriptors of the standard streams.
enum class StandardStream : int { Input = 0, Output = 1, Error = 2 };

/// Reads a whole file, or whatever else can be opened under that name.
/// @throws FileFailure
[[nodiscard]] std::string readFile(const std::string &path);

/// A file that is open for reading.
struct Input {
    /// Reads up to `size` bytes to `to` and returns how many; 0 at the end. Keeps the file open.
    /// @throws FileFailure
    std::function<std::size_t(char *to, std::size_t size)> read;
    std::uint64_t size = 0; ///< bytes of a regular file; 0 if unknown
};

/// Opens a file, or whatever else can be opened under that name.
/// @throws FileFailure
[[nodiscard]] Input openInput(const std::string &path);
/// Standard input, from where it stands.
[[nodiscard]] Input openStandardInput();

/// Reads up to the end.
/// @throws FileFailure
[[nodiscard]] std::string readAll(const Input &input);

/// Gives a file new contents: they are written to a temporary file of a random name in the same folder,
/// flushed to the disk and renamed, and the folder is flushed, so that under `path` there is always the whole
/// old file or the whole new one. An existing file keeps its permissions, a symbolic link keeps pointing at
/// it. A pipe or a device is written directly.
/// @throws FileFailure  The temporary file is gone then.
void replaceFile(const std::string &path, std::string_view contents);

/// Gives a file new contents that only its owner may read: it has the mode 0600 from its first byte on,
/// whatever an older file's permissions were, and is read again and compared before it gets its name.
///
/// Only a regular file is replaced. Anything else there is refused, a symbolic link too: the program may have
/// more rights than the user who can put a link into that folder. A link that gets there at the last moment
/// is replaced, and what it points at stays as it is. No name is opened that another program may have
/// exchanged, so a FIFO in the place of the file cannot block the call. Parent directories are used as given.
/// @param abandoned  Once it is requested, the call ends as soon as the system lets it, and throws ECANCELED.
/// @throws FileFailure  As above; EPERM for anything but a regular file, EISDIR for a folder, EBUSY if
///                      another program exchanged the file while it got its name.
void replacePrivateFile(const std::string &path, std::string_view contents,
                        const std::stop_token &abandoned = {});

/// Checks whether `replacePrivateFile` can make the file, as far as that can be found out beforehand. Leaves
/// everything as it is.
/// @throws FileFailure  What it would throw.
void requireReplaceable(const std::string &path);

/// The part of it that depends on the name, and on the file that has it, alone: for further names in a
/// folder.
/// @throws FileFailure
void requireReplaceableName(const std::string &path);

/// Removes temporary files that killed processes of this user have left behind in the folder of a file. A
/// file that a process is still writing stays. Failures are ignored.
void removeLeftovers(const std::string &path) noexcept;

/// Writes everything.
/// @throws FileFailure
void writeStandard(StandardStream stream, std::string_view text);

/// Whether a person watches: the stream is a terminal.
[[nodiscard]] bool isTerminal(StandardStream stream) noexcept;

/// Makes writes fail with an error in place of a signal that ends the process: EPIPE for a pipe without a
/// reader, EFBIG for a file beyond the limit on its size (`ulimit -f`, LimitFSIZE=).
void reportFailedWrites() noexcept;

} // namespace ZorvaTouch::Host
