#include "Tests/Support/FramesReference.h"

#include <algorithm>
#include <set>
#include <string>

namespace ZorvaTouch::Scripted {

std::size_t ReferenceList::trim(std::uint64_t maxCount, std::size_t cursor) {
    const std::vector<std::size_t> before = numbers();
    std::uint64_t kept = 0;
    std::set<std::string> keys;
    for (auto it = _frames.end(); it != _frames.begin();) {
        --it;
        bool keep = false;
        if (it->frame.type == FrameType::State) {
            keep = keys.insert(it->frame.key).second;
        } else if (kept < maxCount) {
            keep = true;
            ++kept;
            keys.clear();
        }
        if (!keep)
            it = _frames.erase(it);
    }
    const std::vector<std::size_t> after = numbers();
    for (std::size_t i = cursor; i < before.size(); ++i) {
        if (std::find(after.begin(), after.end(), before[i]) != after.end())
            return positionOf(before[i]);
    }
    return after.size();
}

std::size_t ReferenceList::sort(std::size_t cursor) {
    const std::vector<std::size_t> before = numbers();
    _frames.sort([](const NumberedFrame &left, const NumberedFrame &right) {
        return left.frame.timestampNs < right.frame.timestampNs;
    });
    return cursor < before.size() ? positionOf(before[cursor]) : before.size();
}

std::vector<Frame> ReferenceList::frames() const {
    std::vector<Frame> frames;
    for (const NumberedFrame &numbered : _frames)
        frames.push_back(numbered.frame);
    return frames;
}

std::vector<std::size_t> ReferenceList::numbers() const {
    std::vector<std::size_t> numbers;
    for (const NumberedFrame &numbered : _frames)
        numbers.push_back(numbered.number);
    return numbers;
}

std::size_t ReferenceList::positionOf(std::size_t number) const {
    const std::vector<std::size_t> all = numbers();
    return static_cast<std::size_t>(std::find(all.begin(), all.end(), number) - all.begin());
}

} // namespace ZorvaTouch::Scripted
