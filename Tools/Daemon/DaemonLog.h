#pragma once

#include "Host/Linux/SystemFailure.h"
#include "Shared/Ports/Log.h"

#include <initializer_list>
#include <memory>
#include <string_view>

namespace ZorvaTouch::Tools {

/// A log handle of the daemon: puts a record together from parts, and never fails.
///
/// Threads: any.
class DaemonLog {
public:
    using Parts = std::initializer_list<std::string_view>;

    /// @param category  The part of the daemon that speaks, "Surfaces".
    DaemonLog(Ports::LogProvider &logs, std::string_view category);

    void debug(Parts parts) const noexcept { write(Ports::LogLevel::Debug, parts); }
    void notice(Parts parts) const noexcept { write(Ports::LogLevel::Default, parts); }
    void error(Parts parts) const noexcept { write(Ports::LogLevel::Error, parts); }
    /// "WHAT: write: No such device".
    void error(std::string_view what, const Linux::SystemFailure &failure) const noexcept;

private:
    void write(Ports::LogLevel level, Parts parts) const noexcept;

    std::shared_ptr<Ports::Log> _log;
};

} // namespace ZorvaTouch::Tools
