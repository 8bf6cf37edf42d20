#pragma once

#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <string_view>

namespace ZorvaTouch::Linux {

/// Keeps a log from being flooded: of each cause (`LogCause.h`), 5 records in 30 s go on to another
/// provider's logs. The rest is counted, and when the 30 s are over,
///
///     7 more of this in the last 30 s: TEXT OF THE LAST
///
/// goes where they would have gone. The 30 s begin with the first record after the last 30 s.
///
/// At most 256 causes are told apart at a time. One more takes the place of the cause whose 30 s are over the
/// longest; while there is none, all further causes share their 5 records. Of a text that is held back the
/// first 1024 bytes are kept.
///
/// There is no timer in it. A count goes out with the next record of its cause, or when the owner calls
/// `flush`, which is due when `nextDue` says so.
///
/// Threads:  any; no log and no callback is called under a lock.
/// Realtime: as good as the other provider's logs; allocates.
class RateLimitedLogs final : public Ports::LogProvider {
public:
    enum class Scope {
        Everything,
        ExceptDebug, ///< records of the level debug pass: who asks for them wants all
    };

    /// @param logs        Borrowed; outlives this.
    /// @param clock       Borrowed; outlives this and its handles. Called by any thread, one at a time.
    /// @param onHeldBack  `nextDue` may be sooner than it was. Called once for each cause and 30 s in which
    ///                    anything is held back, on the thread that wrote; not once this is gone. What it
    ///                    throws is dropped.
    /// @throws std::system_error, std::bad_alloc
    RateLimitedLogs(Ports::LogProvider &logs, Ports::Clock &clock, std::function<void()> onHeldBack,
                    Scope scope = Scope::Everything);
    /// Writes all counts, as `finish`. Handles that go on keep to the limit.
    ~RateLimitedLogs() override;
    RateLimitedLogs(const RateLimitedLogs &) = delete;
    RateLimitedLogs &operator=(const RateLimitedLogs &) = delete;

    /// @throws std::bad_alloc
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

    /// How long from now until there is a count to be flushed, rounded up; 0 when there is one already.
    /// Nothing when nothing is held back.
    [[nodiscard]] std::optional<std::chrono::microseconds> nextDue() const noexcept;
    /// Writes the counts of those causes whose 30 s are over.
    void flush() noexcept;
    /// Writes all counts, also of causes whose 30 s are not over: for a program's end.
    void finish() noexcept;

private:
    class Limiter;
    class Handle;

    Ports::LogProvider &_logs;
    const std::shared_ptr<Limiter> _limiter; ///< shared with the handles, which may outlive the provider
};

} // namespace ZorvaTouch::Linux
