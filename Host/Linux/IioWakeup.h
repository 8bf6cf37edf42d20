#pragma once

#include "Host/Linux/UniqueFd.h"

namespace ZorvaTouch::Linux {

/// Wakes a thread that sleeps; what comes before it sleeps, and several times, is kept as one.
///
/// Threads: any.
class IioWakeup {
public:
    /// @throws std::system_error
    IioWakeup();

    void wake() const noexcept;
    /// Sleeps until somebody has woken it since the last time.
    void wait() const noexcept;
    /// Readable when `wait` would not sleep; stays this one's.
    [[nodiscard]] int descriptor() const noexcept { return _event.get(); }

private:
    const UniqueFd _event;
};

} // namespace ZorvaTouch::Linux
