#pragma once

namespace ZorvaTouch {

/// Runs what may run out of memory on behalf of the other side, which must not see an exception.
/// @return The body's result, or `failure` if it threw.
template <typename Result, typename Body> Result guarded(Result failure, const Body &body) noexcept {
    try {
        return body();
    } catch (...) { // the failure is the answer
        return failure;
    }
}

} // namespace ZorvaTouch
