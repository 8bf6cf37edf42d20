#include "Tools/Daemon/EventStream.h"

#include "Host/Interface/Mutex.h"
#include "Host/Runtime/SerialQueue.h"

#include <cerrno>
#include <deque>
#include <exception>
#include <future>
#include <new>
#include <optional>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Tools {

/// What waits to be written, and the thread that writes it. Each call on the queue shares it, so that a call
/// that never ends keeps it, and nobody else waits for that.
///
/// Threads: any.
class EventStream::State : public std::enable_shared_from_this<State> {
public:
    State(std::shared_ptr<Host::TextWriter> writer, DroppedLine droppedLine, std::shared_ptr<Ports::Log> log)
        : _writer(std::move(writer)), _droppedLine(std::move(droppedLine)), _log(std::move(log)) {}

    void put(std::string line) noexcept {
        if (take(std::move(line)) && !submitWriteAll())
            missed();
    }

    /// From now on nothing is taken.
    void close() noexcept {
        const Host::MutexLock lock(_mutex);
        _isClosed = true;
    }

    /// Has everything written.
    /// @return What becomes ready when that has been done.
    /// @throws std::bad_alloc
    [[nodiscard]] std::future<void> flush() {
        const auto done = std::make_shared<std::promise<void>>();
        _queue.submit([state = shared_from_this(), done] {
            state->writeAll();
            done->set_value();
        });
        return done->get_future();
    }

    void giveUp() noexcept { _writer->giveUp(); }

    /// Waits until no call on the queue shares this any more.
    void settle() { _queue.drain(); }

private:
    struct Entry {
        std::uint64_t droppedBefore = 0; ///< lines that are missing before this one
        std::string line;                ///< empty: none, at the end of the waiting ones
    };

    /// @return Whether `writeAll` is to be called for it, and for those before it.
    [[nodiscard]] bool take(std::string line) noexcept {
        const Host::MutexLock lock(_mutex);
        if (_isClosed)
            return false;
        if (!append(std::move(line)))
            ++_dropped;
        return !std::exchange(_isAwaited, true);
    }

    [[nodiscard]] bool submitWriteAll() noexcept try {
        _queue.submit([state = shared_from_this()] { state->writeAll(); });
        return true;
    } catch (const std::bad_alloc &) {
        return false;
    }

    /// `writeAll` was not called: that is up to the next line.
    void missed() noexcept {
        const Host::MutexLock lock(_mutex);
        _isAwaited = false;
    }

    void writeAll() noexcept try {
        while (const std::optional<Entry> entry = next()) {
            if (entry->droppedBefore != 0 && !write(_droppedLine(entry->droppedBefore)))
                return;
            if (!entry->line.empty() && !write(entry->line))
                return;
        }
    } catch (const std::bad_alloc &) {
        missed();
    }

    /// @return Whether there was room for it.
    [[nodiscard]] bool append(std::string line) noexcept ZORVA_REQUIRES(_mutex) {
        if (_waiting.size() >= kCapacity)
            return false;
        try {
            _waiting.push_back({_dropped, std::move(line)});
        } catch (const std::bad_alloc &) {
            return false;
        }
        _dropped = 0;
        return true;
    }

    /// The next one to write; nothing if there is none, and then `writeAll` is to be called again.
    [[nodiscard]] std::optional<Entry> next() noexcept {
        const Host::MutexLock lock(_mutex);
        if (!_waiting.empty()) {
            Entry entry = std::move(_waiting.front());
            _waiting.pop_front();
            return entry;
        }
        if (_dropped != 0)
            return Entry{std::exchange(_dropped, 0), {}};
        _isAwaited = false;
        return std::nullopt;
    }

    /// @return Whether to go on.
    [[nodiscard]] bool write(const std::string &line) {
        const int errorNumber = _writer->write(line);
        if (errorNumber == 0)
            return true;
        endWith(errorNumber);
        return false;
    }

    void endWith(int errorNumber) {
        const std::size_t lost = discard() + 1;
        _log->write(Ports::LogLevel::Error,
                    errorNumber == ECANCELED
                        ? "standard output: its reader hangs; lines that it does not get: " +
                              std::to_string(lost)
                        : "standard output: cannot write: " + std::generic_category().message(errorNumber) +
                              "; nothing is shown any more");
    }

    /// @return How many lines waited.
    std::size_t discard() noexcept {
        std::deque<Entry> discarded; // destroyed without the lock
        const Host::MutexLock lock(_mutex);
        _isClosed = true;
        _dropped = 0;
        discarded.swap(_waiting);
        return discarded.size();
    }

    const std::shared_ptr<Host::TextWriter> _writer;
    const DroppedLine _droppedLine;
    const std::shared_ptr<Ports::Log> _log;

    Host::Mutex _mutex;
    std::deque<Entry> _waiting ZORVA_GUARDED_BY(_mutex);
    std::uint64_t _dropped ZORVA_GUARDED_BY(_mutex) = 0; ///< after all that wait
    bool _isAwaited ZORVA_GUARDED_BY(_mutex) = false;    ///< `writeAll` is running, or will
    bool _isClosed ZORVA_GUARDED_BY(_mutex) = false;     ///< nothing is taken any more

    Host::SerialQueue _queue{"zorva-print"};
};

EventStream::EventStream(std::shared_ptr<Host::TextWriter> writer, DroppedLine droppedLine,
                         std::shared_ptr<Ports::Log> log)
    : _state(std::make_shared<State>(std::move(writer), std::move(droppedLine), std::move(log))) {}

EventStream::~EventStream() { finish(); }

void EventStream::put(std::string line) noexcept { _state->put(std::move(line)); }

void EventStream::finish(std::chrono::milliseconds patience) noexcept try {
    if (std::exchange(_isFinished, true))
        return;
    _state->close();
    const std::future<void> written = _state->flush();
    if (written.wait_for(patience) == std::future_status::timeout) {
        _state->giveUp();
        if (written.wait_for(patience) == std::future_status::timeout)
            return;
    }
    _state->settle();
} catch (const std::exception &) { // no memory: what waits is lost
    _state->giveUp();
}

} // namespace ZorvaTouch::Tools
