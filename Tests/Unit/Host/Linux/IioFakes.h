#pragma once

#include "Host/Linux/IioNode.h"
#include "Host/Linux/UniqueFd.h"
#include "Plugin/ZorvaPlugIn.h"
#include "Shared/Ports/Log.h"

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Linux::Tests {

/// What happened, in order, line by line.
///
/// Threads: any.
class Story {
public:
    using Lines = std::vector<std::string>;

    void add(std::string line);
    /// Waits for so many lines, and takes all there are.
    [[nodiscard]] Lines take(std::size_t count);

private:
    std::mutex _lock;
    std::condition_variable _changed;
    Lines _lines;
};

/// Writes what is logged into a story: "error ...", "default ...", "debug ...".
class StoryLog final : public Ports::Log {
public:
    explicit StoryLog(Story &story) : _story(story) {}
    [[nodiscard]] bool isEnabled(Ports::LogLevel level) const noexcept override { return level >= minimum; }
    void write(Ports::LogLevel level, std::string_view text) noexcept override;

    std::atomic<Ports::LogLevel> minimum = Ports::LogLevel::Debug;

private:
    Story &_story;
};

/// A sensor's node, open or not, that a test feeds. Tells its story: "opened", "refused", "closed".
///
/// Threads: any, but for what a test sets, which is before somebody listens.
class FakeSensor {
public:
    explicit FakeSensor(Story &story) : _story(story) {}

    [[nodiscard]] IioOpener opener();
    /// To whoever has it open. Arrives in one read.
    void send(const std::vector<std::uint8_t> &scans);
    /// x, y, z in 1/1000 g, and a time, as SensorFolder has them.
    void send(std::int32_t x, std::int32_t y, std::int32_t z, std::int64_t nanoseconds);
    /// Its descriptor is readable and hung up, and every read fails like this; 0 is an end.
    void hangUp(int readError);

    std::deque<int> openErrors;      ///< what the next opens fail with; 0: not at all
    std::atomic<unsigned> reads = 0; ///< so far
    std::atomic<int> failure = -1;   ///< what every read fails with, if not -1

private:
    class Node;
    [[nodiscard]] OpenedIioNode open();

    Story &_story;
    std::mutex _lock;
    UniqueFd _far;
    int _endError = 0;
};

} // namespace ZorvaTouch::Linux::Tests
