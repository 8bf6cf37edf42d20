#include <cstdio>
#include <ctime>

// Prints what the process has used of a processor when it ends, in the form of libFuzzer's own statistics.
// Executions a second of that say how fast a target is, whatever else the machine does.

namespace {

class AtExit {
public:
    AtExit() = default;
    AtExit(const AtExit &) = delete;
    AtExit &operator=(const AtExit &) = delete;
    ~AtExit() {
        std::fprintf(stderr, "stat::processor_seconds: %.2f\n",
                     static_cast<double>(std::clock()) / CLOCKS_PER_SEC);
    }
};

const AtExit atExit;

} // namespace
