#pragma once

#include "Host/Runtime/AsyncLogs.h"
#include "Host/Runtime/StreamWriter.h"

#include <memory>
#include <string>
#include <string_view>

namespace ZorvaTouch::Linux {

/// Makes datagrams of the journal's native protocol from records. A record has the fields MESSAGE, PRIORITY
/// (7 for debug, 6 for default, 3 for errors), ZORVA_SUBSYSTEM, ZORVA_CATEGORY and SYSLOG_IDENTIFIER.
/// @param identifier  What the journal calls the program.
[[nodiscard]] Host::LogFormat journalFormat(std::string identifier = "zorvatouchd");

/// Sends each text as one datagram to the journal's socket, and waits while the journal does not read. Where
/// no journal runs, and for texts that the system does not send in one piece, the text is lost, which is not
/// an error: a journal that is started again gets the next ones.
class JournalWriter final : public Host::TextWriter {
public:
    static constexpr std::string_view kSocket = "/run/systemd/journal/socket";

    /// @throws std::system_error  The system has no descriptor to give, or the path is too long for a socket.
    explicit JournalWriter(std::string_view path = kSocket);
    ~JournalWriter() override;
    JournalWriter(const JournalWriter &) = delete;
    JournalWriter &operator=(const JournalWriter &) = delete;

    [[nodiscard]] int write(std::string_view datagram) noexcept override;
    void giveUp() noexcept override;

private:
    struct Connection;
    const std::unique_ptr<Connection> _connection;
};

/// Whether a descriptor, such as standard error, leads to the journal: that is how a program knows that it
/// runs as a unit. False for one that is not open.
[[nodiscard]] bool isJournalStream(int descriptor) noexcept;

} // namespace ZorvaTouch::Linux
