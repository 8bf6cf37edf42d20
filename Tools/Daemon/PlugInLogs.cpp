#include "Tools/Daemon/PlugInLogs.h"

#include <utility>

namespace ZorvaTouch::Tools {

class PlugInLogs::Handle final : public Ports::Log {
public:
    explicit Handle(std::shared_ptr<Ports::Log> log) : _log(std::move(log)) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override { return _log->isEnabled(levelFor(level)); }
    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (isEnabled(level))
            _log->write(levelFor(level), text);
    }

private:
    static Ports::LogLevel levelFor(Ports::LogLevel level) noexcept {
        return level == Ports::LogLevel::Default ? Ports::LogLevel::Debug : level;
    }

    const std::shared_ptr<Ports::Log> _log;
};

std::shared_ptr<Ports::Log> PlugInLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_logs->openLog(subsystem, category));
}

} // namespace ZorvaTouch::Tools
