#pragma once

#include <algorithm>
#include <chrono>
#include <utility>

namespace ZorvaTouch::Linux {

/// How long to wait before each attempt to reach what has failed: 250 ms, then twice as long each time, at
/// most 30 s.
///
/// Threads: as an integer.
class BackOff {
public:
    static constexpr std::chrono::milliseconds kFirst{250};
    static constexpr std::chrono::milliseconds kLongest{30'000};

    /// The delay before the next attempt.
    [[nodiscard]] std::chrono::milliseconds next() noexcept {
        return std::exchange(_next, std::min(_next * 2, kLongest));
    }
    /// It works: after the next failure the delays restart at the shortest.
    void reset() noexcept { _next = kFirst; }

private:
    std::chrono::milliseconds _next = kFirst;
};

} // namespace ZorvaTouch::Linux
