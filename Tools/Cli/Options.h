#pragma once

#include "Shared/Ports/Log.h"
#include "Shared/Util/PropertyValue.h"
#include "Tools/Cli/ExitStatus.h"
#include "Tools/Cli/LiveOptions.h"
#include "Tools/Cli/SynthOptions.h"

#include <cstdint>
#include <limits>
#include <optional>
#include <span>
#include <string>
#include <variant>
#include <vector>

namespace ZorvaTouch::Tools {

struct ReplayOptions {
    std::vector<std::string> files;
    float speed = std::numeric_limits<float>::infinity(); ///< infinity: without pauses
    std::vector<Setting> settings; ///< states to begin with; keys are the recognizer's, without a domain
    bool describe = false;
    bool json = false;
    std::optional<std::string> expectFile;
    Ports::LogLevel logLevel = Ports::LogLevel::Error;
};

struct InfoOptions {
    std::vector<std::string> files;
    bool json = false;
};

struct ShowOptions {
    std::string file;
    std::optional<std::uint64_t>
        frame; ///< index in the recording; nothing: the image with the largest signal
    bool raw = false;
};

struct ConvertOptions {
    std::string in, out;
};

struct TrimOptions {
    std::string in, out;
    std::uint64_t max = 0; ///< 1 or more
};

struct MakeOptions {
    std::string in, out;
};

/// Text that was asked for: help, version. Or the short help, if nothing was asked for.
struct AnswerOptions {
    std::string text;
    ExitStatus status = kExitDone; ///< text goes to standard error unless this is `kExitDone`
};

using Options = std::variant<ReplayOptions, InfoOptions, ShowOptions, ConvertOptions, TrimOptions,
                             MakeOptions, SynthOptions, HostOptions, DemoOptions, AnswerOptions>;

/// Reads a command line.
/// @param arguments  Without the program's name.
/// @throws CliError  for one that cannot be followed; the message ends in where to find help.
[[nodiscard]] Options parseOptions(std::span<const std::string> arguments);

} // namespace ZorvaTouch::Tools
