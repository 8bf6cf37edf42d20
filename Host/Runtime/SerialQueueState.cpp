#include "Host/Runtime/SerialQueueState.h"

#include "Host/Runtime/HandlerMemory.h"
#include "Host/Runtime/SystemThread.h"

#include <asio/post.hpp>

#include <cstring>
#include <exception>
#include <memory>
#include <string>
#include <utility>

namespace ZorvaTouch::Host {

SerialQueue::State::State(std::string name, std::shared_ptr<Ports::Log> log)
    : BoundaryObject(&kTable), _name(std::move(name)), _log(std::move(log)) {}

/// A job on its way through the context, and the memory that the context needs for it: whoever has made one
/// can submit it without fail.
struct SerialQueue::State::Submission {
    Job job;
    HandlerMemory memory;
};

/// What the context calls. Destroyed uncalled, it discards its job.
class SerialQueue::State::SubmissionHandler {
public:
    using allocator_type = HandlerAllocator<void>; // NOLINT(readability-identifier-naming): asio's name

    SubmissionHandler(State &state, std::unique_ptr<Submission> submission) noexcept
        : _state(&state), _submission(std::move(submission)) {}

    [[nodiscard]] allocator_type get_allocator() const noexcept { // NOLINT(readability-identifier-naming)
        return allocator_type(_submission->memory);
    }
    void operator()() { _state->run(_submission->job); }

private:
    State *_state;
    std::unique_ptr<Submission> _submission;
};

bool SerialQueue::State::submit(Job &job) {
    auto submission = std::make_unique<Submission>();
    const MutexLock lock(_mutex);
    if (_hasEnded)
        return false;
    submission->job = std::move(job);
    asio::post(_io, SubmissionHandler(*this, std::move(submission)));
    return true;
}

void SerialQueue::State::serve(int roundRobinPriority) {
    takePriority(roundRobinPriority);
    _io.run();
    discardRest();
}

void SerialQueue::State::takePriority(int roundRobinPriority) {
    if (roundRobinPriority == 0)
        return;
    if (const int errorNumber = setRoundRobinPriorityOfThisThread(roundRobinPriority))
        logError("no real-time priority: ", ::strerrordesc_np(errorNumber));
}

void SerialQueue::State::run(Job &job) noexcept {
    if (_isDiscarding)
        return;
    try {
        job.run();
    } catch (const std::exception &failure) {
        logError("a function has failed: ", failure.what());
    } catch (...) {
        logError("a function has failed");
    }
}

void SerialQueue::State::end() noexcept {
    const MutexLock lock(_mutex);
    _hasEnded = true;
    _io.stop();
}

void SerialQueue::State::discardRest() {
    _isDiscarding = true;
    _io.restart();
    _io.poll();
}

void SerialQueue::State::logError(std::string_view text, const char *reason) noexcept {
    try {
        std::string line = _name + ": ";
        line.append(text).append(reason ? reason : "");
        _log->write(Ports::LogLevel::Error, line);
    } catch (...) { // no memory for the line
    }
}

ZorvaBoolean SerialQueue::State::submit(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard,
                                        void *context) noexcept {
    if (!run)
        return 0;
    Job job(run, discard, context);
    try {
        if (of(queue).submit(job))
            return 1;
    } catch (...) { // no memory
    }
    job.disown();
    return 0;
}

const ZorvaQueueTable SerialQueue::State::kTable{
    .size = sizeof(ZorvaQueueTable),
    .retain = State::retain<ZorvaQueue>,
    .release = State::release<ZorvaQueue>,
    .submit = State::submit,
};

} // namespace ZorvaTouch::Host
