#pragma once

#include "Host/Interface/Platform.h"

#include <functional>
#include <memory>

namespace ZorvaTouch::Host {

/// Starts a thread of the system's.
///
/// @param name  Cut off after 15 characters; null is no name.
/// @param body  Destroyed on the thread, before the thread counts as gone.
/// @throws std::system_error  `body` is destroyed unrun.
[[nodiscard]] std::unique_ptr<Thread> startSystemThread(const char *name, std::function<void()> body);

/// Gives the calling thread the round-robin policy.
/// @return 0 or the error's number.
[[nodiscard]] int setRoundRobinPriorityOfThisThread(int priority) noexcept;

} // namespace ZorvaTouch::Host
