#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Interface/RunLoop.h"
#include "Host/Runtime/DescriptorWatch.h"
#include "Host/Runtime/Job.h"
#include "Plugin/BoundaryObject.h"
#include "Shared/Ports/Log.h"

#include <asio/error_code.hpp>
#include <asio/executor_work_guard.hpp>
#include <asio/io_context.hpp>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <list>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Host {

/// A run loop that sleeps in an `asio::io_context`.
///
/// A source is either signalled or has a descriptor. It becomes ready and stays so until it is served, also
/// while another mode runs; of several the one that has waited longest comes first. A descriptor is served
/// as long as it is readable, has failed or was hung up: whoever finds an end or an error there removes the
/// source. One that cannot be polled (a regular file) is refused: it is always readable, so its `perform`
/// would run without a pause. Readiness that other code may have used up in the meantime is asked for again,
/// so that `perform` can read without blocking.
///
/// Closures in turn: those that are there when a pass looks for them, in order, before the next source. So
/// closures that make closures, and sources that are always ready, leave room for each other.
///
/// Threads:  `runOneSource` on one thread at a time; everything else on any. No lock is held while a
///           `perform` or a closure runs.
/// Realtime: a pass that serves a descriptor allocates nothing and costs one epoll_wait and one epoll_ctl,
///           and one poll if other code has run on the loop since the descriptor was last served.
class [[gnu::visibility("hidden")]] AsioRunLoop final : public RunLoop,
                                                        public BoundaryObject<AsioRunLoop, ZorvaRunLoop> {
public:
    /// @param log  Told of sources that are refused.
    /// @throws std::system_error
    [[nodiscard]] static std::shared_ptr<RunLoop> create(std::shared_ptr<Ports::Log> log);
    ~AsioRunLoop() override;

    [[nodiscard]] RunOutcome runOneSource(std::string_view mode) override;
    void stop() noexcept override;
    void perform(std::string_view mode, std::function<void()> closure) override;
    [[nodiscard]] ZorvaRunLoop *boundary() noexcept override { return this; }

private:
    friend BoundaryObject;
    struct Table;
    struct Source;
    class WaitHandler;
    struct Closure {
        std::string mode;
        Job job;
    };
    using Sources = std::vector<std::shared_ptr<Source>>;

    explicit AsioRunLoop(std::shared_ptr<Ports::Log> log);

    std::uint64_t add(const std::shared_ptr<Source> &source);
    /// @throws std::system_error  The descriptor cannot be watched.
    std::uint64_t addDescriptor(const std::shared_ptr<Source> &source, int descriptor);
    void signal(std::uint64_t number) noexcept;
    void remove(std::uint64_t number) noexcept;
    /// @throws std::bad_alloc  `job` is left as it was.
    void enqueue(std::string_view mode, Job & job);

    void runClosures(std::string_view mode);
    [[nodiscard]] std::size_t closureCount(std::string_view mode);
    [[nodiscard]] std::optional<Job> takeClosure(std::string_view mode);
    void noteUserCode();

    /// A reason to end, or else whether there is nothing to do but to wait.
    [[nodiscard]] std::optional<RunOutcome> beginWait(std::string_view mode, bool &mayBlock);
    [[nodiscard]] std::shared_ptr<Source> takeReady(std::string_view mode);
    [[nodiscard]] RunOutcome finishServing(const std::shared_ptr<Source> &source);
    void waitEnded(Source & source, const asio::error_code &error);

    /// Until it is ready again.
    void wait(const std::shared_ptr<Source> &source) ZORVA_REQUIRES(_mutex);
    void makeReady(Source & source) ZORVA_REQUIRES(_mutex);
    [[nodiscard]] std::shared_ptr<Source> longestReady(std::string_view mode) ZORVA_REQUIRES(_mutex);
    [[nodiscard]] bool isStillReady(Source & source) ZORVA_REQUIRES(_mutex);
    [[nodiscard]] Sources::iterator find(std::uint64_t number) ZORVA_REQUIRES(_mutex);
    void wake() noexcept ZORVA_REQUIRES(_mutex);

    const std::shared_ptr<Ports::Log> _log;
    asio::io_context _io{1};
    asio::executor_work_guard<asio::io_context::executor_type> _work{_io.get_executor()};

    Mutex _mutex;
    bool _isStopAsked ZORVA_GUARDED_BY(_mutex) = false;
    Sources _sources ZORVA_GUARDED_BY(_mutex);
    std::list<Closure> _closures ZORVA_GUARDED_BY(_mutex); ///< an empty one has no memory: see the destructor
    std::atomic<bool> _hasClosures{
        false}; ///< changed under the lock; a look without it saves most passes one
    std::uint64_t _lastNumber ZORVA_GUARDED_BY(_mutex) = 0;
    std::uint64_t _lastMoment ZORVA_GUARDED_BY(_mutex) = 0;   ///< counts what happens, to tell its order
    std::uint64_t _lastUserCode ZORVA_GUARDED_BY(_mutex) = 0; ///< when one began or ended last
};

} // namespace ZorvaTouch::Host
