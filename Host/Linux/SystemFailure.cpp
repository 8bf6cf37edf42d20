#include "Host/Linux/SystemFailure.h"

#include <string_view>
#include <system_error>

namespace ZorvaTouch::Linux {

bool operator==(const SystemFailure &left, const SystemFailure &right) noexcept {
    return left.errorNumber == right.errorNumber &&
           std::string_view(left.operation) == std::string_view(right.operation);
}

std::string describe(const SystemFailure &failure) {
    const std::string reason =
        failure.errorNumber == 0 ? "ended" : std::generic_category().message(failure.errorNumber);
    return std::string(failure.operation) + ": " + reason;
}

} // namespace ZorvaTouch::Linux
