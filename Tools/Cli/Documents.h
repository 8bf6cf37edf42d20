#pragma once

#include "Shared/RecordingContainer.h"
#include "Tools/Cli/Environment.h"
#include "Tools/Cli/Progress.h"

#include <string>
#include <string_view>

/// Files as a command line names them: "-" is standard input or output. Failures are `CliError`.
namespace ZorvaTouch::Tools {

inline constexpr std::string_view kStandardStreamName = "-";

/// A file's name in messages: "standard input" for "-".
[[nodiscard]] std::string inputTitle(const std::string &name);

[[nodiscard]] std::string readDocument(const std::string &name, Environment &environment);

/// Reads a recording. Messages say which frame is wrong, if one is: "a.json: frame 17: invalid frame type".
/// @param progress  Shows a part "reading".
[[nodiscard]] RecordingContainer readRecording(const std::string &name, Environment &environment,
                                               Progress &progress);
/// The same with a bar of its own.
[[nodiscard]] RecordingContainer readRecording(const std::string &name, Environment &environment);

/// Writes a whole file; an older one of that name is replaced only when the new one is complete.
void writeDocument(const std::string &name, std::string_view text, Environment &environment);

/// Writes a recording in the current version.
/// @param progress  Shows a part "writing".
void writeRecording(const std::string &name, const FrameList &frames, Environment &environment,
                    Progress &progress);

} // namespace ZorvaTouch::Tools
