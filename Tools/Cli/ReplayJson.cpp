#include "Tools/Cli/ReplayJson.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"

#include <cstdint>
#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

void appendNumber(std::string &text, std::string_view label, std::uint64_t value) {
    text.append(label);
    Util::appendUnsigned(text, value);
}

void appendEvents(std::string &text, const HostEventList &events) {
    text.append(R"(,"events":[)");
    std::string_view separator;
    for (const auto &event : events) {
        text.append(separator).append(jsonText(*event));
        separator = ",";
    }
    text.push_back(']');
}

void appendDescriptions(std::string &text, const Replay &replay) {
    text.append(R"(,"touch":)");
    Util::appendJsonString(text, replay.touchDescription());
    text.append(R"(,"virtual":)");
    Util::appendJsonString(text, replay.virtualDescription());
}

void appendImage(std::string &text, const Replay &replay, bool describe) {
    const ReplayedFrame &frame = replay.frame();
    appendNumber(text, R"({"type":"image","n":)", frame.index);
    appendNumber(text, R"(,"frameNumber":)", frame.image.frameNumber);
    appendNumber(text, R"(,"timeMs":)", frame.image.timeMs);
    appendEvents(text, frame.events);
    if (describe)
        appendDescriptions(text, replay);
}

} // namespace

void appendReplayLine(std::string &text, const Replay &replay, bool describe) {
    const ReplayedFrame &frame = replay.frame();
    switch (frame.kind) {
    case InputKind::State:
    case InputKind::Metadata:
        return;
    case InputKind::Image:
        appendImage(text, replay, describe);
        break;
    case InputKind::Reset:
        appendNumber(text, R"({"type":"reset","n":)", frame.index);
        appendEvents(text, frame.events);
        break;
    case InputKind::Firmware:
        appendNumber(text, R"({"type":"firmware","n":)", frame.index);
        appendNumber(text, R"(,"eventCode":)", frame.eventCode);
        break;
    case InputKind::Unhandled:
        appendNumber(text, R"({"type":"unhandled","n":)", frame.index);
        break;
    }
    text.append("}\n");
}

void appendReplayEnd(std::string &text, const Replay &replay) {
    const Pipeline &pipeline = replay.pipeline();
    text.append(R"({"type":"end","EventStats":)");
    Util::appendJson(text, pipeline.algs().eventStats().statsDictionary());
    appendNumber(text, R"(,"ResetCount":)", pipeline.resetCount());
    appendNumber(text, R"(,"DisjointImageCount":)", pipeline.disjointImageCount());
    text.append("}\n");
}

void ReplayJson::begin(const std::string & /*title*/, const Replay & /*replay*/) {}

void ReplayJson::print(const Replay &replay) {
    appendReplayLine(_output.text(), replay, _describe);
    _output.wrote();
}

void ReplayJson::end(const Replay &replay) {
    appendReplayEnd(_output.text(), replay);
    _output.wrote();
}

} // namespace ZorvaTouch::Tools
