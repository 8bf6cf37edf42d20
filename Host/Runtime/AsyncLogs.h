#pragma once

#include "Host/Runtime/AsyncWriter.h"
#include "Shared/Ports/Log.h"

#include <chrono>
#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {

/// A record on its way to where it is kept. Texts are borrowed.
struct LogRecord {
    std::chrono::system_clock::time_point time; ///< when it was written
    Ports::LogLevel level = Ports::LogLevel::Default;
    std::string_view subsystem;
    std::string_view category;
    std::string_view text; ///< printable, one line
};

/// A record as the bytes that are written for it.
/// @throws std::bad_alloc
using LogFormat = std::function<std::string(const LogRecord &record)>;

/// Logs to a writer by way of a bounded queue and a thread of its own (`zorva-log`), whatever the writer
/// leads to. At most `AsyncWriter::kCapacity` records wait; further ones are dropped, and an error record in
/// their place says how many. Of a text longer than `kLongestText` bytes the beginning is kept. Characters
/// that control a terminal are escaped (`Util::printable`); line breaks at the end are left out.
///
/// Threads:  any, but for the destructor.
/// Realtime: `write` never waits for the writer; it takes a lock with priority inheritance, and allocates.
class AsyncLogs final : public Ports::LogProvider {
public:
    static constexpr std::size_t kLongestText = 16'384;

    /// @param minimum  Records of lower levels are dropped.
    /// @param format   Called on the log's thread.
    /// @throws std::system_error  The system has no thread to give.
    AsyncLogs(Ports::LogLevel minimum, LogFormat format, std::shared_ptr<TextWriter> writer);
    /// Writes what waits; a reader that hangs is given up after a second. Handles that are
    /// left write nothing any more.
    ~AsyncLogs() override;
    AsyncLogs(const AsyncLogs &) = delete;
    AsyncLogs &operator=(const AsyncLogs &) = delete;

    /// @throws std::bad_alloc
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

private:
    class Output;
    class Handle;

    const Ports::LogLevel _minimum;
    const std::shared_ptr<Output> _output; ///< shared with the handles, which may outlive the provider
};

} // namespace ZorvaTouch::Host
