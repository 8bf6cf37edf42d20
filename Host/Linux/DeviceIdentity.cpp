#include "Host/Linux/DeviceIdentity.h"

#include <charconv>
#include <limits>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

/// Takes one number and what ends it off the text; an `end` of 0 is the end of the text.
template <typename Number> std::optional<Number> takeNumber(std::string_view &text, char end) {
    std::uint32_t number = 0;
    const char *const last = text.data() + text.size();
    const auto [next, error] = std::from_chars(text.data(), last, number, 16);
    if (error != std::errc() || number > std::numeric_limits<Number>::max())
        return std::nullopt;
    if (end == '\0' ? next != last : next == last || *next != end)
        return std::nullopt;
    text.remove_prefix(static_cast<std::size_t>(next - text.data()) + (end == '\0' ? 0 : 1));
    return static_cast<Number>(number);
}

std::string valueOf(const UeventProperties &properties, std::string_view key) {
    const auto found = properties.find(key);
    return found == properties.end() ? std::string() : found->second;
}

} // namespace

const std::string &DeviceIdentity::stableId() const noexcept {
    if (!serial.empty())
        return serial;
    return physicalPath.empty() ? syspath : physicalPath;
}

std::optional<BusHidId> parseHidId(std::string_view text) {
    const auto bus = takeNumber<std::uint32_t>(text, ':');
    const auto vendor = bus ? takeNumber<std::uint16_t>(text, ':') : std::nullopt;
    const auto product = vendor ? takeNumber<std::uint16_t>(text, '\0') : std::nullopt;
    if (!product)
        return std::nullopt;
    return BusHidId{*bus, {*vendor, *product}};
}

std::optional<DeviceIdentity> makeIdentity(std::string devnode, std::string syspath, std::string hidSyspath,
                                           const UeventProperties &hidProperties) {
    const auto id = parseHidId(valueOf(hidProperties, "HID_ID"));
    if (!id || devnode.empty())
        return std::nullopt;
    return DeviceIdentity{.devnode = std::move(devnode),
                          .syspath = std::move(syspath),
                          .hidSyspath = std::move(hidSyspath),
                          .bus = id->bus,
                          .id = id->id,
                          .serial = valueOf(hidProperties, "HID_UNIQ"),
                          .physicalPath = valueOf(hidProperties, "HID_PHYS"),
                          .name = valueOf(hidProperties, "HID_NAME")};
}

} // namespace ZorvaTouch::Linux
