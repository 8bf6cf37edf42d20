#pragma once

#include "Host/Interface/Platform.h"

#include <semaphore.h>

namespace ZorvaTouch::Host {

/// A semaphore of the system's.
class SystemSemaphore final : public Semaphore {
public:
    /// @throws std::system_error
    SystemSemaphore();
    ~SystemSemaphore() override;
    SystemSemaphore(const SystemSemaphore &) = delete;
    SystemSemaphore &operator=(const SystemSemaphore &) = delete;

    void signal() noexcept override;
    /// Signals of the other kind, those to the process, do not end it.
    void wait() noexcept override;

private:
    sem_t _semaphore;
};

} // namespace ZorvaTouch::Host
