#pragma once

#include "Host/Linux/InputWriter.h"
#include "Host/Linux/SystemFailure.h"
#include "Host/Linux/UniqueFd.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

struct libevdev_uinput;

namespace ZorvaTouch::Linux {

/// The keyboard as the kernel's uinput has it.
class UinputDevice final : public InputWriter {
public:
    UinputDevice() noexcept = default;

    /// Plugs it in, once.
    /// @param codes  The keys it has.
    /// @param path   Of the kernel's uinput.
    /// @return Why it failed, if it did.
    [[nodiscard]] std::optional<SystemFailure> plug(const std::vector<std::uint16_t> &codes,
                                                    const std::string &path) noexcept;
    /// EBADF while it is not plugged in.
    [[nodiscard]] int write(std::uint16_t type, std::uint16_t code, std::int32_t value) noexcept override;

private:
    struct Unplug {
        void operator()(libevdev_uinput *device) const noexcept;
    };

    UniqueFd _uinput; ///< before the device, which goes through it
    std::unique_ptr<libevdev_uinput, Unplug> _device;
};

} // namespace ZorvaTouch::Linux
