#pragma once

#include "Shared/Frame.h"

#include <cstddef>
#include <cstdint>
#include <list>
#include <vector>

/// The frame list's rules in their plainest form, to compare the real one with.
namespace ZorvaTouch::Scripted {

/// A frame and a number that stays with it, so that equal frames can be told apart.
struct NumberedFrame {
    Frame frame;
    std::size_t number;
};

/// A linked list of frames with a position in it.
class ReferenceList {
public:
    void append(Frame frame) { _frames.push_back({std::move(frame), _nextNumber++}); }

    /// Trims as the rule says, walking from the newest frame to the oldest.
    /// @return Where the frame at `cursor`, or else the next kept one, is afterwards.
    std::size_t trim(std::uint64_t maxCount, std::size_t cursor);

    /// Sorts by time stamp, stable.
    /// @return Where the frame at `cursor` is afterwards.
    std::size_t sort(std::size_t cursor);

    [[nodiscard]] std::vector<Frame> frames() const;
    [[nodiscard]] std::size_t size() const { return _frames.size(); }

private:
    [[nodiscard]] std::vector<std::size_t> numbers() const;
    [[nodiscard]] std::size_t positionOf(std::size_t number) const;

    std::list<NumberedFrame> _frames;
    std::size_t _nextNumber = 0;
};

} // namespace ZorvaTouch::Scripted
