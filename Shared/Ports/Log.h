#pragma once

#include <memory>
#include <string_view>

namespace ZorvaTouch::Ports {

enum class LogLevel {
    Debug,   ///< per-call tracing
    Default, ///< firmware events, dispatched events
    Error,   ///< failures
};

/// One component's log handle.
///
/// Threads:  any.
/// Realtime: `isEnabled` yes; `write` is as good as the implementation, so text is built only behind
/// `isEnabled`.
class Log {
public:
    virtual ~Log() = default;

    /// Cheap test made before any text is built.
    [[nodiscard]] virtual bool isEnabled(LogLevel level) const noexcept = 0;

    /// Writes one record. `text` is borrowed for the call and may hold newlines.
    virtual void write(LogLevel level, std::string_view text) noexcept = 0;
};

/// Hands out log handles, one per component.
class LogProvider {
public:
    virtual ~LogProvider() = default;

    /// @param subsystem  Reverse-DNS name, such as "org.zorva.hid.ZorvaTouch".
    /// @param category   The component, such as "Algs".
    /// @return A handle, never null, that may outlive the provider.
    [[nodiscard]] virtual std::shared_ptr<Log> openLog(std::string_view subsystem,
                                                       std::string_view category) = 0;
};

/// A provider whose handles are disabled at every level: for replays that only want the events.
[[nodiscard]] LogProvider &silentLogProvider() noexcept;

} // namespace ZorvaTouch::Ports
