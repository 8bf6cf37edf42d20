#pragma once

#include "Shared/Ports/Log.h"

#include <memory>
#include <string_view>
#include <utility>

namespace ZorvaTouch::Tools {

/// The plug-in's part of the daemon's log. At the level `default` the plug-in tells of each gesture, which in
/// a log that is kept is nobody's business: so its records of that level are there for those who debug, and
/// its errors for everybody.
///
/// Threads: any.
class PlugInLogs final : public Ports::LogProvider {
public:
    /// @param logs  Where the records go.
    explicit PlugInLogs(std::shared_ptr<Ports::LogProvider> logs) : _logs(std::move(logs)) {}

    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

private:
    class Handle;

    const std::shared_ptr<Ports::LogProvider> _logs;
};

} // namespace ZorvaTouch::Tools
