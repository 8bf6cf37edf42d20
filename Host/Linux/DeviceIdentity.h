#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Linux {

/// Which make of device.
struct HidId {
    std::uint16_t vendor = 0;
    std::uint16_t product = 0;

    friend bool operator==(const HidId &, const HidId &) = default;
};

/// A HID device and its hidraw node, as the system describes them.
struct DeviceIdentity {
    std::string devnode;            ///< "/dev/hidraw0"
    std::string syspath;            ///< the node's; as long as it is there no other has the same
    std::string hidSyspath;         ///< of the HID device that the node belongs to
    std::uint64_t deviceNumber = 0; ///< the node's `dev_t`; 0: not known
    std::uint32_t bus = 0;          ///< BUS_USB and its like; 0: not known
    HidId id;
    std::string serial;       ///< may be empty
    std::string physicalPath; ///< where it is attached; may be empty
    std::string name;         ///< may be empty

    /// What stays the same when the device is attached anew: the serial number, or else the place where it is
    /// attached, or else the syspath, which does not stay.
    [[nodiscard]] const std::string &stableId() const noexcept;

    friend bool operator==(const DeviceIdentity &, const DeviceIdentity &) = default;
};

/// Properties of a device as the kernel names them, "HID_NAME".
using UeventProperties = std::map<std::string, std::string, std::less<>>;

/// What "HID_ID" says.
struct BusHidId {
    std::uint32_t bus = 0;
    HidId id;

    friend bool operator==(const BusHidId &, const BusHidId &) = default;
};

/// Reads "HID_ID": bus, vendor and product as hexadecimal numbers with colons between, as
/// "0003:00001234:0000ABCD".
/// @return Nothing if it is not of that form, or the numbers do not fit.
[[nodiscard]] std::optional<BusHidId> parseHidId(std::string_view text);

/// Puts an identity together. Texts that are missing are empty.
/// @param hidProperties  Of the HID device, not of its node.
/// @return Nothing without a node or an ID.
/// @throws std::bad_alloc
[[nodiscard]] std::optional<DeviceIdentity> makeIdentity(std::string devnode, std::string syspath,
                                                         std::string hidSyspath,
                                                         const UeventProperties &hidProperties);

} // namespace ZorvaTouch::Linux
