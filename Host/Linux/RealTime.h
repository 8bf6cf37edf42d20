#pragma once

#include <optional>
#include <string>

namespace ZorvaTouch::Linux {

/// What the system does not grant.
struct RealTimeRefusal {
    int errorNumber;  ///< an errno
    std::string line; ///< for people: what is not granted, what to set, and what that means
};

/// Keeps the process's memory from being written out to disk: what is in use now and what will be, page by
/// page as it is first touched. Either that or nothing has changed.
///
/// Under a limit it is not even tried, unless the process is above limits: memory that is got later would
/// count as well, and no thread could be started once the limit is reached.
///
/// Threads: any; at a program's start, since the process's limit is another one for a moment.
/// @return Why it is refused, if it is.
/// @throws std::bad_alloc
[[nodiscard]] std::optional<RealTimeRefusal> lockMemory();

/// Whether threads of this process may have a priority of the round-robin policy. It is tried on the calling
/// thread, which is as before afterwards.
///
/// Threads: any.
/// @param priority  1 to 99.
/// @return Why it is refused, if it is.
/// @throws std::bad_alloc
[[nodiscard]] std::optional<RealTimeRefusal> tryRoundRobin(int priority);

} // namespace ZorvaTouch::Linux
