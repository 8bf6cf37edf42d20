#pragma once

namespace ZorvaTouch::Tools {

/// What the program ends with.
enum ExitStatus : int {
    kExitDone = 0,
    kExitCheckFailed = 1, ///< a check that was asked for
    kExitError = 2,       ///< bad usage, or a file that cannot be read or written
};

} // namespace ZorvaTouch::Tools
