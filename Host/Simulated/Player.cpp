#include "Host/Simulated/Player.h"

#include "Shared/Util/Numeric.h"
#include "Shared/Util/Ticks.h"

#include <algorithm>
#include <chrono>
#include <limits>
#include <utility>

namespace ZorvaTouch::Simulated {

using Host::MutexLock;

namespace {

constexpr std::uint64_t kLongestGapNs = 3'600'000'000'000;

struct Sample {
    float x, y, z; ///< g
};

/// The sample in an item of metadata, if it is one.
std::optional<Sample> sampleIn(const Frame &frame) {
    if (frame.key != "Accel")
        return std::nullopt;
    const PropertyValue *const x = frame.value.find("X");
    const PropertyValue *const y = frame.value.find("Y");
    const PropertyValue *const z = frame.value.find("Z");
    return x && y && z ? std::optional(Sample{x->toFloat(), y->toFloat(), z->toFloat()}) : std::nullopt;
}

void observe(const std::function<void(const Frame &)> &observer, const Frame &frame) {
    if (observer)
        observer(frame);
}

/// When frames are due, counted from the first one.
class Pace {
public:
    explicit Pace(double speed) noexcept : _speed(speed > 0 ? speed : 1) {}

    /// @return Nanoseconds after the first frame.
    std::uint64_t due(std::uint64_t timestampNs) noexcept {
        if (timestampNs > _lastNs)
            _recordedNs += std::min(timestampNs - _lastNs, kLongestGapNs);
        _lastNs = timestampNs;
        return Util::truncateToUint64(static_cast<double>(_recordedNs) / _speed);
    }

private:
    const double _speed;
    std::uint64_t _lastNs = std::numeric_limits<std::uint64_t>::max(); ///< nothing is later than the first
    std::uint64_t _recordedNs = 0;
};

} // namespace

FrameSource framesOf(FrameList frames) {
    return [list = std::move(frames), index = std::size_t{0}]() mutable -> std::optional<Frame> {
        return index < list.size() ? std::optional(list[index++].toFrame()) : std::nullopt;
    };
}

Player::Player(FrameSource frames, PlayerOutput output)
    : _frames(std::move(frames)), _output(std::move(output)) {}

Player::~Player() {
    stop();
    if (_thread)
        _thread->join();
}

// --- In lock-step ------------------------------------------------------------------------------------------

void Player::playAll(VirtualClock &clock) {
    _isLockStep = true;
    while (!isStopped()) {
        const std::optional<Frame> frame = _frames();
        if (!frame)
            return;
        clock.advanceToNanoseconds(frame->timestampNs);
        play(*frame, clock);
    }
}

// --- Live --------------------------------------------------------------------------------------------------

void Player::start(Host::Platform &platform, double speed) {
    {
        MutexLock lock(_lock);
        _isPlaying = true;
    }
    try {
        _thread =
            platform.startThread("player", [this, &platform, speed] { playLive(platform.clock(), speed); });
    } catch (...) {
        finish(nullptr);
        throw;
    }
}

void Player::playLive(Ports::Clock &clock, double speed) noexcept {
    std::exception_ptr failure;
    {
        MutexLock lock(_lock);
        _player = std::this_thread::get_id();
    }
    try {
        playAtPace(clock, speed);
    } catch (...) { // for whoever waits
        failure = std::current_exception();
    }
    finish(std::move(failure));
}

void Player::playAtPace(Ports::Clock &clock, double speed) {
    const Util::TickConverter ticks(clock);
    const std::uint64_t start = clock.nowTicks();
    Pace pace(speed);
    while (!isStopped()) {
        const std::optional<Frame> frame = _frames();
        if (!frame)
            return;
        if (waitUntil(start + ticks.machTimeFromNanoseconds(pace.due(frame->timestampNs)), clock))
            play(*frame, clock);
    }
}

bool Player::waitUntil(std::uint64_t ticks, Ports::Clock &clock) {
    const Util::TickConverter converter(clock);
    MutexLock lock(_lock);
    while (!_isStopped) {
        const std::uint64_t now = clock.nowTicks();
        if (now >= ticks)
            return true;
        const std::uint64_t leftNs =
            std::min(converter.nanosecondsFromMachTime(ticks - now) + 1, kLongestGapNs);
        _changed.wait_for(_lock, std::chrono::nanoseconds(leftNs));
    }
    return false;
}

void Player::finish(std::exception_ptr failure) noexcept {
    MutexLock lock(_lock);
    _isPlaying = false;
    _failure = std::move(failure);
    _changed.notify_all();
}

void Player::stop() noexcept {
    MutexLock lock(_lock);
    _isStopped = true;
    _changed.notify_all();
    while (_isPlaying && _player != std::this_thread::get_id())
        _changed.wait(_lock);
}

void Player::waitUntilFinished() {
    std::exception_ptr failure;
    {
        MutexLock lock(_lock);
        while (_isPlaying)
            _changed.wait(_lock);
        std::swap(failure, _failure);
    }
    if (failure)
        std::rethrow_exception(failure);
}

bool Player::isStopped() const {
    MutexLock lock(_lock);
    return _isStopped;
}

// --- Frames ------------------------------------------------------------------------------------------------

void Player::play(const Frame &frame, Ports::Clock &clock) {
    switch (frame.type) {
    case FrameType::InputReport:
        return playReport(frame, clock.nowTicks());
    case FrameType::Metadata:
        return playMetadata(frame, clock.nowTicks());
    case FrameType::State:
        return observe(_output.onState, frame);
    }
}

void Player::playReport(const Frame &frame, std::uint64_t timestamp) {
    _output.device->deliver(frame.data, timestamp);
    if (_isLockStep)
        _output.device->waitUntilHandled();
    observe(_output.onReport, frame);
}

void Player::playMetadata(const Frame &frame, std::uint64_t timestamp) {
    const std::optional<Sample> sample = sampleIn(frame);
    if (!sample)
        return observe(_output.onMetadata, frame);
    if (!_output.accelerometer)
        return;
    _output.accelerometer->deliver(sample->x, sample->y, sample->z, timestamp);
    if (_isLockStep)
        _output.accelerometer->waitUntilHandled();
}

} // namespace ZorvaTouch::Simulated
