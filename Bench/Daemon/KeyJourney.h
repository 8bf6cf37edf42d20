#pragma once

#include "Bench/Rounds.h"

#include <atomic>
#include <cstddef>
#include <vector>

namespace ZorvaTouch::Bench {

/// How long reports take that press a key, from when they can be read to when the key is handed over, in ns.
///
/// Threads: `written` the writer's; `pressed` the key thread's; the rest when both are done.
class KeyJourney {
public:
    /// @param first  The number of the first report.
    KeyJourney(std::size_t first, std::size_t reports) : _first(first), _written(reports) {}

    void written(std::size_t report) {
        _written.at(report - _first).store(wallNs(), std::memory_order_release);
    }
    /// The key that this report presses is handed over now.
    void pressed(std::size_t report) {
        if (report >= _first && report - _first < _written.size())
            _ways.push_back(wallNs() - _written[report - _first].load(std::memory_order_acquire));
    }

    /// One for each key.
    [[nodiscard]] const std::vector<double> &ways() const noexcept { return _ways; }

private:
    const std::size_t _first;
    std::vector<std::atomic<double>> _written;
    std::vector<double> _ways;
};

} // namespace ZorvaTouch::Bench
