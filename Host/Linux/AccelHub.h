#pragma once

#include "Host/Linux/AccelChoice.h"
#include "Host/Linux/IioNode.h"
#include "Host/Objects/EventSystem.h"
#include "Shared/Ports/Log.h"

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Linux {

/// Category of what is said about accelerometers.
inline constexpr std::string_view kLogCategoryAccelerometer = "Accelerometer";

class IioAccelerometer;

/// Keeps the accelerometer of choice in an event system: none or one of those that a monitor tells of. When
/// it goes the next one that fits takes its place.
///
/// Threads: one at a time, the monitor's. Taking one out does not wait for its sensor; the end of this does.
class AccelHub final : public AccelListener {
public:
    /// Makes an opener for a node, as "/dev/iio:device0".
    using Nodes = std::function<IioOpener(const std::string &devnode)>;

    /// @param log       Of kLogCategoryAccelerometer, written to on other threads as well.
    /// @param onChange  Called when there is an accelerometer that was not there: services schedule anew to
    /// use it. Not
    ///                  called when one goes and nothing takes its place. May be empty.
    /// @param nodes     The system's unless told.
    AccelHub(std::shared_ptr<Host::EventSystem> system, AccelChoice choice, std::shared_ptr<Ports::Log> log,
             std::function<void()> onChange, Nodes nodes = systemNodes());
    /// Takes it out of the system.
    ~AccelHub() override;
    AccelHub(const AccelHub &) = delete;
    AccelHub &operator=(const AccelHub &) = delete;

    [[nodiscard]] static Nodes systemNodes();

    /// Throws what `onChange` throws, after the change was made, and std::bad_alloc. One that cannot be used
    /// is told in the log.
    void onAdded(const AccelIdentity &accelerometer) override;
    void onRemoved(const AccelIdentity &accelerometer) override;

    /// The one in the system, if there is one.
    [[nodiscard]] const std::optional<AccelIdentity> &chosen() const noexcept { return _chosen; }

private:
    void choose();
    void takeOut();
    [[nodiscard]] bool use(const AccelIdentity &accelerometer);
    void say(Ports::LogLevel level, const std::string &line) const noexcept;

    const std::shared_ptr<Host::EventSystem> _system;
    const AccelChoice _choice;
    const std::shared_ptr<Ports::Log> _log;
    const std::function<void()> _onChange;
    const Nodes _nodes;
    std::vector<AccelIdentity> _candidates; ///< that fit, by syspath
    std::optional<AccelIdentity> _chosen;
    std::unique_ptr<IioAccelerometer> _accelerometer; ///< the chosen one
    std::vector<std::unique_ptr<IioAccelerometer>> _leaving;
};

} // namespace ZorvaTouch::Linux
