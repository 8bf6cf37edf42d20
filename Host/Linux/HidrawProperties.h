#pragma once

#include "Host/Linux/HidrawNode.h"
#include "Shared/Util/PropertyValue.h"

namespace ZorvaTouch::Linux {

/// Reads what an open node tells of its device: "VendorID", "ProductID", "Product", "SerialNumber",
/// "PhysicalPath", "Transport" and "ReportDescriptor" (bytes). What the device does not have, or cannot be
/// read, is left out, as are empty texts and the transport of an unknown bus.
///
/// @return 0, or ENODEV: the device went away meanwhile, and `stored` is incomplete.
/// @throws std::bad_alloc
[[nodiscard]] int readProperties(HidrawNode &node, PropertyValue::Dictionary &stored);

} // namespace ZorvaTouch::Linux
