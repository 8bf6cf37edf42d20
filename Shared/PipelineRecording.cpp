#include "Shared/PipelineRecording.h"

#include "Shared/RecordingContainer.h"
#include "Shared/Util/Numeric.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch {
namespace {

/// A recorded gap may be years long (a broken time stamp); nobody waits longer than an hour for a frame.
constexpr std::uint64_t kLongestSleepUs = 3'600'000'000;

FrameList framesFromJson(std::optional<std::string_view> jsonData) {
    if (!jsonData)
        throw std::invalid_argument("json not supplied");
    return readRecordingContainer(*jsonData).frames;
}

/// Where a stable sort by time takes the frame at `index`, which may be the end.
std::size_t indexWhenSorted(const FrameList &frames, std::size_t index) noexcept {
    if (index == frames.size())
        return index;
    const std::uint64_t timeNs = frames[index].timestampNs;
    std::size_t before = 0, at = 0;
    for (const FrameView &frame : frames) {
        before += frame.timestampNs < timeNs || (frame.timestampNs == timeNs && at < index);
        ++at;
    }
    return before;
}

} // namespace

PipelineRecording::PipelineRecording(Ports::Clock &clock) : PipelineRecording(FrameList(), clock) {}

PipelineRecording::PipelineRecording(std::optional<std::string_view> jsonData, Ports::Clock &clock)
    : PipelineRecording(framesFromJson(jsonData), clock) {}

PipelineRecording::PipelineRecording(const PipelineRecording &other)
    : PipelineInput(other), pipeline(other.pipeline), _clock(other._clock), _ticks(other._ticks),
      _frames(other._frames), _maxFrameCount(other._maxFrameCount) {}

PipelineRecording &PipelineRecording::operator=(const PipelineRecording &other) {
    if (this != &other)
        *this = PipelineRecording(other);
    return *this;
}

void PipelineRecording::setState(std::uint64_t timestamp, const std::string &key,
                                 const PropertyValue &value) {
    appendFrame({FrameType::State, _ticks.nanosecondsFromMachTime(timestamp), key, value, {}});
    if (pipeline)
        pipeline->setState(timestamp, key, value);
}

void PipelineRecording::handleInputReport(std::uint64_t timestamp, const std::uint8_t *data,
                                          std::size_t length) {
    _frames.appendReport(_ticks.nanosecondsFromMachTime(timestamp), {data, length});
    frameAppended();
    if (pipeline)
        pipeline->handleInputReport(timestamp, data, length);
}

void PipelineRecording::handleMetadata(std::uint64_t timestamp, const std::string &key,
                                       const PropertyValue &value) {
    appendFrame({FrameType::Metadata, _ticks.nanosecondsFromMachTime(timestamp), key, value, {}});
    if (pipeline)
        pipeline->handleMetadata(timestamp, key, value);
}

void PipelineRecording::appendFrame(Frame frame) {
    _frames.append(std::move(frame));
    frameAppended();
}

void PipelineRecording::frameAppended() {
    // Only at twice the bound, and then down to the bound: that makes trims rare.
    const bool isDue = _maxFrameCount != 0 && _frames.size() / 2 >= _maxFrameCount;
    try {
        if (isDue)
            _frames.trim(_maxFrameCount);
    } catch (...) {
        _frames.undoAppend();
        throw;
    }
    _play.valid = false;
}

void PipelineRecording::setMaxFrameCount(std::uint64_t count) {
    if (count != 0)
        trim(count);
    _maxFrameCount = count;
}

void PipelineRecording::trim(std::uint64_t maxCount) {
    const std::size_t keptFromHere = _play.valid ? _frames.countKept(maxCount, _play.position) : 0;
    _frames.trim(maxCount);
    _play.position = _frames.size() - keptFromHere;
}

void PipelineRecording::sort() {
    const std::size_t position = _play.valid ? indexWhenSorted(_frames, _play.position) : 0;
    _frames.sort();
    _play.position = position;
}

std::string PipelineRecording::json() {
    if (_maxFrameCount != 0)
        trim(_maxFrameCount);
    sort();
    return writeRecordingContainer(_frames);
}

PropertyValue PipelineRecording::migrateSerializedContainer(const PropertyValue &object) {
    return migrateRecordingContainer(object);
}

void PipelineRecording::playReset() {
    _play = {
        .valid = true, .position = 0, .startTimeMach = _clock->nowTicks(), .lastFrameTimeNs = std::nullopt};
}

bool PipelineRecording::playCanContinue() const noexcept {
    return _play.valid && _play.position < _frames.size();
}

void PipelineRecording::playNextFrame(float speed) {
    if (!playCanContinue())
        throw std::runtime_error("playback finished");
    // A copy: the pipeline may record into this very list.
    const Frame frame = _frames[_play.position].toFrame();
    ++_play.position;
    waitForFrame(frame.timestampNs, speed);
    _play.lastFrameTimeNs = frame.timestampNs;
    // The head as it is after the pause, in which the list may have changed.
    const std::uint64_t headNs = _frames.empty() ? frame.timestampNs : _frames.begin()->timestampNs;
    const std::uint64_t offsetNs = frame.timestampNs - headNs;
    forward(frame, _play.startTimeMach + _ticks.machTimeFromNanoseconds(offsetNs));
}

void PipelineRecording::waitForFrame(std::uint64_t timestampNs, float speed) {
    if (!_play.lastFrameTimeNs || timestampNs <= *_play.lastFrameTimeNs)
        return;
    const float factor = speed <= 0.0f ? 1.0f : speed; // NaN is not less: it is kept and makes every delay 0
    const float delayUs = static_cast<float>(timestampNs - *_play.lastFrameTimeNs) / factor / 1000.0f;
    const std::uint64_t sleepUs = Util::truncateToUint64(static_cast<double>(delayUs));
    if (sleepUs != 0)
        _clock->sleepMicroseconds(std::min(sleepUs, kLongestSleepUs));
}

void PipelineRecording::forward(const Frame &frame, std::uint64_t timestamp) {
    if (!pipeline)
        return;
    switch (frame.type) {
    case FrameType::State:
        return pipeline->setState(timestamp, frame.key, frame.value);
    case FrameType::InputReport:
        return pipeline->handleInputReport(timestamp, frame.data.data(), frame.data.size());
    case FrameType::Metadata:
        return pipeline->handleMetadata(timestamp, frame.key, frame.value);
    }
}

} // namespace ZorvaTouch
