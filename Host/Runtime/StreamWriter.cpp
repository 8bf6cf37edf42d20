#include "Host/Runtime/StreamWriter.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdint>
#include <string>

namespace ZorvaTouch::Host {
namespace {

enum class StreamKind {
    File,   ///< never waits for a reader
    Socket, ///< is told with each piece not to block
    Anew,   ///< a pipe or terminal of our own description, which does not block
    Shared, ///< one that cannot be opened anew
};

struct Stream {
    StreamKind kind;
    int descriptor;
};

/// A pipe's or terminal's other description; negative if there is none to be had: a pipe that nobody reads, a
/// terminal of somebody else's.
int openAnew(int descriptor) noexcept {
    std::array<char, 32> path{"/proc/self/fd/"};
    constexpr std::size_t kDigit = 14;
    path[kDigit] = static_cast<char>('0' + descriptor); // of the standard ones
    return ::open(path.data(), O_WRONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
}

Stream openStream(int standard) noexcept {
    struct stat status {};
    if (::fstat(standard, &status) != 0)
        return {StreamKind::File, standard}; // closed: each write will say so
    if (S_ISSOCK(status.st_mode))
        return {StreamKind::Socket, standard};
    if (!S_ISFIFO(status.st_mode) && !S_ISCHR(status.st_mode))
        return {StreamKind::File, standard};
    const int descriptor = openAnew(standard);
    return descriptor < 0 ? Stream{StreamKind::Shared, standard} : Stream{StreamKind::Anew, descriptor};
}

ssize_t writeSome(const Stream &stream, std::string_view text) noexcept {
    switch (stream.kind) {
    case StreamKind::Socket:
        return ::send(stream.descriptor, text.data(), text.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
    case StreamKind::Shared: // for so much there is room in a pipe that can be written to
        return ::write(stream.descriptor, text.data(), std::min<std::size_t>(text.size(), PIPE_BUF));
    case StreamKind::File:
    case StreamKind::Anew:
        break;
    }
    return ::write(stream.descriptor, text.data(), text.size());
}

bool isTransient(int errorNumber) noexcept {
    return errorNumber == EINTR || errorNumber == EAGAIN || errorNumber == EWOULDBLOCK;
}

} // namespace

struct StreamWriter::Descriptors {
    explicit Descriptors(int standard) : stream(openStream(standard)) {
        if (wake < 0) {
            const int errorNumber = errno;
            closeOwn();
            throw FileFailure("open", errorNumber);
        }
    }
    ~Descriptors() {
        closeOwn();
        ::close(wake);
    }
    Descriptors(const Descriptors &) = delete;
    Descriptors &operator=(const Descriptors &) = delete;

    void closeOwn() const noexcept {
        if (stream.kind == StreamKind::Anew)
            ::close(stream.descriptor);
    }

    /// Waits for room.
    /// @return 0 or the error's number.
    [[nodiscard]] int waitForRoom() const noexcept {
        std::array<pollfd, 2> waits{{{stream.descriptor, POLLOUT, 0}, {wake, POLLIN, 0}}};
        if (::poll(waits.data(), waits.size(), -1) < 0)
            return errno;
        return waits[1].revents != 0 ? ECANCELED : 0;
    }

    const Stream stream;
    const int wake = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK); ///< readable once it was given up
};

StreamWriter::StreamWriter(StandardStream stream)
    : _descriptors(std::make_unique<Descriptors>(static_cast<int>(stream))) {}

StreamWriter::~StreamWriter() = default;

int StreamWriter::write(std::string_view text) noexcept {
    const Stream &stream = _descriptors->stream;
    while (!text.empty()) {
        if (stream.kind != StreamKind::File)
            if (const int errorNumber = _descriptors->waitForRoom(); errorNumber != 0 && errorNumber != EINTR)
                return errorNumber;
        const ssize_t count = writeSome(stream, text);
        if (count >= 0)
            text.remove_prefix(static_cast<std::size_t>(count));
        else if (!isTransient(errno))
            return errno;
    }
    return 0;
}

void StreamWriter::giveUp() noexcept {
    const std::uint64_t one = 1;
    // Full: it is readable already.
    [[maybe_unused]] const ssize_t size = ::write(_descriptors->wake, &one, sizeof one);
}

} // namespace ZorvaTouch::Host
