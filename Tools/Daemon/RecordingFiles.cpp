#include "Tools/Daemon/RecordingFiles.h"

#include <algorithm>
#include <tuple>
#include <utility>

namespace ZorvaTouch::Tools {

std::string fileOfRecording(const std::string &file, std::size_t number) {
    if (number <= 1)
        return file;
    const std::size_t name = file.rfind('/') + 1; // 0 without a folder
    const std::size_t dot = file.rfind('.');
    const bool hasEnding = dot != std::string::npos && dot > name;
    std::string result = file;
    return result.insert(hasEnding ? dot : file.size(), "-" + std::to_string(number));
}

RecordingFiles::RecordingFiles(std::string file, std::size_t count)
    : _file(std::move(file)), _count(std::max<std::size_t>(count, 1)) {}

void RecordingFiles::expect(const std::string &surface) {
    if (!isKnown(surface))
        assign(surface);
}

std::optional<std::string> RecordingFiles::fileFor(const std::string &surface, bool hasReports) {
    const Slot *slot = current(surface);
    if (!slot && !hasReports && isKnown(surface))
        return std::nullopt;
    if (!slot)
        slot = &assign(surface);
    return fileOfRecording(_file, static_cast<std::size_t>(slot - _slots.data()) + 1);
}

void RecordingFiles::finish(const std::string &surface) {
    if (Slot *const slot = current(surface))
        slot->isFinished = true;
}

std::vector<std::string> RecordingFiles::names() const {
    std::vector<std::string> all;
    for (std::size_t number = 1; number <= _count; ++number)
        all.push_back(fileOfRecording(_file, number));
    return all;
}

RecordingFiles::Slot *RecordingFiles::current(const std::string &surface) {
    const auto found = std::ranges::find_if(
        _slots, [&](const Slot &slot) { return slot.surface == surface && !slot.isFinished; });
    return found == _slots.end() ? nullptr : &*found;
}

bool RecordingFiles::isKnown(const std::string &surface) const {
    return std::ranges::any_of(_slots, [&](const Slot &slot) { return slot.surface == surface; });
}

RecordingFiles::Slot &RecordingFiles::assign(const std::string &surface) {
    Slot slot{.surface = surface, .order = _assigned++};
    if (_slots.size() < _count)
        return _slots.emplace_back(std::move(slot));
    return oldest() = std::move(slot);
}

RecordingFiles::Slot &RecordingFiles::oldest() {
    return *std::ranges::min_element(
        _slots, {}, [](const Slot &slot) { return std::tuple(!slot.isFinished, slot.order); });
}

} // namespace ZorvaTouch::Tools
