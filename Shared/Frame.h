#pragma once

#include "Shared/Util/PropertyValue.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch {

/// Kind of a captured call.
enum class FrameType : std::uint32_t {
    State = 0,
    InputReport = 1,
    Metadata = 2,
};

/// One captured call, on its own.
struct Frame {
    FrameType type = FrameType::State;
    std::uint64_t timestampNs = 0;  ///< capture time
    std::string key;                ///< of a state write or a metadata item; empty for reports
    PropertyValue value;            ///< likewise; null for reports
    std::vector<std::uint8_t> data; ///< the whole report, report ID first; empty for the other kinds

    friend bool operator==(const Frame &, const Frame &) = default;
};

/// One captured call, borrowed from a list: valid until the list is next changed.
struct FrameView {
    FrameType type;
    std::uint64_t timestampNs;
    std::string_view key;
    const PropertyValue &value;
    std::span<const std::uint8_t> data;

    [[nodiscard]] Frame toFrame() const {
        return {type, timestampNs, std::string(key), value, {data.begin(), data.end()}};
    }
};

} // namespace ZorvaTouch
