#pragma once

#include "Host/Interface/Platform.h"
#include "Host/Runtime/StreamWriter.h"

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace ZorvaTouch::Host {

/// A bounded queue of lines and the thread that writes them, so that a slow reader never delays the threads
/// that put lines.
///
/// At most `kCapacity` lines wait. Further ones are dropped and counted, and one line in their place gives
/// the count. After the first write that fails nothing more is written.
///
/// Threads: `put` any; everything else one.
class AsyncWriter {
public:
    static constexpr std::size_t kCapacity = 1000;

    /// Makes a line with its line break; called on the writer's thread. May throw std::bad_alloc, and then
    /// the line is lost.
    using Line = std::function<std::string()>;
    /// Makes the line that stands for dropped ones.
    using DroppedLine = std::function<std::string(std::uint64_t lines)>;
    /// Called once, on the writer's thread, when a write has failed. Must neither throw nor
    /// put lines here. May be empty.
    /// @param errorNumber  ECANCELED: the reader was given up at the end.
    /// @param lost         Lines that waited, with the one that failed.
    using Failed = std::function<void(int errorNumber, std::size_t lost)>;

    /// @param threadName  At most 15 characters.
    /// @param writer      Where the lines go.
    /// @throws std::system_error  The system has no thread or semaphore to give.
    AsyncWriter(const char *threadName, std::shared_ptr<TextWriter> writer, DroppedLine droppedLine,
                Failed failed);
    /// Finishes.
    ~AsyncWriter();
    AsyncWriter(const AsyncWriter &) = delete;
    AsyncWriter &operator=(const AsyncWriter &) = delete;

    /// Takes a line, or counts it as dropped.
    ///
    /// Realtime: never waits for the reader; takes a lock with priority inheritance for the queue alone, and
    /// allocates.
    void put(Line line) noexcept;
    void put(std::string line) noexcept;
    /// Counts a line that there was no memory to put.
    void drop() noexcept;

    /// Writes what waits, and takes nothing any more. A reader that does not take it in time is given up. If
    /// not even that ends the write the thread is left behind, so that this returns after twice the patience
    /// at the latest; what it still does reports to no one.
    void finish(std::chrono::milliseconds patience) noexcept;
    /// With the patience that programs have, a second.
    void finish() noexcept;

private:
    class State;

    const std::shared_ptr<State> _state; ///< shared with the thread
    std::unique_ptr<Thread> _thread;     ///< null once finished
};

} // namespace ZorvaTouch::Host
