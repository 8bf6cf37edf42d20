#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace ZorvaTouch::Bench {

/// When the reports of one round were at each stage, in ns: written, read on the input thread, and arrived at
/// the callback on the queue's thread. One writer for each stage; read when all have arrived.
class Journey {
public:
    explicit Journey(std::size_t reports) : _written(reports), _read(reports), _arrived(reports) {}

    void written(std::size_t report, double timeNs) { _written[report] = timeNs; }
    void read(double timeNs) {
        if (_readCount < _read.size())
            _read[_readCount++] = timeNs;
    }
    void arrived(double timeNs) {
        const std::size_t count = _arrivedCount.load(std::memory_order_relaxed);
        if (count < _arrived.size())
            _arrived[count] = timeNs;
        _arrivedCount.store(count + 1, std::memory_order_release);
        _arrivedCount.notify_one();
    }
    /// Waits until every report has arrived.
    void waitForAll() const {
        for (std::size_t count = 0;
             (count = _arrivedCount.load(std::memory_order_acquire)) < _arrived.size();)
            _arrivedCount.wait(count);
    }

    /// From readable to the callback, one for each report.
    [[nodiscard]] std::vector<double> wholeWays() const { return differences(_written, _arrived); }
    /// From the input thread to the callback.
    [[nodiscard]] std::vector<double> handOvers() const { return differences(_read, _arrived); }

private:
    static std::vector<double> differences(const std::vector<double> &from, const std::vector<double> &to) {
        std::vector<double> result(from.size());
        for (std::size_t index = 0; index < from.size(); ++index)
            result[index] = to[index] - from[index];
        return result;
    }

    std::vector<double> _written, _read, _arrived;
    std::size_t _readCount = 0;
    std::atomic<std::size_t> _arrivedCount{0};
};

/// The value below which that share of the values lies. Sorts them.
[[nodiscard]] double percentile(std::vector<double> &values, double share);

} // namespace ZorvaTouch::Bench
