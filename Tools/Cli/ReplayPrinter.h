#pragma once

#include "Tools/Stimulus/Replay.h"

#include <string>

namespace ZorvaTouch::Tools {

/// Tells what a replay does, recording by recording.
class ReplayPrinter {
public:
    virtual ~ReplayPrinter() = default;

    /// Before a recording's first frame.
    /// @param title  The recording's name.
    virtual void begin(const std::string &title, const Replay &replay) = 0;
    /// After each frame.
    virtual void print(const Replay &replay) = 0;
    /// After a recording's last frame.
    virtual void end(const Replay &replay) = 0;
    /// After the last recording.
    virtual void finish() = 0;
};

} // namespace ZorvaTouch::Tools
