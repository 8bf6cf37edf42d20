#pragma once

namespace ZorvaTouch::Tools {

/// What the program ends with.
enum ExitStatus : int {
    kExitDone = 0,
    kExitCheckFailed = 1,  ///< a check that was asked for
    kExitError = 2,        ///< bad usage, or a file that cannot be read or written
    kExitClosedPipe = 141, ///< the reader of a pipe has closed it; a shell shows the same for SIGPIPE
};

} // namespace ZorvaTouch::Tools
