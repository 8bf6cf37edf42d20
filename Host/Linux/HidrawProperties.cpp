#include "Host/Linux/HidrawProperties.h"

#include <linux/hidraw.h>
#include <linux/input.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <string>

namespace ZorvaTouch::Linux {
namespace {

constexpr std::size_t kLongestText = 256; // bytes, with the NUL: no device has a longer one

const char *transportOf(std::uint32_t bus) noexcept {
    switch (bus) {
    case BUS_USB:
        return "USB";
    case BUS_BLUETOOTH:
        return "Bluetooth";
    case BUS_VIRTUAL:
        return "Virtual";
    case BUS_I2C:
        return "I2C";
    case BUS_SPI:
        return "SPI";
    default:
        return nullptr;
    }
}

int readInfo(HidrawNode &node, PropertyValue::Dictionary &stored) {
    HidrawInfo info;
    const IoResult result = node.info(info);
    if (result.errorNumber != 0)
        return result.errorNumber;
    stored["VendorID"] = info.vendor;
    stored["ProductID"] = info.product;
    if (const char *const transport = transportOf(info.bus))
        stored["Transport"] = transport;
    return 0;
}

int readText(HidrawNode &node, HidrawText which, const char *key, PropertyValue::Dictionary &stored) {
    std::array<std::uint8_t, kLongestText> buffer{};
    const IoResult result = node.text(which, buffer);
    if (result.errorNumber != 0)
        return result.errorNumber;
    const auto end = buffer.begin() + static_cast<std::ptrdiff_t>(std::min(result.count, buffer.size()));
    const std::string text(buffer.begin(), std::find(buffer.begin(), end, std::uint8_t{0}));
    if (!text.empty())
        stored[key] = text;
    return 0;
}

int readDescriptor(HidrawNode &node, PropertyValue::Dictionary &stored) {
    PropertyValue::Bytes bytes(HID_MAX_DESCRIPTOR_SIZE);
    const IoResult result = node.reportDescriptor(bytes);
    if (result.errorNumber != 0)
        return result.errorNumber;
    bytes.resize(std::min(result.count, bytes.size()));
    stored["ReportDescriptor"] = std::move(bytes);
    return 0;
}

} // namespace

int readProperties(HidrawNode &node, PropertyValue::Dictionary &stored) {
    const std::array errorNumbers{
        readInfo(node, stored),
        readText(node, HidrawText::Name, "Product", stored),
        readText(node, HidrawText::UniqueId, "SerialNumber", stored),
        readText(node, HidrawText::PhysicalPath, "PhysicalPath", stored),
        readDescriptor(node, stored),
    };
    return std::ranges::find(errorNumbers, ENODEV) == errorNumbers.end() ? 0 : ENODEV;
}

} // namespace ZorvaTouch::Linux
