#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
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

/// Gives a file new contents: they are written to a temporary file in the same folder, flushed to the disk
/// and renamed, so that under `path` there is always the whole old file or the whole new one. An existing
/// file keeps its permissions, a symbolic link keeps pointing at it. What is no regular file (a pipe, a
/// device) is written to as it is.
/// @throws FileFailure  The temporary file is gone then.
void replaceFile(const std::string &path, std::string_view contents);

/// The same for contents that are nobody else's business: the file is readable and writable for its owner and
/// for nobody else, from its first byte on and whatever an older file's permissions were.
///
/// Only a regular file is replaced. What else is there is refused, a symbolic link too: the program may have
/// more rights than whoever can put a link into that folder. One that gets there at the last moment is
/// replaced, and what it points at stays as it is. The folders on the way to the file are whoever's who named
/// it.
/// @throws FileFailure  As above; EPERM for what is no regular file, EISDIR for a folder.
void replacePrivateFile(const std::string &path, std::string_view contents);

/// Whether `replacePrivateFile` can make the file, as far as that can be told beforehand. Leaves everything
/// as it is.
/// @throws FileFailure  What it would throw.
void requireReplaceable(const std::string &path);

/// Writes everything.
/// @throws FileFailure
void writeStandard(StandardStream stream, std::string_view text);

/// Whether a person watches: the stream is a terminal.
[[nodiscard]] bool isTerminal(StandardStream stream) noexcept;

/// Makes a write to a pipe that nobody reads fail with EPIPE instead of ending the process without a word.
void reportBrokenPipes() noexcept;

} // namespace ZorvaTouch::Host
