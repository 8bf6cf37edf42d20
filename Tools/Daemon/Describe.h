#pragma once

#include "Tools/Daemon/DaemonOptions.h"
#include "Tools/Daemon/Surfaces.h"

#include <functional>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// What is there, for a bug report: the plug-in, what the system allows, accelerometers, and the surfaces
/// with what they say about themselves. A text of JSON, indented; `Docs/Daemon.md` has its fields.
///
/// What cannot be found out is told in the place of the answer. A device that does not answer keeps each of
/// its eleven questions waiting for up to five seconds.
///
/// @param file    The plug-in's.
/// @param finder  Makes the devices that the system tells of.
/// @param say     Told what takes long, one line each.
/// @throws std::system_error  The system's devices cannot be listed.
/// @throws std::runtime_error  The plug-in cannot be loaded.
[[nodiscard]] std::string describeSystem(const DaemonOptions &options, const std::string &file,
                                         const DeviceFinder &finder,
                                         const std::function<void(std::string_view)> &say);

} // namespace ZorvaTouch::Tools
