#include "Tools/Daemon/EndRequests.h"

namespace ZorvaTouch::Tools {

EndStep EndRequests::take(std::uint64_t nowNs) noexcept {
    switch (_state) {
    case State::Serving:
        _state = State::Ending;
        return EndStep::Begin;
    case State::Acknowledged:
        if (nowNs - _acknowledgedNs <= kHurryWithinNs) {
            _state = State::Hurried;
            return EndStep::Hurry;
        }
        [[fallthrough]];
    case State::Ending:
        _state = State::Acknowledged;
        _acknowledgedNs = nowNs;
        return EndStep::Acknowledge;
    case State::Hurried:
        break;
    }
    return EndStep::Ignore;
}

} // namespace ZorvaTouch::Tools
