#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Runtime/Job.h"
#include "Host/Runtime/SerialQueue.h"
#include "Plugin/BoundaryObject.h"
#include "Shared/Ports/Log.h"

#include <asio/executor_work_guard.hpp>
#include <asio/io_context.hpp>

#include <memory>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {

/// What the queue, its thread and its users share.
///
/// Threads: any; `serve` on the queue's.
class [[gnu::visibility("hidden")]] SerialQueue::State final : public BoundaryObject<State, ZorvaQueue> {
public:
    State(std::string name, std::shared_ptr<Ports::Log> log);

    /// Hands over `job`, or leaves it as it is if the queue has ended.
    /// @throws std::bad_alloc  `job` is as it was, too.
    [[nodiscard]] bool submit(Job & job);

    /// Runs jobs until the end is asked for, and discards the others.
    void serve(int roundRobinPriority);
    void end() noexcept;

    /// @param reason  Follows the text; may be null.
    void logError(std::string_view text, const char *reason = nullptr) noexcept;

private:
    friend BoundaryObject;
    static const ZorvaQueueTable kTable;
    static ZorvaBoolean submit(ZorvaQueue * queue, ZorvaFunction run, ZorvaFunction discard,
                               void *context) noexcept;

    struct Submission;
    class SubmissionHandler;

    ~State() = default;
    void takePriority(int roundRobinPriority);
    void run(Job & job) noexcept;
    void discardRest();

    const std::string _name;
    const std::shared_ptr<Ports::Log> _log;
    asio::io_context _io{1};
    asio::executor_work_guard<asio::io_context::executor_type> _work{_io.get_executor()};

    bool _isDiscarding = false; ///< the queue thread's

    Mutex _mutex; ///< the queue's thread does without, so that it never meets those who have just woken it
    bool _hasEnded ZORVA_GUARDED_BY(_mutex) = false;
};

} // namespace ZorvaTouch::Host
