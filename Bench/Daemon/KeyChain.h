#pragma once

#include "Bench/Daemon/KeyJourney.h"
#include "Bench/Latency/Link.h"
#include "Bench/SampleReports.h"

#include <memory>
#include <vector>

namespace ZorvaTouch::Bench {

/// Something that reads reports from a link on one thread and presses keys on another.
class KeyChain {
public:
    virtual ~KeyChain() = default;
    /// Tells of the keys of the reports that are written from now on.
    virtual void watch(KeyJourney *journey) = 0;
    /// It is this report's time.
    virtual void advanceTo(std::size_t /*report*/) {}
    /// Processor time of everything but the calling thread, in ns.
    [[nodiscard]] virtual double cpuNs() = 0;
    /// Waits until so many reports have been read, ever.
    virtual void waitForReports(std::size_t reports) const = 0;
};

/// Sends one report in so many on: as often as the daemon presses a key.
inline constexpr std::size_t kReportsForAKey = 50;

/// The daemon's own: hidraw device, plug-in, key map, keyboard. Only the node and the keyboard's end are
/// doubles.
/// @param realTime  Both threads run at SCHED_RR 63, else at the usual policy.
[[nodiscard]] std::unique_ptr<KeyChain> makeDaemonChain(const Link &link, bool realTime);

/// The least that can do: epoll, an eventfd, another thread.
[[nodiscard]] std::unique_ptr<KeyChain> makeBareKeyChain(const Link &link, bool realTime);

} // namespace ZorvaTouch::Bench
