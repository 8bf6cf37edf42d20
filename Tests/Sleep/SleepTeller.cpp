#include "Host/Linux/MainLoop.h"
#include "Host/Linux/SleepWatch.h"

#include <unistd.h>

#include <chrono>
#include <exception>
#include <functional>
#include <iostream>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

// Tells on standard output what a SleepWatch tells, a line for each:
//
//     ready      it is there
//     retry in N ms  it waits so long before it connects to the bus again: until a line "retry" of input
//     sleep      onSleep was called; it returns after a line of input
//     wake       onWake was called
//     log: TEXT  a record of its log
//     pong       answers a line of input at any other time: the main loop serves
//
// Ends with its input.

namespace ZorvaTouch::Linux {
namespace {

void say(std::string_view line) { std::cout << line << std::endl; }

class Logs final : public Ports::LogProvider {
public:
    std::shared_ptr<Ports::Log> openLog(std::string_view, std::string_view) override {
        return std::make_shared<Printer>();
    }

private:
    class Printer final : public Ports::Log {
    public:
        bool isEnabled(Ports::LogLevel) const noexcept override { return true; }
        void write(Ports::LogLevel, std::string_view text) noexcept override {
            say(std::string("log: ").append(text));
        }
    };
};

/// Reads a line of standard input, and no more than that.
/// @return Nothing if there was none.
std::optional<std::string> readLine() {
    std::string line;
    for (char character = 0; ::read(STDIN_FILENO, &character, 1) == 1; line += character)
        if (character == '\n')
            return line;
    return std::nullopt;
}

/// A timer for which no time passes.
class Retry {
public:
    LoopTimer timer() {
        return [this](std::chrono::microseconds delay, std::function<void()> function) {
            const auto milliseconds = std::chrono::duration_cast<std::chrono::milliseconds>(delay).count();
            say("retry in " + std::to_string(milliseconds) + " ms");
            _function = std::move(function);
            return LoopWatch();
        };
    }
    /// The time has come.
    void run() {
        if (const auto function = std::exchange(_function, nullptr))
            function();
    }

private:
    std::function<void()> _function;
};

void run() {
    MainLoop loop;
    Logs logs;
    const auto onSleep = [&loop] {
        say("sleep");
        if (!readLine())
            loop.quit();
    };
    Retry retry;
    const SleepWatch watch(
        loop, logs, onSleep, [] { say("wake"); }, retry.timer());
    const LoopWatch input = loop.watch(STDIN_FILENO, [&] {
        const auto line = readLine();
        if (!line)
            return loop.quit();
        if (*line == "retry")
            retry.run();
        say("pong");
    });
    say("ready");
    loop.run();
}

} // namespace
} // namespace ZorvaTouch::Linux

int main() {
    try {
        ZorvaTouch::Linux::run();
    } catch (const std::exception &error) {
        std::cerr << error.what() << '\n';
        return 1;
    }
    return 0;
}
