#include "Host/Linux/Journal.h"

#include "Host/Linux/UniqueFd.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

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

sockaddr_un addressOf(std::string_view path) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path)
        throw std::system_error(ENAMETOOLONG, std::generic_category(), std::string(path));
    std::ranges::copy(path, std::begin(address.sun_path));
    return address;
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

Host::LogFormat journalFormat(std::string identifier) {
    return [identifier = std::move(identifier)](const Host::LogRecord &record) {
        std::string datagram("MESSAGE=");
        datagram.append(record.text).append("\n").append(priorityOf(record.level));
        datagram.append("\nZORVA_SUBSYSTEM=").append(record.subsystem);
        datagram.append("\nZORVA_CATEGORY=").append(record.category);
        return datagram.append("\nSYSLOG_IDENTIFIER=").append(identifier).append("\n");
    };
}

// --- The socket --------------------------------------------------------------------------------------------

struct JournalWriter::Connection {
    explicit Connection(std::string_view path)
        : address(addressOf(path)), wake(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
        if (!wake)
            throw std::system_error(errno, std::generic_category(), "eventfd");
    }

    /// Connects the socket, since only then can the system say when the other side has room.
    [[nodiscard]] bool open() noexcept {
        socket = UniqueFd(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
        if (socket && ::connect(socket.get(), reinterpret_cast<const sockaddr *>(&address), // the interface
                                sizeof address) != 0)
            socket.reset();
        return static_cast<bool>(socket);
    }

    /// @return 0 or the error's number.
    [[nodiscard]] int send(std::string_view datagram) const noexcept {
        return ::send(socket.get(), datagram.data(), datagram.size(), MSG_NOSIGNAL) < 0 ? errno : 0;
    }

    /// @return Whether to go on: false once it was given up.
    [[nodiscard]] bool waitForRoom() const noexcept {
        std::array<pollfd, 2> waits{{{socket.get(), POLLOUT, 0}, {wake.get(), POLLIN, 0}}};
        return ::poll(waits.data(), waits.size(), -1) < 0 ? errno == EINTR : waits[1].revents == 0;
    }

    const sockaddr_un address;
    const UniqueFd wake; ///< readable once it was given up
    UniqueFd socket;     ///< of the writing thread; none before the first text, and when the journal ended
};

JournalWriter::JournalWriter(std::string_view path) : _connection(std::make_unique<Connection>(path)) {}

JournalWriter::~JournalWriter() = default;

int JournalWriter::write(std::string_view datagram) noexcept {
    bool isNew = !_connection->socket;
    if (isNew && !_connection->open())
        return 0;
    for (;;) {
        if (!_connection->waitForRoom())
            return ECANCELED;
        const int errorNumber = _connection->send(datagram);
        if (errorNumber == 0 || errorNumber == EMSGSIZE)
            return 0;
        if (errorNumber == EAGAIN || errorNumber == EINTR)
            continue;
        _connection->socket.reset(); // the journal has ended: perhaps there is another one
        if (std::exchange(isNew, true) || !_connection->open())
            return 0;
    }
}

void JournalWriter::giveUp() noexcept {
    const std::uint64_t one = 1;
    [[maybe_unused]] const ssize_t size =
        ::write(_connection->wake.get(), &one, sizeof one); // full: readable
}

// --- Standard error ----------------------------------------------------------------------------------------

bool isJournalStream(int descriptor) noexcept {
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
