#pragma once

#include "Tools/Cli/Environment.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// A progress bar on standard error, for work that takes more than a second. Does nothing when standard error
/// is not a terminal.
class Progress {
public:
    /// @param environment  Borrowed. Its standard output hides the bar before it writes.
    /// @param title        What is at work, short.
    Progress(Environment &environment, std::string title);
    Progress(const Progress &) = delete;
    Progress &operator=(const Progress &) = delete;
    ~Progress();

    /// Begins the next part of the work. The bar starts again; the second counts from the first part on.
    /// @param part   "reading". A literal.
    /// @param total  Steps of this part; 0 if unknown, then the bar shows megabytes.
    void begin(std::string_view part, std::uint64_t total);
    /// Shows how many steps of this part are done. Cheap enough to be called at each.
    void update(std::uint64_t done);

private:
    void draw(std::uint64_t done);
    void hide();
    [[nodiscard]] std::uint64_t nowNs() noexcept;

    Environment &_environment;
    std::string _title;
    std::string_view _part;
    std::uint64_t _total = 0;
    std::uint64_t _nextDrawNs;
    bool _isVisible = false;
};

} // namespace ZorvaTouch::Tools
