#pragma once

#include <sys/types.h>

#include <span>
#include <string>

namespace ZorvaTouch::Linux {

/// Finds out whether a file whose code is to be run may have been exchanged by another user: the file and its
/// directory must belong to one of the owners, and neither a group (but root's) nor everyone may write to
/// them. A directory with the sticky bit may be writable: users cannot exchange files of other users there.
///
/// @return The file's path without links, as it was checked.
/// @throws std::runtime_error  It does not exist or is not to be trusted, with the reason in one line.
[[nodiscard]] std::string requireTrustedFile(const std::string &file, std::span<const uid_t> owners);

/// As root the checked path of a file that belongs to root or to the owner of the running program, for other
/// users the path as it is.
/// @throws std::runtime_error  As `requireTrustedFile`.
[[nodiscard]] std::string trustedPath(const std::string &file);

} // namespace ZorvaTouch::Linux
