#pragma once

#include "Host/Runtime/Files.h"

#include <cstddef>

namespace ZorvaTouch::Host {

/// Columns of the terminal behind a stream, as they are now; 0 if there is none or it does not say.
[[nodiscard]] std::size_t terminalColumns(StandardStream stream) noexcept;

} // namespace ZorvaTouch::Host
