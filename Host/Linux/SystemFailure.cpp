#include "Host/Linux/SystemFailure.h"

#include <string_view>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

std::string_view textOf(const char *literal) noexcept { return literal ? literal : std::string_view(); }

std::string reasonOf(const SystemFailure &failure) {
    if (failure.detail)
        return failure.detail;
    return failure.errorNumber == 0 ? "ended" : std::generic_category().message(failure.errorNumber);
}

} // namespace

bool operator==(const SystemFailure &left, const SystemFailure &right) noexcept {
    return left.errorNumber == right.errorNumber &&
           std::string_view(left.operation) == std::string_view(right.operation) &&
           textOf(left.detail) == textOf(right.detail);
}

std::string describe(const SystemFailure &failure) {
    return std::string(failure.operation) + ": " + reasonOf(failure);
}

} // namespace ZorvaTouch::Linux
