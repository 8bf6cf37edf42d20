#include "Tests/Kernel/Story.h"

#include "Shared/Util/Json.h"

#include <chrono>
#include <cstdio>
#include <string>
#include <utility>

namespace ZorvaTouch::KernelTests {

std::uint64_t nowNs() noexcept {
    const auto sinceStart = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<std::uint64_t>(std::chrono::nanoseconds(sinceStart).count());
}

void tell(const char *event, PropertyValue::Dictionary values) {
    values.insert_or_assign("event", event);
    values.insert_or_assign("ns", nowNs());
    std::string line = Util::jsonText(std::move(values));
    line.append("\n");
    std::fwrite(line.data(), 1, line.size(), stdout);
    std::fflush(stdout);
}

} // namespace ZorvaTouch::KernelTests
