#pragma once

#include "Host/Interface/ThreadAnnotations.h"

#include <memory>

namespace ZorvaTouch::Host {

/// A plain mutex, not recursive, with priority inheritance: who holds it runs at the priority of whoever
/// waits for it. Annotated for the analysis of clang, which the standard library's is not.
///
/// Threads:  any.
/// Realtime: yes, as far as those who hold it are quick.
class ZORVA_CAPABILITY("mutex") Mutex {
public:
    /// @throws std::system_error  The system has no mutex to give.
    Mutex();
    ~Mutex();
    Mutex(const Mutex &) = delete;
    Mutex &operator=(const Mutex &) = delete;

    void lock() noexcept ZORVA_ACQUIRE();
    void unlock() noexcept ZORVA_RELEASE();

    /// Tells the analysis what it cannot see, as in a function that is only called under the lock. Checks
    /// nothing.
    void assertHeld() const noexcept ZORVA_ASSERT_HELD() {}

private:
    struct Native;
    std::unique_ptr<Native> _native;
};

/// Holds a mutex for a scope.
class ZORVA_SCOPED_CAPABILITY MutexLock {
public:
    explicit MutexLock(Mutex &mutex) noexcept ZORVA_ACQUIRE(mutex) : _mutex(mutex) { _mutex.lock(); }
    ~MutexLock() ZORVA_RELEASE() { _mutex.unlock(); }
    MutexLock(const MutexLock &) = delete;
    MutexLock &operator=(const MutexLock &) = delete;

private:
    Mutex &_mutex;
};

} // namespace ZorvaTouch::Host
