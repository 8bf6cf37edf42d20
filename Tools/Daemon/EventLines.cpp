#include "Tools/Daemon/EventLines.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"
#include "Tools/Daemon/IndentedJson.h"

#include <array>

namespace ZorvaTouch::Tools {
namespace {

/// In the order of `SurfaceState`.
constexpr std::array<std::string_view, 5> kSurfaceStateNames{"added", "opened", "lost", "failed", "removed"};

/// Writes the members of one object in the order of the calls.
class Line {
public:
    Line(std::string &text, std::string_view type) : _text(text) {
        _text.append(R"({"type":)");
        Util::appendJsonString(_text, type);
    }

    Line &add(std::string_view key, std::string_view value) {
        std::string shown;
        Util::appendJsonString(shown, value);
        begin(key).append(withoutControls(shown));
        return *this;
    }
    Line &add(std::string_view key, std::uint64_t value) {
        Util::appendUnsigned(begin(key), value);
        return *this;
    }
    Line &addBoolean(std::string_view key, bool value) {
        begin(key).append(value ? "true" : "false");
        return *this;
    }
    /// Null instead of an empty text.
    Line &addOrNull(std::string_view key, std::string_view value) {
        if (!value.empty())
            return add(key, value);
        begin(key).append("null");
        return *this;
    }

    void end() { _text.append("}\n"); }
    void endAt(std::uint64_t timeNs) { add("timeNs", timeNs).end(); }

private:
    std::string &begin(std::string_view key) {
        return _text.append(",\"").append(key).append("\":"); // keys are ours and need no escape
    }

    std::string &_text;
};

std::string_view nameOrNone(PixelRegion region) noexcept {
    return region == kPixelRegionNone ? std::string_view() : nameOf(region);
}

} // namespace

void appendLine(std::string &text, const SurfaceNews &news) {
    Line line(text, "surface");
    line.add("state", kSurfaceStateNames[static_cast<std::size_t>(news.state)])
        .add("surface", news.surface)
        .add("node", news.node)
        .add("name", news.name);
    if (news.state == SurfaceState::Failed || news.state == SurfaceState::Lost)
        line.add("reason", news.reason);
    line.endAt(news.timeNs);
}

void appendLine(std::string &text, const GestureNews &news) {
    Line(text, "gesture")
        .add("surface", news.surface)
        .add("gesture", nameOf(news.gesture))
        .addOrNull("region", nameOrNone(news.region))
        .endAt(news.timeNs);
}

void appendLine(std::string &text, const KeyNews &news) {
    Line(text, "key")
        .addOrNull("key", nameOfKey(news.change.code))
        .add("code", std::uint64_t{news.change.code})
        .add("state", std::string_view(news.change.isPressed ? "down" : "up"))
        .addBoolean("sent", news.isSent)
        .add("surface", news.surface)
        .endAt(news.timeNs);
}

void appendLine(std::string &text, const QuarantineNews &news) {
    Line(text, "quarantine")
        .add("state", std::string_view(news.begins ? "begins" : "ends"))
        .add("surface", news.surface)
        .add("suppressed", news.suppressed)
        .endAt(news.timeNs);
}

void appendLine(std::string &text, const AccelerometerNews &news) {
    Line(text, "accelerometer")
        .add("state", std::string_view(news.isUsed ? "used" : "gone"))
        .add("name", news.name)
        .endAt(news.timeNs);
}

void appendLine(std::string &text, const SleepNews &news) {
    Line(text, "sleep").add("state", std::string_view(news.begins ? "begins" : "ends")).endAt(news.timeNs);
}

void appendLine(std::string &text, const RecordingNews &news) {
    Line(text, "recording")
        .add("file", news.file)
        .add("surface", news.surface)
        .add("reports", news.reports)
        .endAt(news.timeNs);
}

void appendLine(std::string &text, const DroppedNews &news) {
    Line(text, "dropped").add("lines", news.lines).end();
}

} // namespace ZorvaTouch::Tools
