#pragma once

namespace ZorvaTouch::Linux {

/// Lets the null device take the place of standard streams that are closed. Otherwise the next thing that is
/// opened would get their numbers, a device say, and what is meant for people would be written to it. First
/// thing in `main`.
void fillStandardStreams() noexcept;

} // namespace ZorvaTouch::Linux
