#pragma once

#include "Shared/Ports/Log.h"

#include <memory>
#include <span>
#include <string>
#include <string_view>

namespace ZorvaTouch::Linux {

/// Where records of the journal go.
///
/// Threads: any.
class Journal {
public:
    virtual ~Journal() = default;

    /// Sends one record.
    /// @param fields  Each "NAME=value", where the value may be any bytes, line breaks and zeros among them.
    ///                Borrowed for the call.
    virtual void send(std::span<const std::string_view> fields) noexcept = 0;
};

/// The journal of the system. Where none runs, records are lost; where it lags behind, `send` waits for it.
[[nodiscard]] std::shared_ptr<Journal> systemJournal();

/// Logs to the journal. A record has the fields MESSAGE, PRIORITY (7 for debug, 6 for default, 3 for errors),
/// ZORVA_SUBSYSTEM, ZORVA_CATEGORY and SYSLOG_IDENTIFIER. Line breaks at the end of a text are left out; all
/// else is passed on as it is, and never taken for a field. A record that there is no memory for is lost.
///
/// Threads: any.
class JournalLogs final : public Ports::LogProvider {
public:
    /// @param minimum     Records of lower levels are dropped.
    /// @param identifier  What the journal calls the program.
    /// @throws std::bad_alloc
    explicit JournalLogs(Ports::LogLevel minimum, std::string_view identifier = "zorvatouchd",
                         std::shared_ptr<Journal> journal = systemJournal());

    /// @throws std::bad_alloc
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

    /// Whether a descriptor, such as standard error, leads to the journal: that is how a program knows that
    /// it runs as a unit. False for one that is not open.
    [[nodiscard]] static bool isJournalStream(int descriptor) noexcept;

private:
    class Handle;

    const Ports::LogLevel _minimum;
    const std::string _identifier;
    const std::shared_ptr<Journal> _journal;
};

} // namespace ZorvaTouch::Linux
