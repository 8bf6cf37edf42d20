#pragma once

#include "Tools/Daemon/KeyMap.h"
#include "Tools/Stimulus/EventNames.h"

#include <cstdint>
#include <string>
#include <string_view>

/// What the daemon tells other programs: a line of JSON for each thing that happens. `Docs/Daemon.md`
/// promises their form. Texts are borrowed and may be any bytes; times are nanoseconds
/// of the monotonic clock.
namespace ZorvaTouch::Tools {

enum class SurfaceState {
    Added,   ///< it is there
    Opened,  ///< its gestures work
    Lost,    ///< they no longer do, for the reason given
    Failed,  ///< it cannot be opened, for the reason given; it is tried again as long as it is there
    Removed, ///< it is gone
};
struct SurfaceNews {
    SurfaceState state = SurfaceState::Added;
    std::string_view surface; ///< what stays the same when it is attached anew
    std::string_view node;
    std::string_view name;
    std::string_view reason; ///< of `Lost` and `Failed`, and not told otherwise
    std::uint64_t timeNs = 0;
};

struct GestureNews {
    std::string_view surface;
    Gesture gesture = Gesture::MayBegin;
    PixelRegion region = kPixelRegionNone;
    std::uint64_t timeNs = 0;
};

struct KeyNews {
    KeyChange change;
    bool isSent = true; ///< not when keys are only shown
    std::string_view surface;
    std::uint64_t timeNs = 0;
};

struct QuarantineNews {
    bool begins = true; ///< or it ends
    std::string_view surface;
    std::uint64_t suppressed = 0; ///< presses so far
    std::uint64_t timeNs = 0;
};

struct AccelerometerNews {
    bool isUsed = true; ///< or it is gone
    std::string_view name;
    std::uint64_t timeNs = 0;
};

struct SleepNews {
    bool begins = true; ///< or it ends
    std::uint64_t timeNs = 0;
};

struct RecordingNews {
    std::string_view file;
    std::string_view surface;
    std::uint64_t reports = 0; ///< input reports in the file
    std::uint64_t timeNs = 0;
};

/// Lines that were lost, since nobody read them in time.
struct DroppedNews {
    std::uint64_t lines = 0;
};

/// Appends a line with its line break.
/// @throws std::bad_alloc
void appendLine(std::string &text, const SurfaceNews &news);
void appendLine(std::string &text, const GestureNews &news);
void appendLine(std::string &text, const KeyNews &news);
void appendLine(std::string &text, const QuarantineNews &news);
void appendLine(std::string &text, const AccelerometerNews &news);
void appendLine(std::string &text, const SleepNews &news);
void appendLine(std::string &text, const RecordingNews &news);
void appendLine(std::string &text, const DroppedNews &news);

/// What `appendLine` appends.
template <typename News> [[nodiscard]] std::string lineOf(const News &news) {
    std::string text;
    appendLine(text, news);
    return text;
}

} // namespace ZorvaTouch::Tools
