#include "Host/Runtime/SpdlogLogs.h"

#include <spdlog/logger.h>
#include <spdlog/pattern_formatter.h>
#include <spdlog/sinks/base_sink.h>
#include <spdlog/sinks/stdout_sinks.h>

#include <mutex>
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

std::string fieldsText(std::string_view subsystem, std::string_view category) {
    std::string text("subsystem=");
    text.append(subsystem).append(" category=").append(category);
    return text;
}

} // namespace

namespace {

/// Hands records to a function.
class WriterSink final : public spdlog::sinks::base_sink<std::mutex> {
public:
    explicit WriterSink(SpdlogLogs::Writer writer) : _writer(std::move(writer)) {}

private:
    void sink_it_(const spdlog::details::log_msg &message) override {
        spdlog::memory_buf_t text;
        formatter_->format(message, text);
        _writer(std::string(text.data(), text.size()));
    }
    void flush_() override {}

    const SpdlogLogs::Writer _writer;
};

} // namespace

class SpdlogLogs::Sink {
public:
    explicit Sink(spdlog::sink_ptr sink) : logger("", std::move(sink)) {
        // Levels are told apart before a record gets here and are part of its text.
        logger.set_level(spdlog::level::trace);
        logger.set_pattern("%Y-%m-%dT%H:%M:%S.%e%z %v");
    }

    spdlog::logger logger;
};

class SpdlogLogs::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<Sink> sink, Ports::LogLevel minimum, std::string fields)
        : _sink(std::move(sink)), _minimum(minimum), _fields(std::move(fields)) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override { return level >= _minimum; }

    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (!isEnabled(level))
            return;
        try {
            _sink->logger.info("{} {} {}", nameOf(level), _fields, text);
        } catch (...) { // no memory for the line: there is nobody to tell
        }
    }

private:
    const std::shared_ptr<Sink> _sink;
    const Ports::LogLevel _minimum;
    const std::string _fields;
};

SpdlogLogs::SpdlogLogs(Ports::LogLevel minimum, std::FILE *stream)
    : _minimum(minimum),
      _sink(std::make_shared<Sink>(
          std::make_shared<spdlog::sinks::stdout_sink_base<spdlog::details::console_mutex>>(stream))) {}

SpdlogLogs::SpdlogLogs(Ports::LogLevel minimum, Writer writer)
    : _minimum(minimum), _sink(std::make_shared<Sink>(std::make_shared<WriterSink>(std::move(writer)))) {}

std::shared_ptr<Ports::Log> SpdlogLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_sink, _minimum, fieldsText(subsystem, category));
}

} // namespace ZorvaTouch::Host
