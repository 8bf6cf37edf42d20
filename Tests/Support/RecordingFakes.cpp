#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

namespace ZorvaTouch::Scripted {
namespace {

class CapturingLog final : public Ports::Log {
public:
    explicit CapturingLog(std::shared_ptr<LogSwitches> switches) : _switches(std::move(switches)) {}

    [[nodiscard]] bool isEnabled(Ports::LogLevel level) const noexcept override {
        return _switches->enabled[static_cast<std::size_t>(level)];
    }

    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        _switches->records.push_back({level, std::string(text)});
        if (_switches->records.size() >= _switches->recordsUntilSilence)
            _switches->enabled = {};
    }

private:
    std::shared_ptr<LogSwitches> _switches;
};

Frame frameFromShortHand(const std::string &token, std::uint64_t timestampNs) {
    const std::size_t equals = token.find('=');
    const bool isState = equals != std::string::npos;
    const std::uint64_t number = std::stoull(token.substr(isState ? equals + 1 : 1));
    if (isState)
        return stateFrame(timestampNs, token.substr(0, equals), number);
    if (token.front() == 'M')
        return metadataFrame(timestampNs, "m", number);
    EXPECT_EQ(token.front(), 'R') << "no short hand: " << token;
    return reportFrame(timestampNs, {static_cast<std::uint8_t>(number)});
}

std::string numberText(const PropertyValue &value) {
    const std::uint64_t *number = value.asUnsigned();
    return number ? std::to_string(*number) : "?";
}

void appendShortHand(std::string &text, const Frame &frame) {
    switch (frame.type) {
    case FrameType::State:
        text.append(frame.key).append("=").append(numberText(frame.value));
        break;
    case FrameType::InputReport:
        text.append("R").append(frame.data.size() == 1 ? std::to_string(frame.data.front()) : "?");
        break;
    case FrameType::Metadata:
        text.append("M").append(numberText(frame.value));
        break;
    }
}

} // namespace

std::vector<std::uint64_t> FakeClock::pausesUs() const {
    std::vector<std::uint64_t> pauses;
    std::copy_if(sleeps.begin(), sleeps.end(), std::back_inserter(pauses),
                 [](std::uint64_t us) { return us != 0; });
    return pauses;
}

std::shared_ptr<Ports::Log> CapturingLogProvider::openLog(std::string_view subsystem,
                                                          std::string_view category) {
    switches->opened.push_back(std::string(subsystem) + "/" + std::string(category));
    return std::make_shared<CapturingLog>(switches);
}

void CapturingInput::setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) {
    if (beforeNote)
        beforeNote();
    calls.push_back({FrameType::State, timestamp, key, value, {}});
}

void CapturingInput::handleInputReport(std::uint64_t timestamp, const std::uint8_t *data,
                                       std::size_t length) {
    if (beforeNote)
        beforeNote();
    calls.push_back(
        {FrameType::InputReport, timestamp, {}, {}, std::vector<std::uint8_t>(data, data + length)});
}

void CapturingInput::handleMetadata(std::uint64_t timestamp, const std::string &key,
                                    const PropertyValue &value) {
    if (beforeNote)
        beforeNote();
    calls.push_back({FrameType::Metadata, timestamp, key, value, {}});
}

std::vector<std::uint64_t> CapturingInput::timestamps() const {
    std::vector<std::uint64_t> times;
    for (const Call &call : calls)
        times.push_back(call.timestamp);
    return times;
}

Frame stateFrame(std::uint64_t timestampNs, std::string key, PropertyValue value) {
    return {FrameType::State, timestampNs, std::move(key), std::move(value), {}};
}

Frame metadataFrame(std::uint64_t timestampNs, std::string key, PropertyValue value) {
    return {FrameType::Metadata, timestampNs, std::move(key), std::move(value), {}};
}

Frame reportFrame(std::uint64_t timestampNs, std::vector<std::uint8_t> data) {
    return {FrameType::InputReport, timestampNs, {}, {}, std::move(data)};
}

std::vector<std::uint8_t> patternedReport(std::size_t length, std::uint8_t number) {
    std::vector<std::uint8_t> report(length);
    for (std::size_t i = 0; i < length; ++i)
        report[i] = static_cast<std::uint8_t>(number + length + 3 * i + i / 256);
    return report;
}

std::vector<Frame> framesOf(const FrameList &list) {
    std::vector<Frame> frames;
    for (const FrameView frame : list)
        frames.push_back(frame.toFrame());
    return frames;
}

std::vector<Frame> framesFromShortHand(std::string_view text) {
    std::vector<Frame> frames;
    std::istringstream tokens{std::string(text)};
    for (std::string token; tokens >> token;) {
        const std::size_t at = token.find('@');
        const std::uint64_t time =
            at == std::string::npos ? frames.size() + 1 : std::stoull(token.substr(at + 1));
        frames.push_back(frameFromShortHand(token.substr(0, at), time));
    }
    return frames;
}

FrameList listFromShortHand(std::string_view text) {
    FrameList list;
    for (Frame &frame : framesFromShortHand(text))
        list.append(std::move(frame));
    return list;
}

std::string shortHand(const std::vector<Frame> &frames) {
    std::string text;
    for (const Frame &frame : frames) {
        if (!text.empty())
            text += ' ';
        appendShortHand(text, frame);
    }
    return text;
}

std::string shortHand(const FrameList &list) { return shortHand(framesOf(list)); }

} // namespace ZorvaTouch::Scripted
