#include "Tests/Kernel/Numbers.h"

#include <charconv>
#include <stdexcept>
#include <string>
#include <system_error>

namespace ZorvaTouch::KernelTests {

std::uint32_t numberFrom(std::string_view text) {
    std::uint32_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc{} || end != text.data() + text.size())
        throw std::invalid_argument("no number: " + std::string(text));
    return number;
}

} // namespace ZorvaTouch::KernelTests
