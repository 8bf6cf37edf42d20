#include "Host/Linux/IioSession.h"

#include "Host/Linux/IioSetup.h"

#include <cerrno>
#include <cstddef>
#include <span>

namespace ZorvaTouch::Linux {
namespace {

/// What to do about a node that does not open; empty if nobody knows.
std::string nodeAdvice(int errorNumber) {
    switch (errorNumber) {
    case EBUSY:
        return "; another program reads it: stop that one, or choose another accelerometer";
    case EACCES:
    case EPERM:
        return "; give the group of the daemon's user access by a udev rule: "
               "SUBSYSTEM==\"iio\", GROUP=\"zorvatouch\", MODE=\"0660\"";
    default:
        return {};
    }
}

/// What to do about an attribute that cannot be written; empty if nobody knows.
std::string attributeAdvice(int errorNumber) {
    switch (errorNumber) {
    case EBUSY:
        return "; another program uses it: stop that one, or choose another accelerometer";
    case EACCES:
    case EPERM:
        return "; give the group of the daemon's user write access by a udev rule: SUBSYSTEM==\"iio\", "
               "RUN+=\"/bin/sh -c 'chgrp -R zorvatouch /sys%p && chmod -R g=u /sys%p'\"";
    default:
        return {};
    }
}

} // namespace

IioSession::IioSession(const IioSysfs &device, const IioOpener &opener, const std::string &nodePath,
                       std::optional<double> intervalUs)
    : _device(device), _node(open(opener, nodePath)) {
    try {
        prepare(intervalUs);
    } catch (const IioFailure &failure) {
        stopBuffer(device);
        throw IioFailure(failure.what() + attributeAdvice(failure.errorNumber), failure.errorNumber);
    }
}

IioSession::~IioSession() { stopBuffer(_device); }

std::unique_ptr<IioNode> IioSession::open(const IioOpener &opener, const std::string &nodePath) {
    OpenedIioNode opened = opener();
    if (opened.node)
        return std::move(opened.node);
    const std::string what = "open " + nodePath;
    throw IioFailure(describe({what.c_str(), opened.errorNumber}) + nodeAdvice(opened.errorNumber),
                     opened.errorNumber);
}

void IioSession::prepare(std::optional<double> intervalUs) {
    stopBuffer(_device); // somebody may have left it on
    _scan = prepareScan(_device);
    prepareTrigger(_device);
    _isMonotonic = prepareClock(_device);
    prepareBuffer(_device);
    if (intervalUs)
        setInterval(*intervalUs);
    _buffer.resize(_scan->size() * kIioBufferLength);
    startBuffer(_device);
}

void IioSession::setInterval(double intervalUs) {
    _frequency = setSamplingInterval(_device, intervalUs).value_or("");
}

std::optional<SystemFailure> IioSession::receive(bool isBroken, const Deliver &deliver) {
    const IoResult result = _node->read(_buffer);
    if (result.errorNumber == EAGAIN || result.errorNumber == EINTR)
        return handleNothing(result.errorNumber, isBroken);
    if (result.errorNumber != 0 || result.count == 0)
        return SystemFailure{"read", result.errorNumber};
    if (result.count % _scan->size() != 0)
        return SystemFailure{"read", EBADMSG};
    _emptyReads = 0;
    deliverScans(result.count, deliver);
    return std::nullopt;
}

std::optional<SystemFailure> IioSession::handleNothing(int errorNumber, bool isBroken) noexcept {
    if (errorNumber == EINTR)
        return std::nullopt;
    if (isBroken)
        return SystemFailure{"wait", EIO};
    if (++_emptyReads >= kEmptyReadsUntilFailed)
        return SystemFailure{"read", errorNumber};
    return std::nullopt;
}

void IioSession::deliverScans(std::size_t size, const Deliver &deliver) const {
    const std::span<const std::uint8_t> scans(_buffer.data(), size);
    for (std::size_t begin = 0; begin < size; begin += _scan->size()) {
        AccelSample sample = _scan->decode(scans.subspan(begin, _scan->size()));
        if (!_isMonotonic)
            sample.nanoseconds.reset();
        deliver(sample);
    }
}

} // namespace ZorvaTouch::Linux
