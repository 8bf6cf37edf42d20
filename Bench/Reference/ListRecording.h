#pragma once

#include "Shared/Frame.h"

#include <cstdint>
#include <list>

namespace ZorvaTouch::Reference {

/// A bounded recording as it is first written down: a linked list of frames.
class ListRecording {
public:
    /// @param bound  As of `PipelineRecording`: trimmed to it when twice as many frames are there.
    explicit ListRecording(std::uint64_t bound) : _bound(bound) {}

    void append(Frame frame);
    [[nodiscard]] const std::list<Frame> &frames() const { return _frames; }

private:
    void trim();

    std::list<Frame> _frames;
    std::uint64_t _bound;
};

} // namespace ZorvaTouch::Reference
