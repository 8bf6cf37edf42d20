#include "Host/Linux/HidrawOpeners.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr std::size_t kLongestText = 256; // bytes, with the NUL: no device has a longer one

OpenedNode refusal(int errorNumber, const char *detail) noexcept {
    return {.node = nullptr, .errorNumber = errorNumber, .detail = detail};
}

OpenedNode lock(OpenedNode opened) noexcept {
    const int errorNumber = opened.node->lock().errorNumber;
    if (errorNumber == EWOULDBLOCK)
        return refusal(EBUSY, "in use by another program");
    return errorNumber == 0 ? std::move(opened) : refusal(errorNumber, nullptr);
}

/// @param errorNumber  Of the call that failed: a device that is being removed fails with ENODEV.
OpenedNode notHidraw(int errorNumber) noexcept {
    if (errorNumber == ENODEV)
        return refusal(ENODEV, nullptr);
    return refusal(ENOTTY, "not a hidraw device node");
}

OpenedNode otherDevice() noexcept { return refusal(ENODEV, "another device has taken the node"); }

/// Up to the first control character: sysfs cuts texts at line breaks, the node does not.
std::string_view comparable(std::string_view text) noexcept {
    const auto end = std::ranges::find_if(text, [](char c) { return static_cast<unsigned char>(c) < ' '; });
    return text.substr(0, static_cast<std::size_t>(end - text.begin()));
}

/// @param expected  Empty: any text will do. A text that cannot be read is not compared: older kernels do not
///                  provide all of them, and a device that is just going fails in what follows.
bool hasText(HidrawNode &node, HidrawText which, std::string_view expected) noexcept {
    std::array<std::uint8_t, kLongestText> buffer{};
    const IoResult result = node.text(which, buffer);
    if (expected.empty() || result.errorNumber != 0)
        return true;
    std::array<char, kLongestText> text{};
    const std::size_t count = std::min(result.count, buffer.size());
    std::transform(buffer.begin(), buffer.begin() + static_cast<std::ptrdiff_t>(count), text.begin(),
                   [](std::uint8_t byte) { return static_cast<char>(byte); });
    return comparable({text.data(), count}) == comparable(expected);
}

bool hasNumbers(std::uint64_t number, const HidrawInfo &info, const DeviceIdentity &device) noexcept {
    return (device.deviceNumber == 0 || device.deviceNumber == number) &&
           (device.bus == 0 || device.bus == info.bus) && device.id == HidId{info.vendor, info.product};
}

OpenedNode check(OpenedNode opened, const DeviceIdentity &device) noexcept {
    HidrawNode &node = *opened.node;
    std::uint64_t number = 0;
    HidrawInfo info;
    for (const IoResult result : {node.deviceNumber(number), node.info(info)})
        if (result.errorNumber != 0)
            return notHidraw(result.errorNumber);
    if (!hasNumbers(number, info, device) || !hasText(node, HidrawText::UniqueId, device.serial) ||
        !hasText(node, HidrawText::PhysicalPath, device.physicalPath))
        return otherDevice();
    return opened;
}

} // namespace

HidrawOpener openOnly(DeviceIdentity device, HidrawOpener opener) {
    return [device = std::move(device), opener = std::move(opener)]() noexcept {
        OpenedNode opened = opener();
        return opened.node ? check(std::move(opened), device) : opened;
    };
}

HidrawOpener openLocked(HidrawOpener opener) {
    return [opener = std::move(opener)]() noexcept {
        OpenedNode opened = opener();
        return opened.node ? lock(std::move(opened)) : opened;
    };
}

} // namespace ZorvaTouch::Linux
