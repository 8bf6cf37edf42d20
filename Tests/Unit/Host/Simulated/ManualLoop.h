#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>

namespace ZorvaTouch::Simulated {

/// A run loop that serves when the test says so, on the test's own thread.
class ManualLoop final : public ZorvaRunLoop {
public:
    ManualLoop();
    ManualLoop(const ManualLoop &) = delete;
    ManualLoop &operator=(const ManualLoop &) = delete;

    /// Serves the oldest source of that mode that is ready.
    /// @return Whether there was one.
    bool serveOne(const std::string &mode = "mode");
    [[nodiscard]] std::size_t sourceCount(const std::string &mode = "mode") const;

    int references = 1;
    bool isOutOfMemory = false; ///< adds no source

private:
    struct Entries;
    static const ZorvaRunLoopTable kTable;
    struct Source {
        std::string mode;
        ZorvaFunction perform;
        void *context;
        bool isReady;
    };

    std::map<std::uint64_t, Source> _sources;
    std::uint64_t _lastNumber = 0;
};

} // namespace ZorvaTouch::Simulated
