#include "Tools/Daemon/KeyQuarantine.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Tools {

static_assert(KeyQuarantine::kQuietNs >= KeyQuarantine::kWindowNs,
              "the press that ends a quarantine is within the limit");

KeyQuarantine::Result KeyQuarantine::filter(const KeyChanges &changes, std::uint64_t timeNs) noexcept {
    _nowNs = std::max(_nowNs, timeNs);
    Result result;
    for (const KeyChange change : changes) {
        if (change.isPressed)
            result.transition = judgePress();
        if (change.isPressed ? _isActive : change.code != _keyDown)
            continue;
        _keyDown = change.isPressed ? change.code : kNoKey;
        result.changes.add(change);
    }
    return result;
}

KeyQuarantine::Transition KeyQuarantine::judgePress() noexcept {
    const bool isQuiet = _nowNs - _attemptNs >= kQuietNs;
    const bool wasActive = _isActive;
    _attemptNs = _nowNs;
    _isActive = wasActive ? !isQuiet : exceedsLimit();
    if (!_isActive) {
        notePassed();
        return wasActive ? Transition::Ends : Transition::None;
    }
    _suppressed = wasActive ? _suppressed + 1 : 1;
    return wasActive ? Transition::None : Transition::Begins;
}

bool KeyQuarantine::exceedsLimit() const noexcept {
    if (_passed.empty() || _passedCount < _passed.size())
        return false;
    const std::uint64_t oldestNs = _passed[_passedCount % _passed.size()];
    return _nowNs - oldestNs < kWindowNs;
}

void KeyQuarantine::notePassed() noexcept {
    if (!_passed.empty())
        _passed[_passedCount++ % _passed.size()] = _nowNs;
}

bool KeyQuarantine::end() noexcept { return std::exchange(_isActive, false); }

} // namespace ZorvaTouch::Tools
