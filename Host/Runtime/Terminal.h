#pragma once

#include "Host/Runtime/Files.h"

#include <cstddef>

namespace ZorvaTouch::Host {

/// Whether a stream is a terminal that understands more than text: TERM is not "dumb".
[[nodiscard]] bool isScreen(StandardStream stream) noexcept;
/// Whether colours are welcome there, too: NO_COLOR is not set, or empty.
[[nodiscard]] bool showsColours(StandardStream stream) noexcept;

/// Columns of the terminal behind a stream, as they are now; 0 if there is none or it does not say.
[[nodiscard]] std::size_t terminalColumns(StandardStream stream) noexcept;
/// Rows, likewise.
[[nodiscard]] std::size_t terminalRows(StandardStream stream) noexcept;

} // namespace ZorvaTouch::Host
