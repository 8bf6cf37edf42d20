#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <functional>
#include <utility>

namespace ZorvaTouch::Host {

/// A function handed over to be run later: it is run once or, if it never comes to that, discarded.
///
/// Threads: one at a time.
class [[gnu::visibility("hidden")]] Job {
public:
    /// Nothing to run and nothing to discard.
    Job() noexcept = default;
    explicit Job(std::function<void()> function) noexcept : _function(std::move(function)) {}
    /// @param toRun, toDiscard  Exactly one of them will be called with `context`; `toDiscard` may be null.
    Job(ZorvaFunction toRun, ZorvaFunction toDiscard, void *context) noexcept
        : _run(toRun), _discard(toDiscard), _context(context) {}

    Job(Job && other) noexcept { swap(other); }
    Job &operator=(Job &&other) noexcept {
        Job taken(std::move(other));
        swap(taken);
        return *this;
    }
    Job(const Job &) = delete;
    Job &operator=(const Job &) = delete;
    ~Job() {
        if (_run && _discard)
            _discard(_context);
    }

    /// At most once. What a function throws comes through.
    void run() {
        if (const ZorvaFunction ofTheBoundary = std::exchange(_run, nullptr))
            ofTheBoundary(_context);
        else if (const auto function = std::exchange(_function, nullptr))
            function();
    }

    /// Leaves it to somebody else: it will be neither run nor discarded.
    void disown() noexcept { _run = nullptr; }

private:
    void swap(Job & other) noexcept {
        std::swap(_function, other._function);
        std::swap(_run, other._run);
        std::swap(_discard, other._discard);
        std::swap(_context, other._context);
    }

    std::function<void()> _function;
    ZorvaFunction _run = nullptr;
    ZorvaFunction _discard = nullptr;
    void *_context = nullptr;
};

} // namespace ZorvaTouch::Host
