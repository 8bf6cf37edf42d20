#include "Host/Runtime/AsyncLogs.h"

#include "Shared/LogNames.h"
#include "Shared/Util/Text.h"

#include <cstdint>
#include <new>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

std::string keptOf(std::string_view text) {
    std::string kept(text.substr(0, AsyncLogs::kLongestText));
    return kept.append(text.size() > AsyncLogs::kLongestText ? "..." : "");
}

std::string droppedText(std::uint64_t records) {
    return std::to_string(records) + (records == 1 ? " record of the log is" : " records of the log are") +
           " missing here: they came faster than they were read";
}

} // namespace

/// Where all handles write.
///
/// Threads: any.
class AsyncLogs::Output {
public:
    Output(LogFormat format, std::shared_ptr<TextWriter> writer)
        : _format(std::move(format)), _writer("zorva-log", std::move(writer),
                                              [format = _format](std::uint64_t records) {
                                                  const std::string text = droppedText(records);
                                                  return format({.time = std::chrono::system_clock::now(),
                                                                 .level = Ports::LogLevel::Error,
                                                                 .subsystem = kLogSubsystem,
                                                                 .category = "Log",
                                                                 .text = text});
                                              },
                                              {}) {}

    /// @param origin  The handle's, as it must outlive the record.
    void put(const std::shared_ptr<const std::pair<std::string, std::string>> &origin, Ports::LogLevel level,
             std::string_view text) noexcept try {
        _writer.put(
            [format = _format, origin, level, time = std::chrono::system_clock::now(), text = keptOf(text)] {
                const std::string shown = Util::printable(Util::withoutLineBreaksAtTheEnd(text));
                return format({.time = time,
                               .level = level,
                               .subsystem = origin->first,
                               .category = origin->second,
                               .text = shown});
            });
    } catch (const std::bad_alloc &) {
        _writer.drop();
    }

    void finish() noexcept { _writer.finish(); }

private:
    const LogFormat _format;
    AsyncWriter _writer;
};

class AsyncLogs::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<Output> output, Ports::LogLevel minimum, std::string_view subsystem,
           std::string_view category)
        : _output(std::move(output)), _minimum(minimum),
          _origin(std::make_shared<const std::pair<std::string, std::string>>(subsystem, category)) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override { return level >= _minimum; }
    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (isEnabled(level))
            _output->put(_origin, level, text);
    }

private:
    const std::shared_ptr<Output> _output;
    const Ports::LogLevel _minimum;
    const std::shared_ptr<const std::pair<std::string, std::string>> _origin; ///< subsystem and category
};

AsyncLogs::AsyncLogs(Ports::LogLevel minimum, LogFormat format, std::shared_ptr<TextWriter> writer)
    : _minimum(minimum), _output(std::make_shared<Output>(std::move(format), std::move(writer))) {}

AsyncLogs::~AsyncLogs() { _output->finish(); }

std::shared_ptr<Ports::Log> AsyncLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_output, _minimum, subsystem, category);
}

} // namespace ZorvaTouch::Host
