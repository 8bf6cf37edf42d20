#pragma once

#include "Shared/HostEvent.h"
#include "Tools/Stimulus/EventNames.h"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// The events that a host has heard, the newest of them: more than a service's recording can hold.
class EventHistory {
public:
    static constexpr std::size_t kCapacity = 20'000;

    struct Entry {
        std::uint64_t timestamp; ///< host ticks
        std::optional<Gesture> gesture;
        std::string text; ///< as `jsonText`
    };

    void add(const HostEvent &event, std::optional<Gesture> gesture) {
        if (_entries.size() == kCapacity)
            _entries.pop_front();
        _entries.push_back({event.timestamp(), gesture, jsonText(event)});
    }

    [[nodiscard]] const std::deque<Entry> &entries() const noexcept { return _entries; }

private:
    std::deque<Entry> _entries;
};

} // namespace ZorvaTouch::Tools
