#include "Host/Linux/RateLimitedLogs.h"

#include "Host/Interface/Mutex.h"
#include "Host/Linux/LogCause.h"
#include "Shared/Util/Ticks.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using Host::MutexLock;
using Ports::LogLevel;
using Callback = std::shared_ptr<const std::function<void()>>;

constexpr std::uint64_t kWindowNs = 30'000'000'000;
constexpr unsigned kRecordsInAWindow = 5;
constexpr std::size_t kMostCauses = 256;
constexpr std::size_t kLongestText = 1024; ///< bytes, of a text that is held back
constexpr std::string_view kOfThis = " more of this in the last 30 s: ";
constexpr std::string_view kOfOthers = " more of other kinds in the last 30 s, such as: ";

/// A record and where it goes.
struct Record {
    std::shared_ptr<Ports::Log> log;
    LogLevel level;
    std::string text;
};
using Records = std::vector<Record>;

void send(const Records &records) noexcept {
    for (const Record &record : records)
        record.log->write(record.level, record.text);
}

std::string keptOf(std::string_view text) {
    return std::string(text.substr(0, kLongestText)).append(text.size() > kLongestText ? "..." : "");
}

/// What has become of a cause since its 30 s began.
struct Window {
    std::uint64_t startTicks = 0;
    unsigned passed = 0;          ///< records
    std::uint64_t heldBack = 0;   ///< records
    std::optional<Record> last{}; ///< of those held back
    std::string_view ofWhat = kOfThis;

    /// Moves the count, if there is one, to the records.
    void takeCount(Records &counts) {
        if (!last)
            return;
        last->text.insert(0, std::to_string(heldBack).append(ofWhat));
        counts.push_back(std::move(*last));
        last.reset();
        heldBack = 0;
    }
};

} // namespace

/// The windows of all causes.
class RateLimitedLogs::Limiter {
public:
    Limiter(Ports::Clock &clock, std::function<void()> onHeldBack, Scope scope)
        : _clock(clock), _ticks(clock), _scope(scope) {
        if (onHeldBack)
            _onHeldBack = std::make_shared<const std::function<void()>>(std::move(onHeldBack));
        _others.ofWhat = kOfOthers;
    }

    /// @param origin  Of the handle, for the cause.
    void write(const std::shared_ptr<Ports::Log> &log, std::string_view origin, LogLevel level,
               std::string_view text) {
        if (level == LogLevel::Debug && _scope == Scope::ExceptDebug)
            return log->write(level, text);
        const Outcome outcome = admit(log, logCause(level, origin, text), level, text);
        send(outcome.counts);
        if (outcome.isAdmitted)
            log->write(level, text);
        if (outcome.onHeldBack)
            (*outcome.onHeldBack)();
    }

    /// Writes counts: all, or those that are due.
    void flush(bool all) {
        Records counts;
        {
            const MutexLock lock(_lock);
            const std::uint64_t now = _clock.nowTicks();
            for (auto &[cause, window] : _windows)
                if (all || isOver(window, now))
                    window.takeCount(counts);
            if (all || isOver(_others, now))
                _others.takeCount(counts);
        }
        send(counts);
    }

    std::optional<std::chrono::microseconds> nextDue() {
        const MutexLock lock(_lock);
        const std::uint64_t now = _clock.nowTicks();
        std::optional<std::uint64_t> soonestNs = leftNs(_others, now);
        for (const auto &[cause, window] : _windows)
            if (const auto left = leftNs(window, now); left && (!soonestNs || *left < *soonestNs))
                soonestNs = left;
        if (!soonestNs)
            return std::nullopt;
        return std::chrono::microseconds((*soonestNs + 999) / 1000);
    }

    void forgetCallback() {
        const MutexLock lock(_lock);
        _onHeldBack.reset();
    }

private:
    /// What happens to a record, and what has to be done beside.
    struct Outcome {
        bool isAdmitted = false;
        Records counts{};      ///< to be written before
        Callback onHeldBack{}; ///< to be called
    };

    Outcome admit(const std::shared_ptr<Ports::Log> &log, std::string cause, LogLevel level,
                  std::string_view text) {
        Outcome outcome;
        const MutexLock lock(_lock);
        const std::uint64_t now = _clock.nowTicks();
        Window &window = windowOf(std::move(cause), now, outcome.counts);
        outcome.isAdmitted = window.passed < kRecordsInAWindow;
        if (outcome.isAdmitted) {
            ++window.passed;
            return outcome;
        }
        window.last = Record{log, level, keptOf(text)};
        if (++window.heldBack == 1)
            outcome.onHeldBack = _onHeldBack;
        return outcome;
    }

    /// The window that a record of a cause falls into, begun if need be. Counts of those that it replaces go
    /// to the records.
    Window &windowOf(std::string cause, std::uint64_t now, Records &counts) ZORVA_REQUIRES(_lock) {
        const auto found = _windows.find(cause);
        const bool isNew = found == _windows.end();
        if (isNew && makeRoom(now, counts))
            return _windows[std::move(cause)] = Window{.startTicks = now};
        Window &window = isNew ? _others : found->second;
        if (window.passed == 0 || isOver(window, now)) {
            window.takeCount(counts);
            window = {.startTicks = now, .ofWhat = window.ofWhat};
        }
        return window;
    }

    /// Makes room for one more cause: the oldest goes, if its time is over.
    /// @return Whether there is room.
    bool makeRoom(std::uint64_t now, Records &counts) ZORVA_REQUIRES(_lock) {
        if (_windows.size() < kMostCauses)
            return true;
        const auto oldest =
            std::max_element(_windows.begin(), _windows.end(), [now](const auto &one, const auto &other) {
                return now - one.second.startTicks < now - other.second.startTicks;
            });
        if (!isOver(oldest->second, now))
            return false;
        oldest->second.takeCount(counts);
        _windows.erase(oldest);
        return true;
    }

    /// Differences of ticks are right also when the clock wraps in between.
    [[nodiscard]] std::uint64_t elapsedNs(const Window &window, std::uint64_t now) const noexcept {
        return _ticks.nanosecondsFromMachTime(now - window.startTicks);
    }

    [[nodiscard]] bool isOver(const Window &window, std::uint64_t now) const noexcept {
        return elapsedNs(window, now) >= kWindowNs;
    }

    /// Until a count is due, if there is one.
    [[nodiscard]] std::optional<std::uint64_t> leftNs(const Window &window,
                                                      std::uint64_t now) const noexcept {
        if (!window.last)
            return std::nullopt;
        return kWindowNs - std::min(elapsedNs(window, now), kWindowNs);
    }

    Ports::Clock &_clock;
    const Util::TickConverter _ticks;
    const Scope _scope;
    Host::Mutex _lock;
    std::map<std::string, Window> _windows ZORVA_GUARDED_BY(_lock);
    Window _others ZORVA_GUARDED_BY(_lock); ///< of all causes that have none of their own
    Callback _onHeldBack ZORVA_GUARDED_BY(_lock);
};

class RateLimitedLogs::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<Limiter> limiter, std::shared_ptr<Ports::Log> log, std::string origin)
        : _limiter(std::move(limiter)), _log(std::move(log)), _origin(std::move(origin)) {}

    bool isEnabled(LogLevel level) const noexcept override { return _log->isEnabled(level); }

    void write(LogLevel level, std::string_view text) noexcept override {
        if (!isEnabled(level))
            return;
        try {
            _limiter->write(_log, _origin, level, text);
        } catch (...) { // no memory for the line: there is nobody to tell
        }
    }

private:
    const std::shared_ptr<Limiter> _limiter;
    const std::shared_ptr<Ports::Log> _log;
    const std::string _origin;
};

RateLimitedLogs::RateLimitedLogs(Ports::LogProvider &logs, Ports::Clock &clock,
                                 std::function<void()> onHeldBack, Scope scope)
    : _logs(logs), _limiter(std::make_shared<Limiter>(clock, std::move(onHeldBack), scope)) {}

RateLimitedLogs::~RateLimitedLogs() {
    _limiter->forgetCallback();
    finish();
}

std::shared_ptr<Ports::Log> RateLimitedLogs::openLog(std::string_view subsystem, std::string_view category) {
    std::string origin(subsystem);
    origin.append(1, '\0').append(category).append(1, '\0');
    return std::make_shared<Handle>(_limiter, _logs.openLog(subsystem, category), std::move(origin));
}

std::optional<std::chrono::microseconds> RateLimitedLogs::nextDue() const noexcept {
    return _limiter->nextDue();
}

void RateLimitedLogs::flush() noexcept {
    try {
        _limiter->flush(false);
    } catch (...) { // no memory for the counts: there is nobody to tell
    }
}

void RateLimitedLogs::finish() noexcept {
    try {
        _limiter->flush(true);
    } catch (...) { // as in `flush`
    }
}

} // namespace ZorvaTouch::Linux
