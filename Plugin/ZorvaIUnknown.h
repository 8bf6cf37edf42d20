#pragma once

#include "Plugin/ZorvaHIDService.h"
#include "Plugin/ZorvaPlugIn.h"

namespace ZorvaTouch::ZorvaIUnknown {

/// Tables whose functions find the service and forward to its operations.
///
/// The functions let no exception out. They hold a reference to the service while it works, so that a release
/// meanwhile, by whomever, does not take it away under its feet. A null interface pointer fails like an
/// operation that threw, without a log line.
[[nodiscard]] PlugInInterfaceTable plugInTable(ZorvaHIDService &service) noexcept;
[[nodiscard]] HidServiceInterfaceTable hidServiceTable(ZorvaHIDService &service) noexcept;

} // namespace ZorvaTouch::ZorvaIUnknown
