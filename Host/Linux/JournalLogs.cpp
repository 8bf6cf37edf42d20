#include "Host/Linux/JournalLogs.h"

// A record comes from whoever wrote it, not from this file.
#define SD_JOURNAL_SUPPRESS_LOCATION // NOLINT(readability-identifier-naming): the library's
#include <sys/stat.h>
#include <sys/uio.h>
#include <systemd/sd-journal.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdlib>
#include <optional>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

class SystemJournal final : public Journal {
public:
    void send(std::span<const std::string_view> fields) noexcept override {
        std::array<iovec, kMostFields> parts{};
        const std::size_t count = std::min(fields.size(), parts.size());
        for (std::size_t i = 0; i < count; ++i) // the library only reads them
            parts[i] = {.iov_base = const_cast<char *>(fields[i].data()), .iov_len = fields[i].size()};
        (void)::sd_journal_sendv(parts.data(), static_cast<int>(count)); // nobody to tell of a failure
    }

private:
    static constexpr std::size_t kMostFields = 8;
};

std::string_view priorityOf(Ports::LogLevel level) noexcept {
    switch (level) {
    case Ports::LogLevel::Debug:
        return "PRIORITY=7";
    case Ports::LogLevel::Default:
        return "PRIORITY=6";
    case Ports::LogLevel::Error:
        return "PRIORITY=3";
    }
    return "PRIORITY=3";
}

std::string field(std::string_view name, std::string_view value) {
    return std::string(name).append("=").append(value);
}

std::string_view withoutLineBreaksAtTheEnd(std::string_view text) noexcept {
    return text.substr(0, text.find_last_not_of("\r\n") + 1); // npos + 1 is 0
}

/// Takes a number from the front of a text, if there is one.
template <typename Number> std::optional<Number> takeNumber(std::string_view &text) noexcept {
    Number number{};
    const char *const end = text.data() + text.size();
    const auto [next, error] = std::from_chars(text.data(), end, number);
    if (error != std::errc())
        return std::nullopt;
    text = std::string_view(next, static_cast<std::size_t>(end - next));
    return number;
}

} // namespace

class JournalLogs::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<Journal> journal, Ports::LogLevel minimum, std::string identifier,
           std::string subsystem, std::string category)
        : _journal(std::move(journal)), _minimum(minimum), _identifier(std::move(identifier)),
          _subsystem(std::move(subsystem)), _category(std::move(category)) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override { return level >= _minimum; }

    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (!isEnabled(level))
            return;
        try {
            const std::string message = field("MESSAGE", withoutLineBreaksAtTheEnd(text));
            _journal->send(std::array<std::string_view, 5>{message, priorityOf(level), _subsystem, _category,
                                                           _identifier});
        } catch (...) { // no memory for the line: there is nobody to tell
        }
    }

private:
    const std::shared_ptr<Journal> _journal;
    const Ports::LogLevel _minimum;
    const std::string _identifier, _subsystem, _category; ///< as fields
};

std::shared_ptr<Journal> systemJournal() { return std::make_shared<SystemJournal>(); }

JournalLogs::JournalLogs(Ports::LogLevel minimum, std::string_view identifier,
                         std::shared_ptr<Journal> journal)
    : _minimum(minimum), _identifier(field("SYSLOG_IDENTIFIER", identifier)), _journal(std::move(journal)) {}

std::shared_ptr<Ports::Log> JournalLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_journal, _minimum, _identifier, field("ZORVA_SUBSYSTEM", subsystem),
                                    field("ZORVA_CATEGORY", category));
}

bool JournalLogs::isJournalStream(int descriptor) noexcept {
    const char *const value = std::getenv("JOURNAL_STREAM"); // device:inode
    struct stat status {};
    if (!value || ::fstat(descriptor, &status) != 0)
        return false;
    std::string_view rest(value);
    const auto device = takeNumber<dev_t>(rest);
    if (device != status.st_dev || !rest.starts_with(':'))
        return false;
    rest.remove_prefix(1);
    return takeNumber<ino_t>(rest) == status.st_ino && rest.empty();
}

} // namespace ZorvaTouch::Linux
