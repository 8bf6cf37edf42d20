#include "Host/Interface/Mutex.h"

#include <pthread.h>

#include <exception>
#include <system_error>

namespace ZorvaTouch::Host {
namespace {

void check(int errorNumber, const char *operation) {
    if (errorNumber != 0)
        throw std::system_error(errorNumber, std::generic_category(), operation);
}

/// To go on without the lock would be worse than to end.
void require(int errorNumber) noexcept {
    if (errorNumber != 0)
        std::terminate();
}

/// A mutex's attributes for a scope.
class Attributes {
public:
    Attributes() { check(::pthread_mutexattr_init(&native), "make a mutex"); }
    ~Attributes() { ::pthread_mutexattr_destroy(&native); }
    Attributes(const Attributes &) = delete;
    Attributes &operator=(const Attributes &) = delete;

    pthread_mutexattr_t native{};
};

} // namespace

struct Mutex::Native {
    Native() {
        Attributes attributes;
        check(::pthread_mutexattr_setprotocol(&attributes.native, PTHREAD_PRIO_INHERIT), "make a mutex");
        check(::pthread_mutex_init(&mutex, &attributes.native), "make a mutex");
    }
    ~Native() { ::pthread_mutex_destroy(&mutex); }
    Native(const Native &) = delete;
    Native &operator=(const Native &) = delete;

    pthread_mutex_t mutex{};
};

Mutex::Mutex() : _native(std::make_unique<Native>()) {}
Mutex::~Mutex() = default;

void Mutex::lock() noexcept { require(::pthread_mutex_lock(&_native->mutex)); }
void Mutex::unlock() noexcept { require(::pthread_mutex_unlock(&_native->mutex)); }

} // namespace ZorvaTouch::Host
