#include "Host/Runtime/SteadyClock.h"

#include <algorithm>
#include <chrono>
#include <limits>
#include <thread>

namespace ZorvaTouch::Host {

std::uint64_t SteadyClock::nowTicks() noexcept {
    const auto sinceBoot = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<std::uint64_t>(
        std::chrono::duration_cast<std::chrono::nanoseconds>(sinceBoot).count());
}

void SteadyClock::sleepMicroseconds(std::uint64_t durationUs) noexcept {
    constexpr auto kLongest = static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max());
    std::this_thread::sleep_for(
        std::chrono::microseconds(static_cast<std::int64_t>(std::min(durationUs, kLongest))));
}

} // namespace ZorvaTouch::Host
