#include "Tests/Kernel/UhidDevice.h"

#include <fcntl.h>
#include <linux/input.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <system_error>

namespace ZorvaTouch::KernelTests {
namespace {

[[noreturn]] void throwError(const char *what) {
    throw std::system_error(errno, std::generic_category(), what);
}

/// Copies as much as there is room for. @return The length.
std::uint16_t copyData(std::span<const std::uint8_t> data, std::span<std::uint8_t> room) {
    if (data.size() > room.size())
        throw std::length_error("too long for the kernel");
    std::copy(data.begin(), data.end(), room.begin());
    return static_cast<std::uint16_t>(data.size());
}

/// Copies text with its NUL; the fields are zero before.
void copyText(const std::string &text, std::span<std::uint8_t> room) {
    std::copy_n(text.begin(), std::min(text.size(), room.size() - 1), room.begin());
}

int openUhid() {
    const int descriptor = ::open("/dev/uhid", O_RDWR | O_CLOEXEC | O_NONBLOCK);
    if (descriptor < 0)
        throwError("/dev/uhid");
    return descriptor;
}

} // namespace

UhidDevice::UhidDevice() : _descriptor(openUhid()) {}

UhidDevice::~UhidDevice() { ::close(_descriptor); }

void UhidDevice::create(const DeviceIdentity &identity, std::span<const std::uint8_t> reportDescriptor) {
    uhid_event event{};
    event.type = UHID_CREATE2;
    uhid_create2_req &request = event.u.create2;
    copyText(identity.name, request.name);
    copyText(identity.serial, request.uniq);
    request.rd_size = copyData(reportDescriptor, request.rd_data);
    request.bus = BUS_VIRTUAL;
    request.vendor = identity.vendor;
    request.product = identity.product;
    write(event, "creating the device");
}

void UhidDevice::destroy() {
    uhid_event event{};
    event.type = UHID_DESTROY;
    write(event, "destroying the device");
}

void UhidDevice::sendInput(std::span<const std::uint8_t> report) {
    uhid_event event{};
    event.type = UHID_INPUT2;
    uhid_input2_req &input = event.u.input2;
    input.size = copyData(report, input.data);
    write(event, "an input report");
}

void UhidDevice::answerGet(std::uint32_t request, std::uint16_t error, std::span<const std::uint8_t> report) {
    uhid_event event{};
    event.type = UHID_GET_REPORT_REPLY;
    uhid_get_report_reply_req &reply = event.u.get_report_reply;
    reply.id = request;
    reply.err = error;
    reply.size = copyData(report, reply.data);
    write(event, "an answer");
}

void UhidDevice::answerSet(std::uint32_t request, std::uint16_t error) {
    uhid_event event{};
    event.type = UHID_SET_REPORT_REPLY;
    event.u.set_report_reply.id = request;
    event.u.set_report_reply.err = error;
    write(event, "an answer");
}

std::optional<uhid_event> UhidDevice::read() {
    uhid_event event{};
    const ssize_t length = ::read(_descriptor, &event, sizeof event);
    if (length >= 0)
        return event;
    if (errno == EAGAIN || errno == EINTR)
        return std::nullopt;
    throwError("reading from /dev/uhid");
}

void UhidDevice::write(const uhid_event &event, const char *what) {
    if (::write(_descriptor, &event, sizeof event) < 0)
        throwError(what);
}

} // namespace ZorvaTouch::KernelTests
