#pragma once

#include "Shared/FrameList.h"
#include "Shared/Util/PropertyValue.h"
#include "Tools/Hosting/HostedService.h"

#include <cstdint>
#include <span>
#include <string>

namespace ZorvaTouch::Tools {

/// What a recording was made with, by the key of its metadata item: "Software", "Device", "ReportDescriptor"
/// and "Tunables". Docs/RecordingFormat.md has their values.
using RecordingNotes = PropertyValue::Dictionary;

/// Asks the service and its device.
/// @param withSerial  Whether the device's serial number is among them.
/// @throws std::bad_alloc
[[nodiscard]] RecordingNotes notesOf(const HostedService &service, bool withSerial);

/// Puts the notes in front of the frames, as metadata items with the first frame's time.
/// @param nowNs  Their time if there is no frame.
/// @throws std::bad_alloc
[[nodiscard]] FrameList withNotes(const RecordingNotes &notes, const FrameList &frames, std::uint64_t nowNs);

/// FNV-1a of 64 bits.
[[nodiscard]] std::uint64_t fnv1a64(std::span<const std::uint8_t> bytes) noexcept;

} // namespace ZorvaTouch::Tools
