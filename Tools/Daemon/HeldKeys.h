#pragma once

#include "Tools/Daemon/KeyMap.h"

#include <array>
#include <cstdint>
#include <vector>

namespace ZorvaTouch::Tools {

/// Which keys of the one keyboard are down, and for how many surfaces: two that press the same key are one
/// press, and one release when the last of them lets go.
///
/// Threads: one at a time.
class HeldKeys {
public:
    /// Takes a change of one surface.
    /// @return Whether it changes the keyboard's key. A release of what is not down, no key, and a code that
    /// is
    ///         none of the kernel's change nothing.
    [[nodiscard]] bool take(KeyChange change) noexcept;

    /// Lets go of everything, whoever pressed it: for a keyboard that is to go away, since its readers hear
    /// of no release then. What is released here is up already when its surface releases it too.
    /// @return The releases, in the order of the codes.
    [[nodiscard]] std::vector<KeyChange> releaseAll();

    [[nodiscard]] bool isDown(KeyCode code) const noexcept {
        return code < kKeyCodeCount && _counts[code] != 0;
    }

private:
    std::array<std::uint32_t, kKeyCodeCount> _counts{}; ///< surfaces that keep it down, by code
};

} // namespace ZorvaTouch::Tools
