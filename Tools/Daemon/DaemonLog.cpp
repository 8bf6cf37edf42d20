#include "Tools/Daemon/DaemonLog.h"

#include "Shared/LogNames.h"

#include <new>
#include <string>

namespace ZorvaTouch::Tools {

DaemonLog::DaemonLog(Ports::LogProvider &logs, std::string_view category)
    : _log(logs.openLog(kLogSubsystem, category)) {}

void DaemonLog::write(Ports::LogLevel level, Parts parts) const noexcept {
    if (!_log->isEnabled(level))
        return;
    try {
        std::string text;
        for (const std::string_view part : parts)
            text.append(part);
        _log->write(level, text);
    } catch (const std::bad_alloc &) { // the first part says the most
        _log->write(level, parts.size() == 0 ? std::string_view() : *parts.begin());
    }
}

void DaemonLog::error(std::string_view what, const Linux::SystemFailure &failure) const noexcept {
    try {
        error({what, ": ", describe(failure)});
    } catch (const std::bad_alloc &) {
        error({what, ": ", failure.operation});
    }
}

} // namespace ZorvaTouch::Tools
