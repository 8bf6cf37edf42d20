#include "Tests/Kernel/Emulator.h"

#include "Tests/Kernel/Numbers.h"
#include "Tests/Kernel/Story.h"

#include <poll.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <ctime>
#include <exception>
#include <stdexcept>
#include <system_error>
#include <utility>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr std::uint64_t kNanosecondsPerSecond = 1'000'000'000;
constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;
constexpr std::string_view kWait = "wait ";

/// From now on these signals end nothing by themselves and are read here.
int takeSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    const int descriptor = signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK);
    if (descriptor < 0)
        throw std::system_error(errno, std::generic_category(), "signals");
    return descriptor;
}

timespec untilNs(std::uint64_t timeNs) {
    const std::uint64_t now = nowNs();
    const std::uint64_t left = timeNs > now ? timeNs - now : 0;
    return {.tv_sec = static_cast<time_t>(left / kNanosecondsPerSecond),
            .tv_nsec = static_cast<long>(left % kNanosecondsPerSecond)};
}

} // namespace

Emulator::Emulator(DeviceIdentity identity, std::span<const std::uint8_t> reportDescriptor)
    : _identity(std::move(identity)), _reportDescriptor(reportDescriptor), _watch(_identity.serial),
      _signals(takeSignals()) {}

Emulator::~Emulator() { ::close(_signals); }

void Emulator::run() {
    create();
    while (!_isFinished) {
        wait();
        obeyLines();
        if (const std::optional<std::uint64_t> due = dueNs(); due && *due <= nowNs())
            act(nowNs());
    }
    if (_isCreated)
        destroy();
    tell("end", summary());
}

void Emulator::create() {
    if (_isCreated)
        throw std::invalid_argument("create: it is there");
    plugIn();
    _device.create(_identity, _reportDescriptor);
    _isCreated = true;
    tell("created", {{"serial", _identity.serial}});
}

void Emulator::destroy() {
    if (!_isCreated)
        throw std::invalid_argument("destroy: it is gone");
    _device.destroy();
    _isCreated = _isBound = false;
    // What is still to be heard is about the device that went.
    while (_watch.takeBound()) {
    }
    tell("destroyed");
}

/// Until something comes in or is due.
void Emulator::wait() {
    std::array<pollfd, 4> waiting{{{.fd = _device.descriptor(), .events = POLLIN, .revents = 0},
                                   {.fd = _watch.descriptor(), .events = POLLIN, .revents = 0},
                                   {.fd = _signals, .events = POLLIN, .revents = 0},
                                   {.fd = _isReading ? STDIN_FILENO : -1, .events = POLLIN, .revents = 0}}};
    const std::optional<std::uint64_t> next = nextNs();
    const timespec left = untilNs(next.value_or(0));
    if (::ppoll(waiting.data(), waiting.size(), next ? &left : nullptr, nullptr) < 0 && errno != EINTR)
        throw std::system_error(errno, std::generic_category(), "waiting");
    if (waiting[0].revents != 0)
        handleKernel();
    if (waiting[1].revents != 0)
        handleBinding();
    if (waiting[2].revents != 0)
        finish();
    if (waiting[3].revents != 0)
        readLines();
}

/// What the device has to do, and the end of a "wait", whichever is sooner.
std::optional<std::uint64_t> Emulator::nextNs() const {
    const std::optional<std::uint64_t> due = dueNs();
    return due && _resumeNs ? std::min(due, _resumeNs) : due ? due : _resumeNs;
}

void Emulator::handleKernel() {
    while (const std::optional<uhid_event> event = _device.read())
        handle(*event);
}

void Emulator::handle(const uhid_event &event) {
    switch (event.type) {
    case UHID_OPEN:
        return tell("open");
    case UHID_CLOSE:
        return tell("close");
    case UHID_GET_REPORT:
        return getReport(event.u.get_report);
    case UHID_SET_REPORT:
        return setReport(event.u.set_report);
    default:
        return;
    }
}

void Emulator::handleBinding() {
    while (const std::optional<std::string> folder = _watch.takeBound()) {
        _isBound = true;
        tell("bound", {{"node", hidrawNode(*folder)}, {"folder", *folder}});
        start();
    }
}

void Emulator::readLines() {
    std::array<char, 4096> buffer;
    const ssize_t length = ::read(STDIN_FILENO, buffer.data(), buffer.size());
    if (length < 0 && (errno == EINTR || errno == EAGAIN))
        return;
    _isReading = length > 0;
    if (!_isReading && !_partial.empty())
        _lines.push_back(std::exchange(_partial, {}));
    for (std::size_t i = 0; _isReading && i < static_cast<std::size_t>(length); ++i) {
        if (buffer[i] == '\n')
            _lines.push_back(std::exchange(_partial, {}));
        else
            _partial.push_back(buffer[i]);
    }
    if (!_isReading && _lines.empty())
        inputEnded();
}

void Emulator::obeyLines() {
    const bool hadLines = !_lines.empty();
    if (_resumeNs && *_resumeNs <= nowNs())
        _resumeNs.reset();
    while (!_resumeNs && !_lines.empty() && obeyFirst())
        _lines.pop_front();
    if (hadLines && !hasInput())
        inputEnded();
}

/// @return Whether it is done, rather than held back.
bool Emulator::obeyFirst() {
    const std::string &line = _lines.front();
    if (line.empty() || line.starts_with('#'))
        return true;
    if (line == "create")
        create();
    else if (line == "destroy")
        destroy();
    else if (line.starts_with(kWait))
        _resumeNs = nowNs() + numberFrom(std::string_view(line).substr(kWait.size())) * kNanosecondsPerMs;
    else if (!_isBound)
        return false;
    else
        obey(line);
    return true;
}

int runProgram(const char *program, const std::function<void()> &work) {
    try {
        work();
        return 0;
    } catch (const std::exception &failure) {
        std::fprintf(stderr, "%s: %s\n", program, failure.what());
        return 1;
    }
}

} // namespace ZorvaTouch::KernelTests
