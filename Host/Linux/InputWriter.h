#pragma once

#include <cstdint>

namespace ZorvaTouch::Linux {

/// An input device of our own making, as far as events are written to it. Destroying it unplugs it.
///
/// Threads: one at a time.
class InputWriter {
public:
    virtual ~InputWriter() = default;
    /// Writes one event of linux/input.h.
    /// @return 0 or an errno.
    [[nodiscard]] virtual int write(std::uint16_t type, std::uint16_t code, std::int32_t value) noexcept = 0;
};

} // namespace ZorvaTouch::Linux
