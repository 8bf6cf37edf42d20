#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <span>

namespace ZorvaTouch::Linux {

/// What a system call on a node came to.
struct IoResult {
    std::size_t count = 0; ///< bytes stored
    int errorNumber = 0;   ///< an errno; 0: it succeeded
};

/// What a HID device is, as its bus says it.
struct HidrawInfo {
    std::uint32_t bus = 0; ///< BUS_USB and its like
    std::uint16_t vendor = 0;
    std::uint16_t product = 0;
};

/// Texts that a HID device has; any may be empty.
enum class HidrawText { Name, PhysicalPath, UniqueId };

/// An open hidraw node: the system calls that a device makes on it. Destroying it closes it.
///
/// Once the device is gone reads fail with EIO, after the reports that were waiting, and everything else
/// with ENODEV.
///
/// Threads: any, several at a time.
class HidrawNode {
public:
    virtual ~HidrawNode() = default;

    /// To be waited for; stays the node's.
    [[nodiscard]] virtual int descriptor() const noexcept = 0;

    /// The oldest report that waits, report ID first, cut to the buffer; never blocks. EAGAIN: none waits.
    /// A count of 0 is the end. The buffer must not be empty.
    [[nodiscard]] virtual IoResult read(std::span<std::uint8_t> buffer) noexcept = 0;

    /// Stores the node's `dev_t`. ENOTTY: it is not a character device.
    [[nodiscard]] virtual IoResult deviceNumber(std::uint64_t &stored) noexcept = 0;
    /// Locks the node until it is closed, which the kernel does when the process ends in whatever way.
    /// EWOULDBLOCK: another open node is locked; never blocks.
    [[nodiscard]] virtual IoResult lock() noexcept = 0;
    [[nodiscard]] virtual IoResult info(HidrawInfo &stored) noexcept = 0;
    /// Stores the text with its NUL, or as much as fits without.
    [[nodiscard]] virtual IoResult text(HidrawText which, std::span<std::uint8_t> buffer) noexcept = 0;
    /// Stores the report descriptor, cut to the buffer.
    [[nodiscard]] virtual IoResult reportDescriptor(std::span<std::uint8_t> buffer) noexcept = 0;

    /// Asks the device for a feature report: its ID in the first byte of the buffer on the way in, the report
    /// with its ID on the way out. Blocks: 5 s with a device that does not answer.
    [[nodiscard]] virtual IoResult featureReport(std::span<std::uint8_t> buffer) noexcept = 0;
};

/// What became of opening a node.
struct OpenedNode {
    std::shared_ptr<HidrawNode> node; ///< null: it failed
    int errorNumber = 0;              ///< why it failed
    const char *detail = nullptr;     ///< as in `SystemFailure`
};

/// Opens a node, for reading only and without blocking. Does not throw.
using HidrawOpener = std::function<OpenedNode()>;

} // namespace ZorvaTouch::Linux
