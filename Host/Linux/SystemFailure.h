#pragma once

#include <string>

namespace ZorvaTouch::Linux {

/// An operation of the system that failed, and why.
struct SystemFailure {
    const char *operation;        ///< a literal: "open", "read"
    int errorNumber;              ///< an errno; 0: it ended, without an error
    const char *detail = nullptr; ///< a literal that says more than the errno's text; null: that text

    friend bool operator==(const SystemFailure &left, const SystemFailure &right) noexcept;
};

/// One line for people: "read: Input/output error", or the detail in the place of the errno's text.
/// @throws std::bad_alloc
[[nodiscard]] std::string describe(const SystemFailure &failure);

} // namespace ZorvaTouch::Linux
