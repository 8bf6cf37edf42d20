#pragma once

#include "Host/Linux/BackOff.h"
#include "Host/Linux/DeviceTracker.h"
#include "Shared/Ports/Clock.h"
#include "Tools/Daemon/Surface.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <list>
#include <memory>
#include <string>

namespace ZorvaTouch::Tools {

/// How a device that the system has told of is made.
using DeviceFinder = std::function<DeviceMaker(const Linux::DeviceIdentity &)>;

/// Called as surfaces come and go, on the main thread.
struct SurfaceHooks {
    std::function<void(const SurfaceName &)> onComing; ///< before it is opened for the first time
    /// For each surface that worked and is about to be closed, its keys up.
    std::function<void(const SurfaceName &, const Surface &)> onEnding;
};

/// The surfaces that are there: opens each that comes, closes it when it goes, and tries again, ever less
/// often, when it fails in between.
///
/// Threads: the main thread.
class Surfaces final : public Linux::DeviceListener {
public:
    /// @param clock  Tells how long a surface has worked. Borrowed.
    Surfaces(SurfaceSurroundings surroundings, DeviceFinder finder, Ports::Clock &clock, SurfaceHooks hooks);
    /// Closes all of them.
    ~Surfaces() override;
    Surfaces(const Surfaces &) = delete;
    Surfaces &operator=(const Surfaces &) = delete;

    void onAdded(const Linux::DeviceIdentity &device) override;
    void onRemoved(const Linux::DeviceIdentity &device) override;
    void onChanged(const Linux::DeviceIdentity &device) override;

    /// Adds a surface that the system does not report.
    /// @param keyboard  Receives its keys. Borrowed.
    /// @param events    Where its accelerometer is; null: that of all surfaces.
    void add(const SurfaceName &name, DeviceMaker maker, Keyboard &keyboard,
             std::shared_ptr<Host::EventSystem> events = nullptr);

    /// Has every surface listen anew as soon as nothing is touched there.
    void reschedule();
    /// Lets go of every key.
    void suspend();
    /// Closes all of them.
    void closeAll();

    /// @param visit  Called for each surface that works, in the order in which they came.
    void forEach(const std::function<void(const SurfaceName &, const Surface &)> &visit) const;
    /// That are there, whether they work or not.
    [[nodiscard]] std::size_t count() const noexcept { return _entries.size(); }
    /// The first that another program uses; null: there is none.
    [[nodiscard]] const SurfaceName *inUse() const noexcept;

private:
    struct Entry {
        SurfaceName name;
        std::string syspath; ///< empty for those that the system does not tell of
        DeviceMaker maker;
        Keyboard &keyboard;
        std::shared_ptr<Host::EventSystem> events;
        std::unique_ptr<Surface> surface = {}; ///< null while it does not work
        std::uint64_t openedNs = 0;
        Linux::BackOff backOff = {}; ///< reset when the surface has worked for the longest delay
        Linux::LoopWatch retry = {};
        bool wantsReschedule = false;
        bool isInUse = false; ///< by another program, at the last attempt to open it
    };

    void add(Entry entry);
    void open(Entry &entry);
    void handleLoss(Entry &entry, const std::string &reason);
    void retryLater(Entry &entry);
    void close(Entry &entry);
    void rescheduleIdle();
    void rescheduleNow(Entry &entry);
    [[nodiscard]] SurfaceName nameOf(const Linux::DeviceIdentity &device) const;
    /// Appends a number if a surface that is there has the identity already.
    void makeUnique(std::string &id) const;
    [[nodiscard]] bool isTaken(const std::string &id) const noexcept;
    [[nodiscard]] std::uint64_t nowNs() noexcept;

    SurfaceSurroundings _surroundings;
    const DeviceFinder _finder;
    Ports::Clock &_clock;
    const SurfaceHooks _hooks;
    std::list<Entry> _entries; ///< which keep their places
    Linux::LoopWatch _rescheduling;
};

} // namespace ZorvaTouch::Tools
