#include "Host/Runtime/AsioRunLoop.h"

#include "Host/Runtime/AsioRunLoopTable.h"
#include "Host/Runtime/RunLoopSource.h"

#include <asio/error.hpp>

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Host {

std::shared_ptr<RunLoop> AsioRunLoop::create(std::shared_ptr<Ports::Log> log) {
    auto loop = Ref<ZorvaRunLoop>::adopt(new AsioRunLoop(std::move(log)));
    auto &self = of(loop.get());
    // The shared pointer holds one of the references that devices hold too.
    return {&self, [reference = std::move(loop)](RunLoop *) mutable { reference.reset(); }};
}

AsioRunLoop::AsioRunLoop(std::shared_ptr<Ports::Log> log)
    : BoundaryObject(&Table::kTable), _log(std::move(log)) {}

AsioRunLoop::~AsioRunLoop() {
    // Nothing here allocates: a loop is also destroyed when there was no memory to finish making it.
    Sources sources;
    std::list<Closure> closures;
    {
        const MutexLock lock(_mutex);
        sources.swap(_sources);
        closures.swap(_closures);
    }
    // Waits that are called off are destroyed with the context, and keep their sources until then.
    for (const auto &source : sources)
        source->watch.reset();
}

// --- The pass ------------------------------------------------------------------------------------

RunOutcome AsioRunLoop::runOneSource(std::string_view mode) {
    for (;;) {
        runClosures(mode);
        bool mayBlock = true;
        if (const auto end = beginWait(mode, mayBlock))
            return *end;
        if (mayBlock)
            _io.run_one();
        else
            _io.poll(); // the others have their turn to become ready, too
        if (const auto source = takeReady(mode)) {
            source->perform(source->context);
            return finishServing(source);
        }
    }
}

void AsioRunLoop::runClosures(std::string_view mode) {
    if (!_hasClosures) // one that comes right now keeps the pass from waiting
        return;
    // Those that come meanwhile wait for the next time.
    for (std::size_t left = closureCount(mode); left != 0; --left) {
        auto job = takeClosure(mode);
        if (!job)
            return;
        job->run();
        noteUserCode();
    }
}

void AsioRunLoop::noteUserCode() {
    const MutexLock lock(_mutex);
    _lastUserCode = ++_lastMoment;
}

std::size_t AsioRunLoop::closureCount(std::string_view mode) {
    const MutexLock lock(_mutex);
    return static_cast<std::size_t>(
        std::ranges::count_if(_closures, [&](const Closure &closure) { return closure.mode == mode; }));
}

std::optional<Job> AsioRunLoop::takeClosure(std::string_view mode) {
    const MutexLock lock(_mutex);
    const auto closure = std::ranges::find_if(_closures, [&](const Closure &c) { return c.mode == mode; });
    if (_isStopAsked || closure == _closures.end())
        return std::nullopt;
    Job job = std::move(closure->job);
    _closures.erase(closure);
    _hasClosures = !_closures.empty();
    _lastUserCode = ++_lastMoment;
    return job;
}

std::optional<RunOutcome> AsioRunLoop::beginWait(std::string_view mode, bool &mayBlock) {
    const auto isOfMode = [&](const auto &sourceOrClosure) { return sourceOrClosure.mode == mode; };
    const MutexLock lock(_mutex);
    if (std::exchange(_isStopAsked, false))
        return RunOutcome::Stopped;
    if (std::ranges::none_of(_sources, [&](const auto &source) { return isOfMode(*source); }))
        return RunOutcome::Finished;
    mayBlock = !longestReady(mode) && std::ranges::none_of(_closures, isOfMode);
    _io.restart(); // a wake that comes from now on ends the wait
    return std::nullopt;
}

std::shared_ptr<AsioRunLoop::Source> AsioRunLoop::takeReady(std::string_view mode) {
    const MutexLock lock(_mutex);
    if (_isStopAsked)
        return nullptr;
    while (auto source = longestReady(mode)) {
        const bool isReady = isStillReady(*source);
        source->readySince = 0;
        source->isSignalled = false;
        if (isReady) {
            _lastUserCode = ++_lastMoment;
            return source;
        }
        wait(source);
    }
    return nullptr;
}

RunOutcome AsioRunLoop::finishServing(const std::shared_ptr<Source> &source) {
    const MutexLock lock(_mutex);
    _lastUserCode = ++_lastMoment;
    if (!source->isRemoved)
        wait(source);
    return std::exchange(_isStopAsked, false) ? RunOutcome::Stopped : RunOutcome::HandledSource;
}

void AsioRunLoop::waitEnded(Source &source, const asio::error_code &error) {
    const MutexLock lock(_mutex);
    source.isWaiting = false;
    if (!source.isRemoved && error != asio::error::operation_aborted)
        makeReady(source); // an error, too: whoever reads will meet it
}

// --- Sources, under the lock -----------------------------------------------------------------------

void AsioRunLoop::wait(const std::shared_ptr<Source> &source) {
    if (!source->watch || source->isWaiting)
        return;
    source->isWaiting = true;
    source->waitingSince = ++_lastMoment;
    source->watch->wait(WaitHandler(*this, source));
}

void AsioRunLoop::makeReady(Source &source) {
    if (source.readySince == 0)
        source.readySince = ++_lastMoment;
}

std::shared_ptr<AsioRunLoop::Source> AsioRunLoop::longestReady(std::string_view mode) {
    std::shared_ptr<Source> longest;
    for (const auto &source : _sources)
        if (source->readySince != 0 && source->mode == mode &&
            (!longest || source->readySince < longest->readySince))
            longest = source;
    return longest;
}

/// What a wait has told may be out of date: other code may have read since, and the first wait of a source
/// may have ended by what its predecessor in the context's tables was owed.
bool AsioRunLoop::isStillReady(Source &source) {
    if (!source.watch || source.isSignalled)
        return true;
    if (source.wasReadable && source.waitingSince > _lastUserCode)
        return true;
    const bool isReadable = source.watch->isReadable();
    source.wasReadable = source.wasReadable || isReadable;
    return isReadable;
}

AsioRunLoop::Sources::iterator AsioRunLoop::find(std::uint64_t number) {
    return std::ranges::find_if(_sources, [&](const auto &source) { return source->number == number; });
}

void AsioRunLoop::wake() noexcept { _io.stop(); }

// --- From any thread -------------------------------------------------------------------------------

void AsioRunLoop::stop() noexcept {
    const MutexLock lock(_mutex);
    _isStopAsked = true;
    wake();
}

void AsioRunLoop::perform(std::string_view mode, std::function<void()> closure) {
    Job job(std::move(closure));
    enqueue(mode, job);
}

void AsioRunLoop::enqueue(std::string_view mode, Job &job) {
    const MutexLock lock(_mutex);
    _closures.push_back({std::string(mode), {}});
    _closures.back().job = std::move(job);
    _hasClosures = true;
    wake();
}

std::uint64_t AsioRunLoop::add(const std::shared_ptr<Source> &source) {
    const MutexLock lock(_mutex);
    _sources.reserve(_sources.size() + 1); // a source is listed when nothing can fail any more
    wait(source);
    source->number = ++_lastNumber;
    _sources.push_back(source);
    wake();
    return source->number;
}

std::uint64_t AsioRunLoop::addDescriptor(const std::shared_ptr<Source> &source, int descriptor) {
    source->watch.emplace(_io, descriptor);
    return add(source);
}

void AsioRunLoop::signal(std::uint64_t number) noexcept {
    const MutexLock lock(_mutex);
    const auto source = find(number);
    if (source == _sources.end())
        return;
    (*source)->isSignalled = true;
    makeReady(**source);
    wake();
}

void AsioRunLoop::remove(std::uint64_t number) noexcept {
    std::shared_ptr<Source> source;
    const MutexLock lock(_mutex);
    const auto position = find(number);
    if (position == _sources.end())
        return;
    source = std::move(*position);
    _sources.erase(position);
    source->isRemoved = true;
    source->watch.reset();
    wake();
}

} // namespace ZorvaTouch::Host
