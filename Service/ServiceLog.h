#pragma once

#include "Shared/Ports/Log.h"

#include <fmt/format.h>

#include <exception>
#include <memory>
#include <string_view>
#include <utility>

namespace ZorvaTouch {

/// The service's log handle: builds a text only when its level is on, and never fails.
///
/// Threads:  any.
/// Realtime: at a level that is off, yes.
class ServiceLog {
public:
    explicit ServiceLog(std::shared_ptr<Ports::Log> log) : _log(std::move(log)) {}

    template <typename... Arguments>
    void debug(fmt::format_string<Arguments...> text, Arguments &&...arguments) const noexcept {
        write(Ports::LogLevel::Debug, text, std::forward<Arguments>(arguments)...);
    }
    template <typename... Arguments>
    void notice(fmt::format_string<Arguments...> text, Arguments &&...arguments) const noexcept {
        write(Ports::LogLevel::Default, text, std::forward<Arguments>(arguments)...);
    }
    template <typename... Arguments>
    void error(fmt::format_string<Arguments...> text, Arguments &&...arguments) const noexcept {
        write(Ports::LogLevel::Error, text, std::forward<Arguments>(arguments)...);
    }

    [[nodiscard]] bool isEnabled(Ports::LogLevel level) const noexcept { return _log->isEnabled(level); }

private:
    template <typename... Arguments>
    void write(Ports::LogLevel level, fmt::format_string<Arguments...> text,
               Arguments &&...arguments) const noexcept {
        if (!_log->isEnabled(level))
            return;
        try {
            _log->write(level, fmt::format(text, std::forward<Arguments>(arguments)...));
        } catch (...) { // no memory for the text; its bare form needs none
            const fmt::string_view bare = text;
            _log->write(level, std::string_view(bare.data(), bare.size()));
        }
    }

    std::shared_ptr<Ports::Log> _log;
};

/// Does some work on a thread whose caller cannot be told of a failure: an exception becomes one error line.
template <typename Work>
void runGuarded(const ServiceLog &log, std::string_view operation, Work work) noexcept {
    try {
        work();
    } catch (const std::exception &error) {
        log.error("{} failed: {}", operation, error.what());
    } catch (...) {
        log.error("{} failed: unknown exception", operation);
    }
}

} // namespace ZorvaTouch
