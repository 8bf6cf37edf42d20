#include "Tools/Hosting/ScreenLogs.h"

#include <algorithm>
#include <array>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// How the service's records about what is optional begin.
constexpr std::array<std::string_view, 2> kOptional{"pthread_setschedparam failed: ",
                                                    "Failed to create accel system: "};

bool isAboutOptional(std::string_view text) noexcept {
    return std::ranges::any_of(kOptional, [text](std::string_view begin) { return text.starts_with(begin); });
}

} // namespace

class ScreenLogs::Handle final : public Ports::Log {
public:
    explicit Handle(std::shared_ptr<Ports::Log> log) : _log(std::move(log)) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override { return _log->isEnabled(level); }
    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (!isAboutOptional(text))
            _log->write(level, text);
    }

private:
    const std::shared_ptr<Ports::Log> _log;
};

ScreenLogs::ScreenLogs(std::unique_ptr<Ports::LogProvider> logs) : _logs(std::move(logs)) {}

std::shared_ptr<Ports::Log> ScreenLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_logs->openLog(subsystem, category));
}

} // namespace ZorvaTouch::Tools
