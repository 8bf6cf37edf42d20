#pragma once

#include "Host/Linux/HidrawDevice.h"
#include "Host/Linux/UniqueFd.h"

#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <vector>

namespace ZorvaTouch::Linux::Tests {

using Bytes = std::vector<std::uint8_t>;

/// A hidraw node without a device: reports come through a pair of sockets, and
/// every call fails as it is told.
class FakeNode final : public HidrawNode {
public:
    FakeNode();

    /// A report comes, from any thread.
    void send(const Bytes &report) const;
    /// The device goes: what was sent is still there, then comes the end.
    void unplug() { _far.reset(); }

    [[nodiscard]] int descriptor() const noexcept override { return _near.get(); }
    [[nodiscard]] IoResult read(std::span<std::uint8_t> buffer) noexcept override;
    [[nodiscard]] IoResult deviceNumber(std::uint64_t &stored) noexcept override;
    [[nodiscard]] IoResult lock() noexcept override { return {.errorNumber = lockError}; }
    [[nodiscard]] IoResult info(HidrawInfo &stored) noexcept override;
    [[nodiscard]] IoResult text(HidrawText which, std::span<std::uint8_t> buffer) noexcept override;
    [[nodiscard]] IoResult reportDescriptor(std::span<std::uint8_t> buffer) noexcept override;
    [[nodiscard]] IoResult featureReport(std::span<std::uint8_t> buffer) noexcept override;

    std::deque<int> readErrors; ///< what the next reads fail with
    int endError = 5;           ///< EIO; 0: the end is an empty read
    unsigned reads = 0;

    std::uint64_t number = 0xF300; ///< the node's
    int numberError = 0, lockError = 0;
    int infoError = 0, textError = 0, descriptorError = 0;
    HidrawInfo hidrawInfo{.bus = 3, .vendor = 0x1234, .product = 0xABCD};
    Bytes name{'T', 'o', 'u', 'c', 'h', 0}, uniqueId{'S', 'N', '1', 0},
        physicalPath{'u', 's', 'b', '-', '1', 0};
    Bytes descriptorBytes{0x06, 0x00, 0xFF};

    std::function<IoResult(std::span<std::uint8_t>)> onFeature; ///< answers feature reports

private:
    UniqueFd _near, _far;
};

/// Hands out fake nodes and counts how often it was asked.
class FakeOpener {
public:
    [[nodiscard]] HidrawOpener opener() {
        return [this] { return open(); };
    }
    [[nodiscard]] OpenedNode open();
    /// The node that was handed out last; null once it was closed.
    [[nodiscard]] std::shared_ptr<FakeNode> node() const { return _last.lock(); }

    unsigned opens = 0;
    std::deque<int> errors; ///< what the next opens fail with; 0: not at all
    std::function<void(FakeNode &)> prepare;

private:
    std::weak_ptr<FakeNode> _last;
};

/// Notes what a device says.
class FakeObserver final : public HidrawObserver {
public:
    void onGone(const SystemFailure &reason) noexcept override {
        gone.push_back(reason);
        if (whenGone)
            whenGone();
    }
    void onFailure(const SystemFailure &failure) noexcept override { failures.push_back(failure); }

    std::vector<SystemFailure> gone, failures;
    std::function<void()> whenGone;
};

/// Descriptors that this process has open.
[[nodiscard]] std::ptrdiff_t openDescriptors();

} // namespace ZorvaTouch::Linux::Tests
