#include "Tools/Daemon/RecordingKeeper.h"

#include "Shared/RecordingContainer.h"
#include "Tools/Daemon/RecordingSaver.h"

#include <algorithm>
#include <exception>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

bool hasReports(const std::string &recording) {
    const FrameList frames = readRecordingContainer(recording).frames;
    return std::any_of(frames.begin(), frames.end(),
                       [](const FrameView &frame) { return frame.type == FrameType::InputReport; });
}

} // namespace

RecordingKeeper::RecordingKeeper(std::optional<std::string> file, DaemonListener &listener, DaemonLog log)
    : _file(std::move(file)), _listener(listener), _log(std::move(log)) {}

void RecordingKeeper::expect(const SurfaceName &name) {
    if (_file)
        slotOf(name);
}

void RecordingKeeper::save(const SurfaceName &name, const Surface &surface) noexcept {
    if (!_file)
        return;
    if (_isGivenUp)
        return _log.error({name.node, ": recording not saved, since a third signal has cut the end short"});
    try {
        Slot &slot = slotOf(name);
        const auto recording = surface.recording();
        if (!recording)
            return _log.error({name.node, ": there is no recording to save"});
        if (slot.isWritten && !hasReports(*recording))
            return;
        const std::size_t reports = saveRecordingFile(slot.file, *recording);
        slot.isWritten = true;
        _listener.onRecording(name, slot.file, reports);
    } catch (const std::exception &error) {
        _log.error({error.what()});
    }
}

RecordingKeeper::Slot &RecordingKeeper::slotOf(const SurfaceName &name) {
    const auto found = _slots.find(name.id);
    if (found != _slots.end())
        return found->second;
    return _slots.emplace(name.id, Slot{.file = fileOfSurface(*_file, _slots.size() + 1)}).first->second;
}

} // namespace ZorvaTouch::Tools
