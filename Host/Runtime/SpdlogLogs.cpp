#include "Host/Runtime/SpdlogLogs.h"

#include "Host/Runtime/AsyncLogs.h"
#include "Shared/Util/Text.h"

#include <spdlog/details/log_msg.h>
#include <spdlog/pattern_formatter.h>

#include <string>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

std::string_view nameOf(Ports::LogLevel level) {
    switch (level) {
    case Ports::LogLevel::Debug:
        return "debug";
    case Ports::LogLevel::Default:
        return "default";
    case Ports::LogLevel::Error:
        return "error";
    }
    return "error";
}

} // namespace

std::string logLine(const LogRecord &record) {
    std::string fields(nameOf(record.level));
    fields.append(" subsystem=").append(record.subsystem).append(" category=").append(record.category);
    fields.append(" ").append(record.text);
    spdlog::memory_buf_t line;
    spdlog::pattern_formatter("%Y-%m-%dT%H:%M:%S.%e%z %v")
        .format(spdlog::details::log_msg(record.time, {}, {}, spdlog::level::info, fields), line);
    return {line.data(), line.size()};
}

class SpdlogLogs::Handle final : public Ports::Log {
public:
    Handle(std::FILE *stream, Ports::LogLevel minimum, std::string_view subsystem, std::string_view category)
        : _stream(stream), _minimum(minimum), _subsystem(subsystem), _category(category) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override { return level >= _minimum; }

    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (!isEnabled(level))
            return;
        try {
            const std::string shown = Util::printable(Util::withoutLineBreaksAtTheEnd(text));
            const std::string line = logLine({.time = std::chrono::system_clock::now(),
                                              .level = level,
                                              .subsystem = _subsystem,
                                              .category = _category,
                                              .text = shown});
            static_cast<void>(std::fwrite(line.data(), 1, line.size(), _stream)); // in one piece
            static_cast<void>(std::fflush(_stream));
        } catch (...) { // no memory for the line
        }
    }

private:
    std::FILE *const _stream;
    const Ports::LogLevel _minimum;
    const std::string _subsystem, _category;
};

SpdlogLogs::SpdlogLogs(Ports::LogLevel minimum, std::FILE *stream) : _minimum(minimum), _stream(stream) {}

std::shared_ptr<Ports::Log> SpdlogLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_stream, _minimum, subsystem, category);
}

} // namespace ZorvaTouch::Host
