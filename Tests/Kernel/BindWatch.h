#pragma once

#include <optional>
#include <string>

namespace ZorvaTouch::KernelTests {

/// Hears from the kernel when a HID device has got its driver. Reports that are sent before that are lost,
/// although its node may be there.
///
/// Errors: std::system_error.
class BindWatch {
public:
    /// @param serial  Of the device; what is heard of others is passed over.
    explicit BindWatch(std::string serial);
    ~BindWatch();
    BindWatch(const BindWatch &) = delete;
    BindWatch &operator=(const BindWatch &) = delete;

    /// The device's folder below /sys when it has been bound, once each time; nothing if no such news waits.
    [[nodiscard]] std::optional<std::string> takeBound();
    /// Readable when news wait.
    [[nodiscard]] int descriptor() const noexcept { return _descriptor; }

private:
    const std::string _serial;
    const int _descriptor;
};

/// The hidraw node of a device in this folder of /sys, "/dev/hidraw0"; empty if it has none.
[[nodiscard]] std::string hidrawNode(const std::string &folder);

} // namespace ZorvaTouch::KernelTests
