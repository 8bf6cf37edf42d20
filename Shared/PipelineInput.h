#pragma once

#include "Shared/Util/PropertyValue.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace ZorvaTouch {

/// Where inputs go: a pipeline, or something that stands in front of one.
///
/// Threads: the caller serialises all calls.
class PipelineInput {
public:
    virtual ~PipelineInput() = default;

    /// A state write by dotted key.
    /// @param timestamp  Host ticks, here and below.
    virtual void setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) = 0;

    /// One raw input report.
    /// @param data    Report bytes, report ID first. Borrowed for the call; may be null when `length` is 0.
    /// @param length  Any.
    virtual void handleInputReport(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length) = 0;

    /// A note that travels with the inputs.
    virtual void handleMetadata(std::uint64_t timestamp, const std::string &key,
                                const PropertyValue &value) = 0;
};

/// What can be asked of a pipeline.
class PipelineOutput {
public:
    virtual ~PipelineOutput() = default;

    /// Reads a state by dotted key; null for a key that is unknown.
    [[nodiscard]] virtual PropertyValue getState(const std::string &key) const = 0;
};

} // namespace ZorvaTouch
