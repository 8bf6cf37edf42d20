#pragma once

#include "Shared/Util/Ticks.h"
#include "Tools/Daemon/ReportHistory.h"
#include "Tools/Daemon/Surface.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string>

namespace ZorvaTouch::Tools {

/// Hears of the device's end, on whichever thread it happens, and has the keys let go of right there.
class Surface::Observer final : public Linux::HidrawObserver,
                                public std::enable_shared_from_this<Surface::Observer> {
public:
    using OnLost = std::function<void(const std::string &reason)>;

    Observer(SurfaceSurroundings &surroundings, OnLost onLost, std::function<void()> onHeld);

    // The main thread.

    /// From now on the device is to be scheduled, and its keys are these. One that went while its end was no
    /// loss is lost now.
    void begin(std::shared_ptr<SurfaceKeys> keys);
    /// From now on the device's end is no loss.
    void finish() noexcept;
    /// From now on nobody wants to hear of anything.
    void forget() noexcept {
        _onLost = nullptr;
        _onHeld = nullptr;
    }
    /// Why opening failed, if it did.
    [[nodiscard]] std::optional<Linux::SystemFailure> openFailure() const;

    // Any thread.

    /// A key is held from now on.
    void tellHeld() noexcept;
    /// That the device has handed over so far.
    [[nodiscard]] std::uint64_t reports() const noexcept { return _reports.load(std::memory_order_relaxed); }

    /// The newest reports that the device has handed over.
    /// @throws std::bad_alloc
    [[nodiscard]] FrameList history() const { return _history.reports(); }
    [[nodiscard]] std::uint64_t nowNs() const noexcept {
        return _ticks.nanosecondsFromMachTime(_clock.nowTicks());
    }

    void onReport(std::uint64_t timestamp, std::span<const std::uint8_t> report) noexcept override {
        _reports.fetch_add(1, std::memory_order_relaxed);
        _history.add(_ticks.nanosecondsFromMachTime(timestamp), report);
    }
    void onGone(const Linux::SystemFailure &reason) noexcept override;
    void onFailure(const Linux::SystemFailure &failure) noexcept override;
    void onUnscheduled() noexcept override;

private:
    void lose(SurfaceEnd end, const char *what, const Linux::SystemFailure *why) noexcept;

    SurfaceSurroundings &_surroundings;
    Ports::Clock &_clock; ///< the process's, as the plug-in has it
    const Util::TickConverter _ticks;
    std::atomic<std::uint64_t> _reports{0};
    ReportHistory _history;
    std::function<void()> _onHeld; ///< the main thread's; empty when nobody wants to hear
    OnLost _onLost;                ///< the main thread's; empty once it was called or nobody wants to hear

    mutable Host::Mutex _lock;
    std::shared_ptr<SurfaceKeys> _keys ZORVA_GUARDED_BY(_lock); ///< null: not scheduled, or lost already
    std::optional<Linux::SystemFailure> _openFailure ZORVA_GUARDED_BY(_lock);
    std::optional<Linux::SystemFailure> _goneFor ZORVA_GUARDED_BY(_lock); ///< the device tells that only once
};

} // namespace ZorvaTouch::Tools
