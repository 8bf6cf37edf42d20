#pragma once

#include "Host/Linux/IioScan.h"
#include "Host/Linux/IioSysfs.h"

#include <optional>
#include <string>

namespace ZorvaTouch::Linux {

// Makes an accelerometer's buffer ready, through its attributes. All of it while the buffer is off and nobody
// else has the node open. What is thrown is IioFailure or std::bad_alloc.
//
// Threads: one at a time for a device.

/// Scans that wait in the kernel; when it is full the newest are dropped.
inline constexpr unsigned kIioBufferLength = 32;

/// Turns the three axes and the time stamp on, everything else off, and reads where they are in a scan.
[[nodiscard]] IioScan prepareScan(const IioSysfs &device);

/// Makes it sample by a trigger of its own if it needs one and has none.
void prepareTrigger(const IioSysfs &device);

/// Has time stamps taken from the monotonic clock.
/// @return False: they are by another clock, and of no use.
[[nodiscard]] bool prepareClock(const IioSysfs &device);

/// Makes room for kIioBufferLength scans, and each one wake its reader. A device that refuses keeps what it
/// has.
void prepareBuffer(const IioSysfs &device);

void startBuffer(const IioSysfs &device);
/// A device that is gone has stopped as well.
void stopBuffer(const IioSysfs &device) noexcept;

/// Asks for a sampling frequency, which a device may refuse or make another of. One that would stop sampling
/// altogether is taken back.
/// @param intervalUs  Of a sample, in microseconds. Any number; one that makes no sense asks for nothing.
/// @return What the device has then, as it says it, in Hz; nothing if it has no such attribute.
[[nodiscard]] std::optional<std::string> setSamplingInterval(const IioSysfs &device, double intervalUs);

} // namespace ZorvaTouch::Linux
