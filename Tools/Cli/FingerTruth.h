#pragma once

#include "Shared/Pixel.h"
#include "Synth/Stream.h"
#include "Tools/Cli/LiveSource.h"
#include "Tools/Stimulus/EventNames.h"

#include <cstdint>
#include <deque>
#include <optional>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {

/// What a simulated finger really does, known before it happens: the same stream once more, run ahead.
///
/// Times count from the stream's first frame, on the host's clock.
class FingerTruth {
public:
    explicit FingerTruth(const SimulatedFinger &finger);

    /// What the finger was doing when a gesture came out, "hold volume up" or "palm"; empty if nothing is
    /// known of it. That thing now counts as told. Gestures come in order of time.
    [[nodiscard]] std::string behind(Gesture gesture, std::uint64_t timeNs);

    /// Something that is over and that no gesture told of.
    struct Silence {
        std::uint64_t endNs;
        std::string what; ///< "palm"
        bool isMissed;    ///< a gesture was meant
    };
    /// Those that are over by now, each once.
    [[nodiscard]] std::vector<Silence> takeSilences(std::uint64_t timeNs);

private:
    /// One thing that the finger does.
    struct Deed {
        std::string kind; ///< as in labels, "DoubleTap"
        PixelRegion region;
        std::uint64_t startNs, endNs;
        bool isTold = false;
    };

    void lookAhead(std::uint64_t timeNs);
    void readLabel(const Frame &frame);
    [[nodiscard]] Deed *deedBehind(Gesture gesture, std::uint64_t timeNs);
    [[nodiscard]] static std::string textOf(const Deed &deed);

    Simulated::FrameSource _frames;
    std::uint64_t _startNs;
    std::uint64_t _aheadNs = 0; ///< every deed that ends before is known
    bool _isOver = false;       ///< the stream is
    /// End of the last contact, on the sensor's clock and on the host's: slides are told after it.
    std::uint64_t _contactEndMs = 0, _contactEndNs = 0;
    std::deque<Deed> _deeds;
};

} // namespace ZorvaTouch::Tools
