#include "Host/Linux/RealTime.h"

#include <gtest/gtest.h>

#include <grp.h>
#include <pthread.h>
#include <sched.h>
#include <sys/mman.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <thread>

namespace ZorvaTouch::Linux {
namespace {

constexpr uid_t kNobody = 65534;

// Under the sanitizers mlockall does nothing, and says that it has.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr bool kLocksMemory = false;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
constexpr bool kLocksMemory = false;
#else
constexpr bool kLocksMemory = true;
#endif
#else
constexpr bool kLocksMemory = true;
#endif

void limit(__rlimit_resource resource, rlim_t value) {
    const rlimit both{.rlim_cur = value, .rlim_max = value};
    if (::setrlimit(resource, &both) != 0)
        std::abort();
}

/// Makes the process one without privileges.
void becomeNobody() {
    if (::geteuid() != 0)
        return;
    if (::setgroups(0, nullptr) != 0 || ::setgid(kNobody) != 0 || ::setuid(kNobody) != 0)
        std::abort();
}

/// What a refusal says; "granted" without one.
std::string lineOf(const std::optional<RealTimeRefusal> &refusal) {
    return refusal ? refusal->line : "granted";
}

/// Runs something in a process of its own.
/// @return What it returned.
std::string inAProcess(const std::function<std::string()> &body) {
    int ends[2];
    if (::pipe(ends) != 0)
        std::abort();
    const pid_t child = ::fork();
    if (child == 0) {
        const std::string text = body();
        ::_exit(::write(ends[1], text.data(), text.size()) == static_cast<ssize_t>(text.size()) ? 0 : 1);
    }
    ::close(ends[1]);
    std::string text(4096, '\0');
    text.resize(static_cast<std::size_t>(::read(ends[0], text.data(), text.size())));
    ::close(ends[0]);
    int status = 0;
    EXPECT_EQ(::waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
    return text;
}

/// A number of /proc/self/status, in kB.
long statusOf(const std::string &key) {
    std::ifstream file("/proc/self/status");
    for (std::string line; std::getline(file, line);)
        if (line.starts_with(key + ":"))
            return std::stol(line.substr(key.size() + 1));
    return -1;
}

TEST(RealTime, ARefusedPriorityIsALineThatSaysWhatToSet) {
    EXPECT_EQ(inAProcess([] {
                  limit(RLIMIT_RTPRIO, 0);
                  becomeNobody();
                  return lineOf(tryRoundRobin(63));
              }),
              "real-time priority 63 is not allowed (RLIMIT_RTPRIO is 0): set LimitRTPRIO=63 in the unit, or "
              "rtprio 63 in limits.conf; the keys work without, with more delay under load");
}

TEST(RealTime, APriorityThatIsNoneIsSaidToBeNone) {
    const auto refusal = tryRoundRobin(100);
    ASSERT_TRUE(refusal);
    EXPECT_EQ(refusal->errorNumber, EINVAL);
    EXPECT_EQ(refusal->line, "real-time priority 100 is none: it goes from 1 to 99");
}

TEST(RealTime, ATriedThreadIsAsBefore) {
    std::thread([] {
        const auto refusal = tryRoundRobin(1);
        int policy = -1;
        sched_param parameters{};
        EXPECT_EQ(::pthread_getschedparam(::pthread_self(), &policy, &parameters), 0);
        EXPECT_EQ(policy, SCHED_OTHER);
        EXPECT_EQ(parameters.sched_priority, 0);
        // What it said holds for what comes.
        parameters.sched_priority = 1;
        EXPECT_EQ(::pthread_setschedparam(::pthread_self(), SCHED_RR, &parameters),
                  refusal ? refusal->errorNumber : 0);
    }).join();
}

TEST(RealTime, UnderALimitMemoryIsNotLockedAndLaterMemoryIsThere) {
    EXPECT_EQ(
        inAProcess([] {
            limit(RLIMIT_MEMLOCK, 65536);
            becomeNobody();
            const std::string line = lineOf(lockMemory());
            const auto later = std::make_unique<char[]>(16 << 20); // much more than the limit
            rlimit now{};
            (void)::getrlimit(RLIMIT_MEMLOCK, &now);
            return line + "; " + std::to_string(now.rlim_cur) + ", " + std::to_string(statusOf("VmLck"));
        }),
        "memory is not locked (RLIMIT_MEMLOCK is 65536): set LimitMEMLOCK=infinity in the unit, or memlock "
        "unlimited in limits.conf; the keys work without, with more delay under load; 65536, 0");
}

TEST(RealTime, MemoryIsLockedUnlessThatIsRefusedAndOnlyAsItIsTouched) {
    EXPECT_EQ(inAProcess([] {
                  const bool isLocked = !lockMemory();
                  const long before = statusOf("VmRSS");
                  constexpr std::size_t size = 64 << 20;
                  void *const later =
                      ::mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
                  if (later == MAP_FAILED)
                      return std::string("no memory");
                  if (statusOf("VmRSS") - before > 32 << 10)
                      return std::string("all of it is in memory");
                  const bool isCounted = statusOf("VmLck") >= 64 << 10;
                  return std::string(isCounted == (isLocked && kLocksMemory) ? "as it should" : "otherwise");
              }),
              "as it should");
}

} // namespace
} // namespace ZorvaTouch::Linux
