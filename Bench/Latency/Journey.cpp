#include "Bench/Latency/Journey.h"

#include <algorithm>

namespace ZorvaTouch::Bench {

double percentile(std::vector<double> &values, double share) {
    std::sort(values.begin(), values.end());
    const auto last = static_cast<double>(values.size() - 1);
    return values[static_cast<std::size_t>(share * last)];
}

} // namespace ZorvaTouch::Bench
