#pragma once

#include "Shared/Ports/Log.h"

#include <memory>

namespace ZorvaTouch::Tools {

/// Keeps log records until somebody writes them, who can make room on the screen before.
///
/// Threads: any; `write` on one.
class DeferredLogs final : public Ports::LogProvider {
public:
    /// @param logs  Where the records go.
    explicit DeferredLogs(std::unique_ptr<Ports::LogProvider> logs);
    ~DeferredLogs() override;
    DeferredLogs(const DeferredLogs &) = delete;
    DeferredLogs &operator=(const DeferredLogs &) = delete;

    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

    [[nodiscard]] bool hasRecords() const;
    /// Writes what has been kept, in order.
    void write();

private:
    class Records;
    class Handle;

    const std::unique_ptr<Ports::LogProvider> _logs;
    const std::shared_ptr<Records> _records; ///< shared with the handles, which may outlive the provider
};

} // namespace ZorvaTouch::Tools
