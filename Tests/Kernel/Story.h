#pragma once

#include "Shared/Util/PropertyValue.h"

#include <cstdint>

/// What an emulated device did, one JSON object a line on standard output, written out at once.
namespace ZorvaTouch::KernelTests {

/// Nanoseconds of the monotonic clock: what the kernel and the reports' readers count in too.
[[nodiscard]] std::uint64_t nowNs() noexcept;

/// Writes a line: {"event": `event`, ..., "ns": now}, keys in order.
void tell(const char *event, PropertyValue::Dictionary values = {});

} // namespace ZorvaTouch::KernelTests
