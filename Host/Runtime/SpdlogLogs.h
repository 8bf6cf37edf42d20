#pragma once

#include "Shared/Ports/Log.h"

#include <cstdio>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {

/// Logs to one stream, all handles to the same. A record is
///
///     2024-05-01T12:30:00.125+02:00 default subsystem=org.zorva.hid.ZorvaTouch category=Algs TEXT
///
/// with its level as `debug`, `default` or `error`; the text may go on over further lines.
///
/// Threads: any. Records of several threads do not mix.
class SpdlogLogs final : public Ports::LogProvider {
public:
    /// @param minimum  Records of lower levels are dropped.
    /// @param stream   Borrowed; must outlive the provider and its handles.
    explicit SpdlogLogs(Ports::LogLevel minimum, std::FILE *stream = stderr);

    /// Takes a record with its line break.
    ///
    /// Threads: one record at a time, on whichever thread wrote it.
    using Writer = std::function<void(std::string record)>;
    /// @param writer  Gets the records. Must not throw.
    SpdlogLogs(Ports::LogLevel minimum, Writer writer);

    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

private:
    class Sink;
    class Handle;

    Ports::LogLevel _minimum;
    std::shared_ptr<Sink> _sink; ///< shared with the handles, which may outlive the provider
};

} // namespace ZorvaTouch::Host
