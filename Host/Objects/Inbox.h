#pragma once

#include "Host/Objects/LoopSource.h"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <optional>
#include <string>
#include <thread>
#include <utility>

namespace ZorvaTouch::Host {

/// What has arrived and waits to be served on a run loop, one item in each pass; bounded, and what does not
/// fit is refused. Items may arrive while there is no place on a loop; they wait.
///
/// Whoever waits for items compares counts: they are settled in the order in which they arrived, by being
/// served or thrown away.
///
/// Threads: no lock of its own; the owner's.
template <typename Item> class Inbox {
public:
    explicit Inbox(std::size_t capacity) noexcept : _capacity(capacity) {}

    /// @return Whether there was room.
    /// @throws std::bad_alloc
    [[nodiscard]] bool push(Item item) {
        if (_items.size() >= _capacity)
            return false;
        _items.push_back(std::move(item));
        ++_accepted;
        _source.signal();
        return true;
    }

    /// Begins to serve the oldest item. On the loop's thread, as is `finish`, which ends it.
    [[nodiscard]] std::optional<Item> take() {
        _server = std::this_thread::get_id();
        if (_items.empty())
            return std::nullopt;
        std::optional<Item> item(std::move(_items.front()));
        _items.pop_front();
        return item;
    }
    void finish() noexcept {
        ++_settled;
        signalIfWaiting();
    }

    /// Throws away what waits.
    /// @return How many that were.
    std::size_t discard() noexcept {
        const std::size_t count = _items.size();
        _items.clear();
        _settled += count;
        return count;
    }

    /// Items that ever arrived.
    [[nodiscard]] std::uint64_t accepted() const noexcept { return _accepted; }
    /// Whether somebody who waits for the first `count` items has to go on waiting: they are not settled, a
    /// loop will see to them, and it is not the caller's own thread that it does so on.
    [[nodiscard]] bool mustWaitFor(std::uint64_t count) const noexcept {
        return _settled < count && _source.isConnected() && _server != std::this_thread::get_id();
    }

    // The place, as LoopSource has it.

    void schedule(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform, void *context) {
        _source.schedule(loop, mode, perform, context);
        _server = {};
    }
    [[nodiscard]] Ref<ZorvaRunLoop> unschedule() noexcept { return _source.unschedule(); }
    [[nodiscard]] bool isScheduled() const noexcept { return _source.isScheduled(); }
    [[nodiscard]] bool isScheduledOn(const ZorvaRunLoop *loop, const char *mode) const noexcept {
        return _source.isScheduledOn(loop, mode);
    }
    void connect() noexcept {
        _source.connect();
        signalIfWaiting();
    }
    void disconnect() noexcept { _source.disconnect(); }
    [[nodiscard]] bool isConnected() const noexcept { return _source.isConnected(); }

private:
    void signalIfWaiting() noexcept {
        if (!_items.empty())
            _source.signal();
    }

    const std::size_t _capacity;
    std::deque<Item> _items;
    std::uint64_t _accepted = 0;
    std::uint64_t _settled = 0;
    LoopSource _source;
    std::thread::id _server; ///< whoever served this place last
};

} // namespace ZorvaTouch::Host
