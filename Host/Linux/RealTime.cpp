#include "Host/Linux/RealTime.h"

#include <pthread.h>
#include <sched.h>
#include <sys/mman.h>
#include <sys/resource.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <memory>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kSlowerUnderLoad = "; the keys work without, with more delay under load";

/// A limit of the process; one that cannot be read is none at all.
rlimit limitOf(__rlimit_resource resource) noexcept {
    rlimit limit{.rlim_cur = 0, .rlim_max = 0};
    (void)::getrlimit(resource, &limit);
    return limit;
}

std::string textOf(rlim_t limit) { return limit == RLIM_INFINITY ? "unlimited" : std::to_string(limit); }

std::string message(int errorNumber) { return std::generic_category().message(errorNumber); }

/// Locks and unlocks a page of its own.
bool canLockAPage() noexcept {
    const auto size = static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
    void *const page = ::mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (page == MAP_FAILED)
        return false;
    const bool isLocked = ::mlock2(page, size, MLOCK_ONFAULT) == 0;
    ::munmap(page, size);
    return isLocked;
}

/// Whether the limit does not hold for us. Having a capability does not tell, in a container for one; under a
/// limit of 0, only who is above it can lock a page.
bool isAboveLimit(const rlimit &limit) noexcept {
    const rlimit none{.rlim_cur = 0, .rlim_max = limit.rlim_max};
    if (::setrlimit(RLIMIT_MEMLOCK, &none) != 0)
        return false;
    const bool isAbove = canLockAPage();
    (void)::setrlimit(RLIMIT_MEMLOCK, &limit);
    return isAbove;
}

std::string whyNotRoundRobin(int priority, int errorNumber) {
    const std::string what = "real-time priority " + std::to_string(priority);
    const rlimit limit = limitOf(RLIMIT_RTPRIO);
    if (errorNumber == EINVAL)
        return what + " is none: it goes from 1 to 99";
    const bool isBeyondLimit =
        limit.rlim_cur != RLIM_INFINITY && limit.rlim_cur < static_cast<rlim_t>(priority);
    if (isBeyondLimit)
        return what + " is not allowed (RLIMIT_RTPRIO is " + textOf(limit.rlim_cur) +
               "): set LimitRTPRIO=" + std::to_string(priority) + " in the unit, or rtprio " +
               std::to_string(priority) + " in limits.conf" + kSlowerUnderLoad;
    return what + " is not allowed (" + message(errorNumber) + ", though RLIMIT_RTPRIO is " +
           textOf(limit.rlim_cur) +
           "): look for RestrictRealtime= in the unit, or for its cgroup's cpu.rt_runtime_us" +
           kSlowerUnderLoad;
}

} // namespace

std::optional<RealTimeRefusal> lockMemory() {
    const rlimit limit = limitOf(RLIMIT_MEMLOCK);
    if (limit.rlim_cur != RLIM_INFINITY && !isAboveLimit(limit))
        return RealTimeRefusal{ENOMEM,
                               "memory is not locked (RLIMIT_MEMLOCK is " + textOf(limit.rlim_cur) +
                                   "): set LimitMEMLOCK=infinity in the unit, or memlock unlimited in "
                                   "limits.conf" +
                                   kSlowerUnderLoad};
    // Without MCL_ONFAULT the whole of each thread's stack, 8 MB, would be filled and kept in memory.
    if (::mlockall(MCL_CURRENT | MCL_FUTURE | MCL_ONFAULT) == 0)
        return std::nullopt;
    const int errorNumber = errno;
    return RealTimeRefusal{errorNumber, "memory is not locked (" + message(errorNumber) +
                                            "): look for SystemCallFilter= in the unit" + kSlowerUnderLoad};
}

std::optional<RealTimeRefusal> tryRoundRobin(int priority) {
    const pthread_t self = ::pthread_self();
    int policyBefore = 0;
    sched_param before{};
    int error = ::pthread_getschedparam(self, &policyBefore, &before);
    if (error == 0) {
        sched_param wanted{};
        wanted.sched_priority = priority;
        error = ::pthread_setschedparam(self, SCHED_RR, &wanted);
    }
    if (error != 0)
        return RealTimeRefusal{error, whyNotRoundRobin(priority, error)};
    (void)::pthread_setschedparam(self, policyBefore, &before); // it goes down: always granted
    return std::nullopt;
}

} // namespace ZorvaTouch::Linux
