#include "Host/Linux/UinputDevice.h"

#include "Host/Linux/VirtualKeyboard.h"

#include <fcntl.h>
#include <libevdev/libevdev-uinput.h>
#include <libevdev/libevdev.h>
#include <linux/input.h>

#include <cerrno>

namespace ZorvaTouch::Linux {
namespace {

struct Free {
    void operator()(libevdev *device) const noexcept { ::libevdev_free(device); }
};
using Description = std::unique_ptr<libevdev, Free>;

/// What the keyboard is like; null without memory.
Description describeKeyboard(const std::vector<std::uint16_t> &codes) noexcept {
    Description keyboard(::libevdev_new());
    if (!keyboard)
        return nullptr;
    ::libevdev_set_name(keyboard.get(), kKeyboardName);
    ::libevdev_set_id_bustype(keyboard.get(), BUS_VIRTUAL);
    ::libevdev_set_id_vendor(keyboard.get(), kKeyboardVendor);
    ::libevdev_set_id_product(keyboard.get(), kKeyboardProduct);
    ::libevdev_set_id_version(keyboard.get(), kKeyboardVersion);
    ::libevdev_enable_event_type(keyboard.get(), EV_REP); // the kernel repeats, at its own pace
    for (const std::uint16_t code : codes)
        ::libevdev_enable_event_code(keyboard.get(), EV_KEY, code, nullptr);
    return keyboard;
}

} // namespace

void UinputDevice::Unplug::operator()(libevdev_uinput *device) const noexcept {
    ::libevdev_uinput_destroy(device);
}

std::optional<SystemFailure> UinputDevice::plug(const std::vector<std::uint16_t> &codes,
                                                const std::string &path) noexcept {
    _uinput.reset(::open(path.c_str(), O_RDWR | O_CLOEXEC));
    if (!_uinput)
        return SystemFailure{"open", errno};
    const Description keyboard = describeKeyboard(codes);
    if (!keyboard)
        return SystemFailure{"describe a keyboard to", ENOMEM};
    libevdev_uinput *device = nullptr;
    if (const int result = ::libevdev_uinput_create_from_device(keyboard.get(), _uinput.get(), &device))
        return SystemFailure{"make a keyboard with", -result};
    _device.reset(device);
    return std::nullopt;
}

int UinputDevice::write(std::uint16_t type, std::uint16_t code, std::int32_t value) noexcept {
    return _device ? -::libevdev_uinput_write_event(_device.get(), type, code, value) : EBADF;
}

} // namespace ZorvaTouch::Linux
