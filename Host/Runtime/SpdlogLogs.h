#pragma once

#include "Shared/Ports/Log.h"

#include <cstdio>
#include <memory>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {

struct LogRecord;

/// A record as one line of text with its line break,
///
///     2024-05-01T12:30:00.125+02:00 default subsystem=org.zorva.hid.ZorvaTouch category=Algs TEXT
///
/// with its level as `debug`, `default` or `error`.
/// @throws std::bad_alloc
[[nodiscard]] std::string logLine(const LogRecord &record);

/// Logs to one stream, all handles to the same, a record as a `logLine`. Characters of the text that control
/// a terminal are escaped (`Util::printable`); line breaks at its end are left out.
///
/// Threads:  any. Records of several threads do not mix.
/// Realtime: no; `write` waits for the stream. For threads that must not wait there is `AsyncLogs`.
class SpdlogLogs final : public Ports::LogProvider {
public:
    /// @param minimum  Records of lower levels are dropped.
    /// @param stream   Borrowed; must outlive the provider and its handles.
    explicit SpdlogLogs(Ports::LogLevel minimum, std::FILE *stream = stderr);

    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

private:
    class Handle;

    Ports::LogLevel _minimum;
    std::FILE *_stream;
};

} // namespace ZorvaTouch::Host
