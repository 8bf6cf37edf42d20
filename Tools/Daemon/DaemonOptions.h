#pragma once

#include "Host/Linux/DeviceIdentity.h"
#include "Shared/Ports/Log.h"
#include "Tools/Cli/Options.h"
#include "Tools/Daemon/KeyMap.h"
#include "Tools/Daemon/KeyQuarantine.h"
#include "Tools/Daemon/RecordingFiles.h"
#include "Tools/Hosting/FingerSource.h"

#include <optional>
#include <span>
#include <string>
#include <variant>
#include <vector>

namespace ZorvaTouch::Tools {

/// A surface that is asked for: the path of its node, or somebody who touches a simulated one.
using DeviceOption = std::variant<std::string, SimulatedFinger>;

/// Which accelerometer is used.
struct AccelOption {
    enum class Choice {
        Any, ///< one that is there
        None,
        Named,
    };
    Choice choice = Choice::Any;
    std::string name; ///< of a named one: what it calls itself, its label or its node

    friend bool operator==(const AccelOption &, const AccelOption &) = default;
};

/// What the daemon is told when it is started.
struct DaemonOptions {
    std::vector<DeviceOption> devices;               ///< as given; empty: what the system finds
    std::vector<Linux::HidId> ids{{0x1234, 0xABCD}}; ///< which makes it looks for
    AccelOption accel;
    KeyMap keys;
    bool sendsKeys = true;                            ///< of real surfaces; shows them if false
    bool sendsSimulatedKeys = false;                  ///< the same for simulated surfaces; needs `sendsKeys`
    unsigned keyLimit = KeyQuarantine::kDefaultLimit; ///< presses per second and surface; 0: no limit
    bool showsEvents = false;                         ///< as lines of JSON
    bool waits = false;    ///< for surfaces that another program uses, rather than ending
    bool describe = false; ///< says what is there, and that is all
    std::optional<std::string> saveFile;
    RecordingLimits saveLimits;
    bool savesSerial = false; ///< recordings have the surface's serial number
    Ports::LogLevel logLevel = Ports::LogLevel::Default;
    std::optional<std::string> plugIn; ///< nothing: the one beside the program
};

/// What a command line asks for; `AnswerOptions` is help and the version.
using DaemonCommand = std::variant<DaemonOptions, AnswerOptions>;

/// Reads a command line.
/// @param arguments  Without the program's name.
/// @throws CliError  for one that cannot be followed; the message ends in where to find help.
[[nodiscard]] DaemonCommand parseDaemonOptions(std::span<const std::string> arguments);

} // namespace ZorvaTouch::Tools
