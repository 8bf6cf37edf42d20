#pragma once

#include <linux/uhid.h>

#include <cstdint>
#include <optional>
#include <span>
#include <string>

namespace ZorvaTouch::KernelTests {

/// What a device is known by.
struct DeviceIdentity {
    std::string name, serial;
    std::uint16_t vendor = 0x1234, product = 0xABCD;
};

/// A HID device that this process plays, through /dev/uhid. It is gone when this object is.
///
/// Errors: std::system_error with what was tried.
class UhidDevice {
public:
    UhidDevice();
    ~UhidDevice();
    UhidDevice(const UhidDevice &) = delete;
    UhidDevice &operator=(const UhidDevice &) = delete;

    /// Its device appears, some milliseconds later. There must be none.
    void create(const DeviceIdentity &identity, std::span<const std::uint8_t> reportDescriptor);
    /// Its device goes at once. There must be one.
    void destroy();

    /// Sends an input report, report ID first; lost while nobody listens.
    void sendInput(std::span<const std::uint8_t> report);
    /// Answers a request for a report; an `error`, an errno, instead of data if it is not 0.
    void answerGet(std::uint32_t request, std::uint16_t error, std::span<const std::uint8_t> report);
    void answerSet(std::uint32_t request, std::uint16_t error);

    /// What the kernel has to say next; nothing if nothing waits.
    [[nodiscard]] std::optional<uhid_event> read();
    /// Readable when something waits.
    [[nodiscard]] int descriptor() const noexcept { return _descriptor; }

private:
    void write(const uhid_event &event, const char *what);

    const int _descriptor;
};

} // namespace ZorvaTouch::KernelTests
