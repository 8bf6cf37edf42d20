#pragma once

#include "Host/Runtime/Descriptor.h"

#include <sys/stat.h>
#include <sys/types.h>

#include <optional>
#include <stop_token>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {

/// A path as its folder, "" or with the slash at its end, and the name in it.
struct SplitPath {
    explicit SplitPath(const std::string &path);
    std::string folder;
    std::string name;
};

/// An open folder: what is done by name is done in this one, whatever its path comes to stand for.
///
/// Threads: any, one at a time.
class Folder {
public:
    /// @param path  "" is the current folder.
    /// @throws FileFailure
    explicit Folder(const std::string &path);

    [[nodiscard]] int number() const noexcept { return _descriptor.number(); }
    /// What has the name, a link itself; nothing if that cannot be found out.
    [[nodiscard]] std::optional<struct stat> statusOf(const std::string &name) const noexcept;

    /// Flushes the folder to the disk, so that a rename in it outlasts a power failure. Does nothing where
    /// the file system has no such thing, or the folder may not be read.
    /// @throws FileFailure
    void flush() const;

private:
    Descriptor _descriptor;
};

/// A new file under a random name that removes itself unless it is renamed. It is locked while it is open:
/// one that is not locked was left behind by a process that was killed.
///
/// Threads: any, one at a time.
class TemporaryFile {
public:
    /// @param folder       Borrowed.
    /// @param permissions  Before the user's mask.
    /// @throws FileFailure
    TemporaryFile(const Folder &folder, mode_t permissions);
    ~TemporaryFile();
    TemporaryFile(const TemporaryFile &) = delete;
    TemporaryFile &operator=(const TemporaryFile &) = delete;

    /// Writes everything and flushes it to the disk.
    /// @param permissions  Of the file from then on, whatever the user's mask; nothing: as it was made.
    /// @param abandoned    Checked between pieces of a mebibyte.
    /// @throws FileFailure  ECANCELED: it was abandoned.
    void write(std::string_view contents, std::optional<mode_t> permissions,
               const std::stop_token &abandoned);

    /// Reads through the descriptor, which no other program can exchange, and compares.
    /// @throws FileFailure  EIO: what is read differs from what was written.
    void verify(std::string_view contents) const;

    /// @throws FileFailure  EBUSY: another program has changed the folder meanwhile, and it is not this file
    ///                      that has the name.
    void renameTo(const std::string &name);

    /// Removes the files of this kind that killed processes of this user have left behind. Failures are not
    /// reported: what cannot be removed stays.
    static void removeLeftovers(const Folder &folder) noexcept;

private:
    static Descriptor create(const Folder &folder, mode_t permissions, std::string &name);
    [[nodiscard]] bool isNamed(const std::string &name) const noexcept;

    const Folder &_folder;
    std::string _name; ///< empty once renamed
    Descriptor _descriptor;
};

} // namespace ZorvaTouch::Host
