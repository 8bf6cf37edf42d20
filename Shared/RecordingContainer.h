#pragma once

#include "Shared/FrameList.h"
#include "Shared/Util/JsonStream.h"
#include "Shared/Util/PropertyValue.h"

#include <cstddef>
#include <cstdint>
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

/// Text that is not a container. `what()` is "migrateSerializedContainer failed: " and the problem.
class ContainerError : public std::runtime_error {
public:
    /// Text that is not JSON.
    explicit ContainerError(const Util::JsonError &error);
    /// JSON that is not a container, or cannot be migrated.
    explicit ContainerError(const std::string &statedProblem,
                            std::optional<std::size_t> index = std::nullopt);

    std::string problem;                   ///< "invalid version"
    std::optional<std::size_t> frameIndex; ///< the frame or report that the migration stopped at, from 0
    std::string reason;                    ///< what the JSON parser found wrong; empty otherwise
    std::uint64_t offset = 0;              ///< bytes of the text before that; 0 otherwise
};

/// A container's frames and the version that it was written in.
struct RecordingContainer {
    std::uint64_t version; ///< 0, 1 or 2
    FrameList frames;      ///< in file order
};

/// Reads a container of any known version.
/// @throws FrameError, ContainerError  Nothing partial is kept.
[[nodiscard]] RecordingContainer readRecordingContainer(std::string_view jsonText);
/// The same for text that arrives piece by piece: needs memory for the frames and little else.
/// @throws FrameError, ContainerError  and what `pieces` throws.
[[nodiscard]] RecordingContainer readRecordingContainer(Util::TextPieces pieces);

/// Writes frames as a container of the current version, in list order, compact. Always succeeds: what JSON
/// cannot hold is replaced, see `Util::appendJson`.
[[nodiscard]] std::string writeRecordingContainer(const FrameList &frames);

/// Writes a container frame by frame.
class ContainerWriter {
public:
    ContainerWriter();

    /// Appends a frame. One of a kind that the format does not know is skipped.
    void append(const FrameView &frame);
    /// Ends the container.
    void finish();
    /// The text so far; may be taken away piece by piece.
    [[nodiscard]] std::string &text() noexcept { return _text; }

private:
    std::string _text;
    bool _isFirst = true;
};

/// Turns a parsed container into the current version.
/// @throws std::invalid_argument (FrameError for one frame)  with the stated message.
[[nodiscard]] PropertyValue migrateRecordingContainer(const PropertyValue &object);

} // namespace ZorvaTouch
