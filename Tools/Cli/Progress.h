#pragma once

#include "Tools/Cli/Environment.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace ZorvaTouch::Tools {

/// A progress bar on standard error, for work that takes more than a second. Does nothing when nobody
/// watches.
class Progress {
public:
    /// @param environment  Borrowed. Its standard output is told to hide the bar before it writes.
    /// @param title        What is at work, short.
    /// @param total        Steps of the whole work.
    Progress(Environment &environment, std::string title, std::size_t total);
    Progress(const Progress &) = delete;
    Progress &operator=(const Progress &) = delete;
    ~Progress();

    /// Says how many steps are done. Cheap enough to be called at each.
    void update(std::size_t done);

private:
    void draw(std::size_t done);
    void hide();
    [[nodiscard]] std::uint64_t nowNs() noexcept;

    Environment &_environment;
    std::string _title;
    std::size_t _total;
    std::uint64_t _nextDrawNs = 0;
    bool _isVisible = false;
};

} // namespace ZorvaTouch::Tools
