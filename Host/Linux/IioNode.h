#pragma once

#include "Host/Linux/HidrawNode.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <span>

namespace ZorvaTouch::Linux {

/// An open IIO node: where the scans of a device come out. Only one at a time can be open. Destroying it
/// closes it.
///
/// Threads: one at a time.
class IioNode {
public:
    virtual ~IioNode() = default;

    /// To be waited for; stays the node's. When the device goes it need not become ready.
    [[nodiscard]] virtual int descriptor() const noexcept = 0;
    /// The oldest scans that wait, as many whole ones as fit; never blocks. EAGAIN: none waits. ENODEV: the
    /// device is gone. A count of 0 is the end.
    [[nodiscard]] virtual IoResult read(std::span<std::uint8_t> buffer) noexcept = 0;
};

/// What became of opening one.
struct OpenedIioNode {
    std::unique_ptr<IioNode> node; ///< null: it failed
    int errorNumber = 0;           ///< why it failed
};

/// Opens a node. Does not throw.
using IioOpener = std::function<OpenedIioNode()>;

} // namespace ZorvaTouch::Linux
