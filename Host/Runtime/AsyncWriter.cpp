#include "Host/Runtime/AsyncWriter.h"

#include "Host/Interface/Mutex.h"
#include "Host/Runtime/SystemSemaphore.h"
#include "Host/Runtime/SystemThread.h"

#include <cerrno>
#include <deque>
#include <future>
#include <new>
#include <optional>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

constexpr std::chrono::milliseconds kPatience{1000}; // how long the end waits for a reader

} // namespace

/// What waits to be written. The thread shares it, so that a write that never ends keeps it.
///
/// Threads: any; `serve` on the writer's.
class AsyncWriter::State {
public:
    State(std::shared_ptr<TextWriter> writer, DroppedLine droppedLine, Failed failed)
        : _writer(std::move(writer)), _droppedLine(std::move(droppedLine)), _failed(std::move(failed)) {}

    void put(Line line) noexcept {
        if (take(std::move(line)))
            _wake.signal();
    }

    /// Counts a line as dropped.
    void drop() noexcept {
        {
            const MutexLock lock(_mutex);
            if (_isClosed)
                return;
            ++_dropped;
            _isAwake = true;
        }
        _wake.signal();
    }

    /// Writes whatever comes, until all has been written after `close`.
    void serve() noexcept {
        do {
            _wake.wait();
            writeAll();
        } while (!isDone());
        _done.set_value();
    }

    /// From now on nothing is taken, and `serve` ends with what waits.
    void close() noexcept {
        {
            const MutexLock lock(_mutex);
            _isClosed = true;
        }
        _wake.signal();
    }

    void giveUp() noexcept { _writer->giveUp(); }

    /// The thread is left behind: the object that `_failed` notifies may be destroyed.
    void abandon() noexcept {
        const MutexLock lock(_mutex);
        _isAbandoned = true;
    }

    /// Becomes ready when `serve` ends.
    [[nodiscard]] std::future<void> done() { return _done.get_future(); }

private:
    struct Entry {
        std::uint64_t droppedBefore = 0; ///< lines that are missing before this one
        Line line;                       ///< empty: none, at the end of the waiting ones
    };

    /// @return Whether the thread is to be woken.
    [[nodiscard]] bool take(Line line) noexcept {
        const MutexLock lock(_mutex);
        if (_isClosed)
            return false;
        if (!append(std::move(line)))
            ++_dropped;
        return !std::exchange(_isAwake, true);
    }

    /// @return Whether there was room for it.
    [[nodiscard]] bool append(Line line) noexcept ZORVA_REQUIRES(_mutex) {
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

    void writeAll() noexcept {
        while (const std::optional<Entry> entry = next())
            if (!write(*entry))
                return;
    }

    /// The next one to write; nothing if the queue is empty, and then the thread sleeps.
    [[nodiscard]] std::optional<Entry> next() noexcept {
        const MutexLock lock(_mutex);
        if (!_waiting.empty()) {
            Entry entry = std::move(_waiting.front());
            _waiting.pop_front();
            return entry;
        }
        if (_dropped != 0)
            return Entry{std::exchange(_dropped, 0), {}};
        _isAwake = false;
        return std::nullopt;
    }

    /// @return Whether to go on.
    [[nodiscard]] bool write(const Entry &entry) noexcept try {
        return (entry.droppedBefore == 0 || write(_droppedLine(entry.droppedBefore))) &&
               (!entry.line || write(entry.line()));
    } catch (const std::bad_alloc &) { // the line is lost
        return true;
    }

    [[nodiscard]] bool write(const std::string &line) noexcept {
        const int errorNumber = _writer->write(line);
        if (errorNumber == 0)
            return true;
        endWith(errorNumber, discard() + 1);
        return false;
    }

    /// Under the lock, so that nothing is reported once `abandon` has returned.
    void endWith(int errorNumber, std::size_t lost) noexcept {
        const MutexLock lock(_mutex);
        if (_failed && !_isAbandoned)
            _failed(errorNumber, lost);
    }

    /// @return How many lines waited.
    std::size_t discard() noexcept {
        std::deque<Entry> discarded; // destroyed without the lock
        const MutexLock lock(_mutex);
        _isClosed = true;
        _isAwake = false;
        _dropped = 0;
        discarded.swap(_waiting);
        return discarded.size();
    }

    /// Closed, with nothing left to write.
    [[nodiscard]] bool isDone() noexcept {
        const MutexLock lock(_mutex);
        return _isClosed && !_isAwake;
    }

    const std::shared_ptr<TextWriter> _writer;
    const DroppedLine _droppedLine;
    const Failed _failed;
    SystemSemaphore _wake;
    std::promise<void> _done;

    Mutex _mutex;
    std::deque<Entry> _waiting ZORVA_GUARDED_BY(_mutex);
    std::uint64_t _dropped ZORVA_GUARDED_BY(_mutex) = 0; ///< after all that wait
    bool _isAwake ZORVA_GUARDED_BY(_mutex) = false;      ///< the thread is writing, or will
    bool _isClosed ZORVA_GUARDED_BY(_mutex) = false;     ///< nothing is taken any more
    bool _isAbandoned ZORVA_GUARDED_BY(_mutex) = false;
};

AsyncWriter::AsyncWriter(const char *threadName, std::shared_ptr<TextWriter> writer, DroppedLine droppedLine,
                         Failed failed)
    : _state(std::make_shared<State>(std::move(writer), std::move(droppedLine), std::move(failed))),
      _thread(startSystemThread(threadName, [state = _state] { state->serve(); })) {}

AsyncWriter::~AsyncWriter() { finish(); }

void AsyncWriter::put(Line line) noexcept { _state->put(std::move(line)); }

void AsyncWriter::put(std::string line) noexcept try {
    put(Line([line = std::move(line)] { return line; }));
} catch (const std::bad_alloc &) {
    drop();
}

void AsyncWriter::drop() noexcept { _state->drop(); }

void AsyncWriter::finish() noexcept { finish(kPatience); }

void AsyncWriter::finish(std::chrono::milliseconds patience) noexcept {
    const std::unique_ptr<Thread> thread = std::exchange(_thread, nullptr);
    if (!thread)
        return;
    const std::future<void> done = _state->done();
    _state->close();
    if (done.wait_for(patience) == std::future_status::timeout) {
        _state->giveUp();
        if (done.wait_for(patience) == std::future_status::timeout) {
            _state->abandon();
            return;
        }
    }
    thread->join();
}

} // namespace ZorvaTouch::Host
