#pragma once

#include "Host/Linux/HidrawNode.h"
#include "Host/Linux/UniqueFd.h"

#include <string>

namespace ZorvaTouch::Linux {

/// A hidraw node of the system.
class HidrawFile final : public HidrawNode {
public:
    /// Opens what is under that path, as "/dev/hidraw0", and keeps it from programs that are started. Reading
    /// is the only access it needs: feature reports can be asked for with it, and nothing is written. Never
    /// blocks; what is under the path may be anything.
    [[nodiscard]] static OpenedNode open(const std::string &path) noexcept;
    /// Opens it whenever it is asked to.
    /// @throws std::bad_alloc
    [[nodiscard]] static HidrawOpener opener(std::string path);

    explicit HidrawFile(UniqueFd descriptor) noexcept : _descriptor(std::move(descriptor)) {}

    [[nodiscard]] int descriptor() const noexcept override { return _descriptor.get(); }
    [[nodiscard]] IoResult read(std::span<std::uint8_t> buffer) noexcept override;
    [[nodiscard]] IoResult deviceNumber(std::uint64_t &stored) noexcept override;
    /// An advisory lock (`flock`) on the node's inode: it needs only access to the node, works across users
    /// and containers that share the node, and needs no other file.
    [[nodiscard]] IoResult lock() noexcept override;
    [[nodiscard]] IoResult info(HidrawInfo &stored) noexcept override;
    [[nodiscard]] IoResult text(HidrawText which, std::span<std::uint8_t> buffer) noexcept override;
    [[nodiscard]] IoResult reportDescriptor(std::span<std::uint8_t> buffer) noexcept override;
    [[nodiscard]] IoResult featureReport(std::span<std::uint8_t> buffer) noexcept override;

private:
    const UniqueFd _descriptor;
};

} // namespace ZorvaTouch::Linux
