#pragma once

#include "Host/Linux/DeviceIdentity.h"
#include "Host/Linux/HidrawNode.h"

namespace ZorvaTouch::Linux {

/// Opens a node only while it belongs to one device. Names and numbers of nodes are reused: between a
/// device's removal and the message about it another device may have taken its node.
///
/// The open node must be a character device that answers as a hidraw node does, with the device number, the
/// bus, the vendor, the product, the serial number and the physical path of the identity, as far as the
/// identity has them. A node that is not refused with ENODEV (another device) or ENOTTY (not a hidraw node);
/// nothing is read from it or written to it.
///
/// @param device  As the system described it.
/// @param opener  Opens its node.
/// @throws std::bad_alloc  Only now; the opener that is returned does not throw.
[[nodiscard]] HidrawOpener openOnly(DeviceIdentity device, HidrawOpener opener);

/// Opens a node and locks it, so that of several programs that do so one has it. EBUSY: another program has
/// locked it.
/// @throws std::bad_alloc  Only now; the opener that is returned does not throw.
[[nodiscard]] HidrawOpener openLocked(HidrawOpener opener);

} // namespace ZorvaTouch::Linux
