#pragma once

#include "Host/Linux/IioNode.h"
#include "Host/Linux/IioScan.h"
#include "Host/Linux/IioSysfs.h"
#include "Host/Linux/SystemFailure.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace ZorvaTouch::Linux {

/// An accelerometer that is at work: its node is open, its buffer runs. Destroying it stops both.
///
/// Threads: one at a time.
class IioSession {
public:
    using Deliver = std::function<void(const AccelSample &sample)>;

    /// Reads in a row that find nothing, though there was word of something, until the device counts as
    /// failed.
    static constexpr unsigned kEmptyReadsUntilFailed = 8;

    /// @param device      The attributes. Borrowed; they outlive this.
    /// @param nodePath    For those who read of a failure.
    /// @param intervalUs  Between samples, in microseconds; the device's own unless told.
    /// @throws IioFailure  With what can be done about it, where that is known.
    /// @throws std::bad_alloc
    IioSession(const IioSysfs &device, const IioOpener &opener, const std::string &nodePath,
               std::optional<double> intervalUs);
    ~IioSession();
    IioSession(const IioSession &) = delete;
    IioSession &operator=(const IioSession &) = delete;

    /// Asks for another interval. The device may not take it.
    /// @throws as the constructor
    void setInterval(double intervalUs);
    /// In Hz, as the device says it; empty if it does not.
    [[nodiscard]] const std::string &frequency() const noexcept { return _frequency; }

    /// To be waited for; stays the session's.
    [[nodiscard]] int descriptor() const noexcept { return _node->descriptor(); }
    /// Delivers what waits. Time stamps by another clock than the monotonic one are left out.
    /// @param isBroken  The descriptor is said to be in an error, so it is ready for ever: finding nothing is
    /// the end.
    /// @return Why there will be no more, if so.
    [[nodiscard]] std::optional<SystemFailure> receive(bool isBroken, const Deliver &deliver);

private:
    [[nodiscard]] static std::unique_ptr<IioNode> open(const IioOpener &opener, const std::string &nodePath);
    void prepare(std::optional<double> intervalUs);
    [[nodiscard]] std::optional<SystemFailure> handleNothing(int errorNumber, bool isBroken) noexcept;
    void deliverScans(std::size_t size, const Deliver &deliver) const;

    const IioSysfs &_device;
    const std::unique_ptr<IioNode> _node;
    std::optional<IioScan> _scan;
    bool _isMonotonic = false;
    std::string _frequency;
    std::vector<std::uint8_t> _buffer; ///< room for all that the kernel keeps
    unsigned _emptyReads = 0;          ///< in a row
};

} // namespace ZorvaTouch::Linux
