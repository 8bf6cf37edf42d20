#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Interface/Platform.h"
#include "Host/Objects/Accelerometer.h"
#include "Host/Simulated/Device.h"
#include "Host/Simulated/VirtualClock.h"
#include "Shared/Frame.h"
#include "Shared/FrameList.h"

#include <condition_variable>
#include <cstdint>
#include <exception>
#include <functional>
#include <memory>
#include <optional>
#include <thread>

namespace ZorvaTouch::Simulated {

/// Gives the next frame, or nothing at the end.
using FrameSource = std::function<std::optional<Frame>()>;

/// The frames of a recording, once, in their order.
[[nodiscard]] FrameSource framesOf(FrameList frames);

/// Where frames go. Observers run on the playing thread and may be empty.
struct PlayerOutput {
    Ref<Device> device;                     ///< gets the input reports
    Ref<Host::Accelerometer> accelerometer; ///< gets the metadata "Accel"; may be null

    /// A report has been delivered, and in lock-step handled or dropped.
    std::function<void(const Frame &frame)> onReport;
    /// Metadata other than "Accel" with the numbers X, Y and Z.
    std::function<void(const Frame &frame)> onMetadata;
    /// A state write; nobody else gets it.
    std::function<void(const Frame &frame)> onState;
};

/// Plays frames into a device and an accelerometer: either in lock-step, where time is virtual and every
/// frame has been handled before the next one comes, or live, at the recorded pace.
///
/// Threads: `stop` from any; everything else from one. Frames are asked for and observers called on the
///          calling thread in lock-step, on a thread of the player's own when live; there they may call
///          `stop`.
class Player {
public:
    /// @param frames  Asked one at a time, when the frame before has been played.
    /// @param output  Its device is not null.
    Player(FrameSource frames, PlayerOutput output);
    /// Stops.
    ~Player();
    Player(const Player &) = delete;
    Player &operator=(const Player &) = delete;

    /// Plays to the end, or until stopped, as fast as it goes: sets the clock to each frame's time, as far as
    /// that is still to come, delivers, and waits until the frame has been handled. Time stamps are the
    /// clock's.
    ///
    /// @param clock  The one that whoever gets the reports asks.
    /// @throws  what the frames or an observer throw
    void playAll(VirtualClock &clock);

    /// Plays on a thread of its own, the first frame at once and the others as far apart as recorded; a gap
    /// of more than an hour counts as an hour, a step back as nothing. Time stamps are the time of delivery.
    /// At most once.
    ///
    /// @param platform  Gives the thread and the clock. Borrowed until the player is stopped.
    /// @param speed     2 is twice as fast, infinite is at once; what is not above 0 is 1.
    /// @throws std::system_error
    void start(Host::Platform &platform, double speed = 1);

    /// Ends playing soon, even between frames that are far apart, and stays: nothing is played afterwards.
    /// Returns when the thread is gone; on the thread itself, and in lock-step, at once.
    void stop() noexcept;

    /// Waits until live playing has come to its end. Returns at once if it was not started.
    /// @throws  what the frames or an observer threw; once
    void waitUntilFinished();

private:
    void playLive(Ports::Clock &clock, double speed) noexcept;
    void playAtPace(Ports::Clock &clock, double speed);
    /// @return Whether it is time, rather than over.
    [[nodiscard]] bool waitUntil(std::uint64_t ticks, Ports::Clock &clock);
    void play(const Frame &frame, Ports::Clock &clock);
    void playMetadata(const Frame &frame, std::uint64_t timestamp);
    void playReport(const Frame &frame, std::uint64_t timestamp);
    [[nodiscard]] bool isStopped() const;
    void finish(std::exception_ptr failure) noexcept;

    const FrameSource _frames;
    const PlayerOutput _output;
    bool _isLockStep = false;
    std::unique_ptr<Host::Thread> _thread;

    mutable Host::Mutex _lock;
    std::condition_variable_any _changed;
    bool _isStopped ZORVA_GUARDED_BY(_lock) = false;
    bool _isPlaying ZORVA_GUARDED_BY(_lock) = false; ///< live
    std::thread::id _player ZORVA_GUARDED_BY(_lock); ///< the thread that plays live
    std::exception_ptr _failure ZORVA_GUARDED_BY(_lock);
};

} // namespace ZorvaTouch::Simulated
