#pragma once

#include "Host/Linux/SystemFailure.h"

#include <cstdint>
#include <optional>

namespace ZorvaTouch::Linux {

/// Where key presses go.
///
/// Threads: one at a time.
class KeyOutput {
public:
    virtual ~KeyOutput() = default;

    /// Presses a key, and it stays down until it is released.
    /// @param code  KEY_VOLUMEUP and its like.
    /// @return Why it failed, if it did.
    [[nodiscard]] virtual std::optional<SystemFailure> press(std::uint16_t code) noexcept = 0;
    /// Releases a key; one that is up stays up.
    [[nodiscard]] virtual std::optional<SystemFailure> release(std::uint16_t code) noexcept = 0;
};

} // namespace ZorvaTouch::Linux
