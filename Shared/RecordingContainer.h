#pragma once

#include "Shared/FrameList.h"
#include "Shared/Util/PropertyValue.h"

#include <cstddef>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

/// The JSON text in which recordings are kept. Docs/RecordingFormat.md is its grammar.
namespace ZorvaTouch {

/// A frame that is not as it must be. `what()` is the stated message alone; `frameIndex` tells which frame,
/// from 0.
class FrameError : public std::invalid_argument {
public:
    FrameError(const std::string &message, std::size_t index)
        : std::invalid_argument(message), frameIndex(index) {}
    std::size_t frameIndex;
};

/// Text that is no container. `what()` begins with "migrateSerializedContainer failed: ".
class ContainerError : public std::runtime_error {
public:
    ContainerError(const std::string &message, std::optional<std::size_t> index, std::string jsonReason)
        : std::runtime_error(message), frameIndex(index), reason(std::move(jsonReason)) {}
    std::optional<std::size_t> frameIndex; ///< the frame or report that the migration stopped at, from 0
    std::string reason;                    ///< what the JSON parser found wrong; empty otherwise
};

/// A container's frames and the version that it was written in.
struct RecordingContainer {
    std::uint64_t version; ///< 0, 1 or 2
    FrameList frames;      ///< in file order
};

/// Reads a container of any known version.
/// @throws FrameError, ContainerError  Nothing partial is kept.
[[nodiscard]] RecordingContainer readRecordingContainer(std::string_view jsonText);

/// Writes frames as a container of the current version, in list order, compact. Always succeeds: what JSON
/// cannot hold is replaced, see `Util::appendJson`.
[[nodiscard]] std::string writeRecordingContainer(const FrameList &frames);

/// Turns a parsed container into the current version.
/// @throws std::invalid_argument (FrameError for one frame)  with the stated message.
[[nodiscard]] PropertyValue migrateRecordingContainer(const PropertyValue &object);

} // namespace ZorvaTouch
