#include "Tests/Unit/Host/Linux/IioFakes.h"

#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux::Tests {

void Story::add(std::string line) {
    const std::lock_guard lock(_lock);
    _lines.push_back(std::move(line));
    _changed.notify_all();
}

Story::Lines Story::take(std::size_t count) {
    std::unique_lock lock(_lock);
    _changed.wait(lock, [&] { return _lines.size() >= count; });
    return std::exchange(_lines, {});
}

void StoryLog::write(Ports::LogLevel level, std::string_view text) noexcept {
    const char *const name = level == Ports::LogLevel::Error     ? "error "
                             : level == Ports::LogLevel::Default ? "default "
                                                                 : "debug ";
    _story.add(name + std::string(text));
}

class FakeSensor::Node final : public IioNode {
public:
    Node(FakeSensor &sensor, UniqueFd near) : _sensor(sensor), _near(std::move(near)) {}
    ~Node() override { _sensor._story.add("closed"); }
    Node(const Node &) = delete;
    Node &operator=(const Node &) = delete;

    [[nodiscard]] int descriptor() const noexcept override { return _near.get(); }
    [[nodiscard]] IoResult read(std::span<std::uint8_t> buffer) noexcept override {
        ++_sensor.reads;
        if (const int error = _sensor.failure; error >= 0)
            return {.errorNumber = error};
        const ssize_t count = ::read(descriptor(), buffer.data(), buffer.size());
        if (count < 0)
            return {.errorNumber = errno};
        const std::lock_guard lock(_sensor._lock);
        return {.count = static_cast<std::size_t>(count), .errorNumber = count == 0 ? _sensor._endError : 0};
    }

private:
    FakeSensor &_sensor;
    const UniqueFd _near;
};

IioOpener FakeSensor::opener() {
    return [this] { return open(); };
}

OpenedIioNode FakeSensor::open() {
    if (!openErrors.empty()) {
        const int errorNumber = openErrors.front();
        openErrors.pop_front();
        if (errorNumber != 0) {
            _story.add("refused");
            return {.node = nullptr, .errorNumber = errorNumber};
        }
    }
    int ends[2];
    if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0, ends) != 0)
        return {.node = nullptr, .errorNumber = errno};
    {
        const std::lock_guard lock(_lock);
        _far = UniqueFd(ends[1]);
    }
    auto node = std::make_unique<Node>(*this, UniqueFd(ends[0]));
    _story.add("opened");
    return {.node = std::move(node), .errorNumber = 0};
}

void FakeSensor::send(const std::vector<std::uint8_t> &scans) {
    const std::lock_guard lock(_lock);
    if (::send(_far.get(), scans.data(), scans.size(), MSG_NOSIGNAL) != static_cast<ssize_t>(scans.size()))
        throw std::system_error(errno, std::generic_category(), "send");
}

void FakeSensor::send(std::int32_t x, std::int32_t y, std::int32_t z, std::int64_t nanoseconds) {
    std::vector<std::uint8_t> scan;
    const auto append = [&scan](std::uint64_t value, unsigned bytes) {
        for (unsigned i = 0; i < bytes; ++i)
            scan.push_back(static_cast<std::uint8_t>(value >> 8 * i));
    };
    for (const std::int32_t axis : {x, y, z})
        append(static_cast<std::uint32_t>(axis), 4);
    append(0, 4);
    append(static_cast<std::uint64_t>(nanoseconds), 8);
    send(scan);
}

void FakeSensor::hangUp(int readError) {
    const std::lock_guard lock(_lock);
    _endError = readError;
    _far.reset();
}

} // namespace ZorvaTouch::Linux::Tests
