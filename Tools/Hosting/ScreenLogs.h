#pragma once

#include "Shared/Ports/Log.h"

#include <memory>
#include <string_view>

namespace ZorvaTouch::Tools {

/// The log as programs show it to people: without the plug-in's error records about what is optional, which
/// are a missing accelerometer and real time that the system refuses. Everything works without either; in a
/// log that is kept the records have their text and level.
///
/// Threads: any.
class ScreenLogs final : public Ports::LogProvider {
public:
    /// @param logs  Where the other records go.
    explicit ScreenLogs(std::unique_ptr<Ports::LogProvider> logs);

    /// @throws std::bad_alloc
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

private:
    class Handle;

    const std::unique_ptr<Ports::LogProvider> _logs;
};

} // namespace ZorvaTouch::Tools
