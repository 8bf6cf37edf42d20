#pragma once

#include <utility>

namespace ZorvaTouch::Linux {

/// The owner of a descriptor: closes it in the end. May own none, which is -1.
///
/// Threads: as an integer.
class UniqueFd {
public:
    UniqueFd() noexcept = default;
    /// Takes the descriptor over; a negative one, as a failed call gives, is none.
    explicit UniqueFd(int descriptor) noexcept : _descriptor(descriptor < 0 ? -1 : descriptor) {}
    UniqueFd(UniqueFd &&other) noexcept : _descriptor(other.release()) {}
    UniqueFd &operator=(UniqueFd &&other) noexcept {
        reset(other.release());
        return *this;
    }
    ~UniqueFd() { reset(); }

    [[nodiscard]] int get() const noexcept { return _descriptor; }
    [[nodiscard]] explicit operator bool() const noexcept { return _descriptor >= 0; }
    /// Hands the descriptor over to the caller.
    [[nodiscard]] int release() noexcept { return std::exchange(_descriptor, -1); }
    /// Closes what it owns and takes over another. `errno` is left as it was.
    void reset(int descriptor = -1) noexcept;

private:
    int _descriptor = -1;
};

} // namespace ZorvaTouch::Linux
