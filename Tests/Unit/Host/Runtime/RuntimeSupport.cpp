#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include "Host/Runtime/SystemThread.h"

#include <cerrno>
#include <cstring>
#include <link.h>
#include <poll.h>
#include <regex>
#include <stdexcept>
#include <system_error>
#include <unistd.h>

namespace ZorvaTouch::Host::RuntimeTests {

std::string LogText::text() const {
    std::rewind(file());
    std::string text(4096, '\0');
    text.resize(std::fread(text.data(), 1, text.size(), file()));
    return std::regex_replace(text, std::regex("[0-9]{4}-[0-9]{2}-[0-9]{2}T[^ \\n]+ "), "");
}

Pipe::Pipe() {
    if (::pipe(_ends) != 0)
        throw std::system_error(errno, std::generic_category(), "pipe");
}

Pipe::~Pipe() {
    closeReadEnd();
    closeWriteEnd();
}

void Pipe::write(const char *text) const {
    const std::size_t length = std::strlen(text);
    if (::write(writeEnd(), text, length) != static_cast<ssize_t>(length))
        throw std::system_error(errno, std::generic_category(), "write");
}

char Pipe::read() const {
    pollfd end{.fd = readEnd(), .events = POLLIN, .revents = 0};
    char byte = 0;
    if (::poll(&end, 1, 0) != 1 || ::read(readEnd(), &byte, 1) != 1)
        throw std::runtime_error("nothing to read");
    return byte;
}

void Pipe::close(int end) noexcept {
    if (_ends[end] >= 0)
        ::close(std::exchange(_ends[end], -1));
}

ScopedThread::ScopedThread(std::function<void()> body)
    : _thread(startSystemThread("test", std::move(body))) {}
ScopedThread::~ScopedThread() { _thread->join(); }

std::string libraryPath() {
    std::string path;
    const auto look = [](dl_phdr_info *file, std::size_t, void *result) {
        if (std::strstr(file->dlpi_name, "/libzorvahost.so"))
            *static_cast<std::string *>(result) = file->dlpi_name;
        return 0;
    };
    ::dl_iterate_phdr(look, &path);
    return path;
}

} // namespace ZorvaTouch::Host::RuntimeTests
