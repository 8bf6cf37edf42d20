#include "Host/Linux/IioReader.h"

#include "Host/Interface/Platform.h"
#include "Plugin/Guarded.h"

#include <poll.h>

#include <cerrno>
#include <exception>
#include <utility>

namespace ZorvaTouch::Linux {

using Host::MutexLock;
using Ports::LogLevel;

namespace {

/// Writes a line, unless there is no memory for it.
template <typename MakeText> void write(Ports::Log &log, LogLevel level, const MakeText &makeText) noexcept {
    if (!log.isEnabled(level))
        return;
    guarded(false, [&] {
        log.write(level, makeText());
        return true;
    });
}

} // namespace

IioReader::IioReader(AccelIdentity identity, IioOpener opener, std::shared_ptr<Ports::Log> log)
    : _identity(std::move(identity)), _device(_identity.syspath), _opener(std::move(opener)),
      _log(std::move(log)), _clock(Host::processPlatform().clock()), _ticks(_clock) {}

// --- What is wished ----------------------------------------------------------------------------------------

void IioReader::onReportInterval(double microseconds) noexcept {
    {
        MutexLock lock(_lock);
        _wish.intervalUs = microseconds;
        ++_wish.attempt;
    }
    _wakeup.wake();
}

void IioReader::onListening(bool isListenedTo) noexcept {
    {
        MutexLock lock(_lock);
        _wish.isListenedTo = isListenedTo;
        ++_wish.attempt;
        ++_wish.period;
    }
    _wakeup.wake();
}

void IioReader::end() noexcept {
    {
        MutexLock lock(_lock);
        _wish.isEnding = true;
    }
    _wakeup.wake();
}

IioReader::Wish IioReader::wish() const noexcept {
    MutexLock lock(_lock);
    return _wish;
}

// --- The thread --------------------------------------------------------------------------------------------

void IioReader::run(Host::Accelerometer &accelerometer) noexcept {
    for (Wish next = wish(); !next.isEnding; next = wish()) {
        follow(next);
        wait(accelerometer);
    }
    _session.reset();
    _hasEnded.store(true, std::memory_order_release);
}

void IioReader::follow(const Wish &wish) noexcept {
    const bool isNewAttempt = wish.isListenedTo && std::exchange(_attempt, wish.attempt) != wish.attempt;
    if (std::exchange(_period, wish.period) != wish.period)
        _toldFailure.clear();
    if (!wish.isListenedTo) {
        _session.reset();
    } else if (!_session && isNewAttempt) {
        start(wish);
    } else if (_session && wish.intervalUs && wish.intervalUs != _intervalUs) {
        setInterval(*wish.intervalUs);
    }
}

void IioReader::start(const Wish &wish) noexcept {
    try {
        _session.emplace(_device, _opener, _identity.devnode, wish.intervalUs);
        _intervalUs = wish.intervalUs;
        _toldFailure.clear();
        tellFrequency();
    } catch (const std::exception &failure) {
        tellFailure(failure.what());
    }
}

void IioReader::setInterval(double intervalUs) noexcept {
    _intervalUs = intervalUs;
    try {
        _session->setInterval(intervalUs);
        tellFrequency();
    } catch (const std::exception &failure) { // it goes on as it is
        write(*_log, LogLevel::Debug,
              [&] { return describe(_identity) + " keeps its pace: " + failure.what(); });
    }
}

void IioReader::wait(Host::Accelerometer &accelerometer) noexcept {
    if (!_session)
        return _wakeup.wait();
    pollfd sets[] = {{.fd = _wakeup.descriptor(), .events = POLLIN, .revents = 0},
                     {.fd = _session->descriptor(), .events = POLLIN, .revents = 0}};
    if (::poll(sets, 2, -1) < 0) {
        if (errno != EINTR)
            lose({"wait", errno});
        return;
    }
    if (sets[0].revents != 0)
        _wakeup.wait();
    if (sets[1].revents != 0)
        receive(accelerometer, (sets[1].revents & (POLLERR | POLLHUP | POLLNVAL)) != 0);
}

void IioReader::receive(Host::Accelerometer &accelerometer, bool isBroken) noexcept {
    const auto failure =
        _session->receive(isBroken, [&](const AccelSample &sample) { deliver(accelerometer, sample); });
    if (failure)
        lose(*failure);
}

void IioReader::deliver(Host::Accelerometer &accelerometer, const AccelSample &sample) noexcept {
    const bool isStamped = sample.nanoseconds && *sample.nanoseconds >= 0;
    const std::uint64_t timestamp =
        isStamped ? _ticks.machTimeFromNanoseconds(static_cast<std::uint64_t>(*sample.nanoseconds))
                  : _clock.nowTicks();
    guarded(false, [&] { // without memory a sample is dropped
        accelerometer.deliver(sample.g[0], sample.g[1], sample.g[2], timestamp);
        return true;
    });
}

void IioReader::lose(const SystemFailure &reason) noexcept {
    _session.reset();
    const LogLevel level = reason.errorNumber == ENODEV ? LogLevel::Default : LogLevel::Error;
    write(*_log, level, [&] { return describe(_identity) + " sends no more: " + describe(reason); });
}

// --- What is told ------------------------------------------------------------------------------------------

void IioReader::tellFrequency() noexcept {
    write(*_log, LogLevel::Debug, [&] {
        const std::string &frequency = _session->frequency();
        return describe(_identity) + " samples at " +
               (frequency.empty() ? "its own pace" : frequency + " Hz") +
               (_intervalUs ? ", asked for every " + std::to_string(*_intervalUs) + " us" : "");
    });
}

void IioReader::tellFailure(const char *reason) noexcept {
    if (_toldFailure == reason)
        return;
    write(*_log, LogLevel::Error, [&] { return "no samples of " + describe(_identity) + ": " + reason; });
    guarded(false, [&] {
        _toldFailure = reason;
        return true;
    });
}

} // namespace ZorvaTouch::Linux
