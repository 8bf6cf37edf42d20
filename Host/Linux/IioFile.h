#pragma once

#include "Host/Linux/IioNode.h"
#include "Host/Linux/UniqueFd.h"

#include <string>
#include <utility>

namespace ZorvaTouch::Linux {

/// An IIO node of the system.
class IioFile final : public IioNode {
public:
    /// Opens what is under that path, as "/dev/iio:device0", whenever it is asked to, and keeps it from
    /// programs that are started.
    /// @throws std::bad_alloc
    [[nodiscard]] static IioOpener opener(std::string path);

    explicit IioFile(UniqueFd descriptor) noexcept : _descriptor(std::move(descriptor)) {}

    [[nodiscard]] int descriptor() const noexcept override { return _descriptor.get(); }
    [[nodiscard]] IoResult read(std::span<std::uint8_t> buffer) noexcept override;

private:
    const UniqueFd _descriptor;
};

} // namespace ZorvaTouch::Linux
