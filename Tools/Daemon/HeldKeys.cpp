#include "Tools/Daemon/HeldKeys.h"

namespace ZorvaTouch::Tools {

bool HeldKeys::take(KeyChange change) noexcept {
    if (change.code == kNoKey || change.code >= kKeyCodeCount)
        return false;
    std::uint32_t &count = _counts[change.code];
    if (change.isPressed)
        return ++count == 1;
    return count != 0 && --count == 0;
}

std::vector<KeyChange> HeldKeys::releaseAll() {
    std::vector<KeyChange> releases;
    for (std::size_t code = 0; code < kKeyCodeCount; ++code)
        if (_counts[code] != 0)
            releases.push_back({static_cast<KeyCode>(code), false});
    _counts.fill(0);
    return releases;
}

} // namespace ZorvaTouch::Tools
