#pragma once

namespace ZorvaTouch::Linux {

/// Gives the pages of code back that are in memory since the program's start, most of which are never used
/// again: reading options, putting parts together. What is used comes back by itself, from the system's
/// cache. For programs that stay, before they lock what is in memory.
///
/// The code of libzorvahost stays, as tracers write their break points into it.
///
/// Threads: any, while others run.
void releaseStartUpCode() noexcept;

} // namespace ZorvaTouch::Linux
