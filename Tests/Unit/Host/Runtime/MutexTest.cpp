#include "Host/Interface/Mutex.h"

#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include <gtest/gtest.h>

#include <cstring>
#include <list>
#include <unistd.h>

namespace ZorvaTouch::Host {
namespace {

using RuntimeTests::ScopedThread;

TEST(Mutex, LetsOneInAtATime) {
    struct Counter {
        Mutex mutex;
        int value ZORVA_GUARDED_BY(mutex) = 0;
    } counter;
    {
        std::list<ScopedThread> threads;
        for (int thread = 0; thread < 2; ++thread)
            threads.emplace_back([&] {
                for (int round = 0; round < 10000; ++round) {
                    const MutexLock lock(counter.mutex);
                    ++counter.value;
                }
            });
    }
    const MutexLock lock(counter.mutex);
    EXPECT_EQ(counter.value, 20000);
}

/// The word that the kernel waits on, the first of the system's mutex.
int futexWord(const Mutex &mutex) {
    const void *native = nullptr;
    std::memcpy(&native, &mutex, sizeof(native));
    int word = 0;
    std::memcpy(&word, native, sizeof(word));
    return word;
}

TEST(Mutex, InheritsPriority) {
    // The kernel can raise the owner's priority only if the word names the owner; otherwise it is 1.
    Mutex mutex;
    EXPECT_EQ(futexWord(mutex), 0);
    const MutexLock lock(mutex);
    EXPECT_EQ(futexWord(mutex), ::gettid());
}

} // namespace
} // namespace ZorvaTouch::Host
