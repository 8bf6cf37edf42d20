#include "Shared/Ports/Log.h"

namespace ZorvaTouch::Ports {
namespace {

class SilentLog final : public Log {
public:
    bool isEnabled(LogLevel) const noexcept override { return false; }
    void write(LogLevel, std::string_view) noexcept override {}
};

class SilentLogProvider final : public LogProvider {
public:
    std::shared_ptr<Log> openLog(std::string_view, std::string_view) override {
        return std::make_shared<SilentLog>();
    }
};

} // namespace

LogProvider &silentLogProvider() noexcept {
    static SilentLogProvider provider; // stateless
    return provider;
}

} // namespace ZorvaTouch::Ports
