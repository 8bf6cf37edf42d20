#pragma once

#include "Host/Runtime/StreamWriter.h"
#include "Shared/Ports/Log.h"

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace ZorvaTouch::Tools {

/// Puts lines out on a thread of its own, so that whoever reads them keeps nobody else waiting, however slow
/// it is.
///
/// At most `kCapacity` lines wait. Further ones are lost, and where they would have been a line says how
/// many. After the first write that fails there is one line in the log, and no more output.
///
/// Threads: `put` any; everything else one.
class EventStream {
public:
    static constexpr std::size_t kCapacity = 1000;
    /// How long the end waits for a reader.
    static constexpr std::chrono::milliseconds kPatience{1000};

    /// Makes the line that stands for lost ones.
    using DroppedLine = std::function<std::string(std::uint64_t lines)>;

    /// @param writer       Where the lines go.
    /// @param droppedLine  Called on the stream's thread.
    /// @throws std::system_error  There is no thread to be had.
    EventStream(std::shared_ptr<Host::TextWriter> writer, DroppedLine droppedLine,
                std::shared_ptr<Ports::Log> log);
    /// Finishes.
    ~EventStream();
    EventStream(const EventStream &) = delete;
    EventStream &operator=(const EventStream &) = delete;

    /// Takes a line, with its line break. Never waits for the reader.
    void put(std::string line) noexcept;

    /// Writes what waits, and takes nothing any more. A reader that does not take it in time is given up. If
    /// not even that ends the write the thread is left behind, so that this returns after twice the patience
    /// at the latest.
    void finish(std::chrono::milliseconds patience = kPatience) noexcept;

private:
    class State;

    const std::shared_ptr<State> _state; ///< shared with what is on the thread's queue
    bool _isFinished = false;
};

} // namespace ZorvaTouch::Tools
