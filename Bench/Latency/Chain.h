#pragma once

#include "Bench/Latency/Journey.h"

#include <memory>

namespace ZorvaTouch::Bench {

class Link;

/// Something that reads reports from a link on one thread and has each arrive at a callback on another.
class Chain {
public:
    virtual ~Chain() = default;
    /// Marks the stages of the reports that are written from now on.
    virtual void watch(Journey *journey) = 0;
};

/// The service, with the queue of the host library. Each report makes an event.
/// @param realTime  Both threads run at SCHED_RR 63, else at the usual policy.
[[nodiscard]] std::unique_ptr<Chain> makeServiceChain(const Link &link, bool realTime);

/// The same two threads and nothing else: what the event library itself takes.
[[nodiscard]] std::unique_ptr<Chain> makeBareChain(const Link &link, bool realTime);

} // namespace ZorvaTouch::Bench
