#pragma once

#include "Host/Runtime/SystemPlatform.h"
#include "Plugin/ZorvaPlugIn.h"

#include <cstdio>
#include <functional>
#include <memory>
#include <string>
#include <utility>

/// What the tests of the host's library share.
namespace ZorvaTouch::Host::RuntimeTests {

/// A log in memory.
class LogText {
public:
    [[nodiscard]] std::FILE *file() const noexcept { return _file.get(); }
    /// What was written, without the time that every record begins with.
    [[nodiscard]] std::string text() const;

private:
    std::unique_ptr<std::FILE, int (*)(std::FILE *)> _file{std::tmpfile(), &std::fclose};
};

/// A pipe; both ends are closed with it.
class Pipe {
public:
    Pipe();
    ~Pipe();
    Pipe(const Pipe &) = delete;
    Pipe &operator=(const Pipe &) = delete;

    [[nodiscard]] int readEnd() const noexcept { return _ends[0]; }
    [[nodiscard]] int writeEnd() const noexcept { return _ends[1]; }
    void write(const char *text) const;
    /// The next byte.
    /// @throws std::runtime_error  There is none.
    [[nodiscard]] char read() const;
    void closeReadEnd() noexcept { close(0); }
    void closeWriteEnd() noexcept { close(1); }

private:
    void close(int end) noexcept;

    int _ends[2] = {-1, -1};
};

/// Something to call through the boundary; itself the context.
class Callable {
public:
    explicit Callable(std::function<void()> action) : _action(std::move(action)) {}
    static void call(void *context) { static_cast<Callable *>(context)->_action(); }

private:
    std::function<void()> _action;
};

/// A thread of the platform's that is waited for at the end of the scope.
class ScopedThread {
public:
    explicit ScopedThread(std::function<void()> body);
    ~ScopedThread();
    ScopedThread(const ScopedThread &) = delete;
    ScopedThread &operator=(const ScopedThread &) = delete;

private:
    std::unique_ptr<Thread> _thread;
};

/// The file of the host's library that this program runs with.
[[nodiscard]] std::string libraryPath();

} // namespace ZorvaTouch::Host::RuntimeTests
