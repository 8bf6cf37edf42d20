#include "Host/Linux/MainLoop.h"
#include "Host/Linux/SleepWatch.h"

#include <unistd.h>

#include <exception>
#include <iostream>
#include <memory>
#include <string>
#include <string_view>

// Tells on standard output what a SleepWatch tells, a line for each:
//
//     ready      it is there
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
/// @return Whether there was one.
bool readLine() {
    char character = 0;
    while (::read(STDIN_FILENO, &character, 1) == 1)
        if (character == '\n')
            return true;
    return false;
}

void run() {
    MainLoop loop;
    Logs logs;
    const auto onSleep = [&loop] {
        say("sleep");
        if (!readLine())
            loop.quit();
    };
    const SleepWatch watch(loop, logs, onSleep, [] { say("wake"); });
    const LoopWatch input = loop.watch(STDIN_FILENO, [&loop] {
        if (readLine())
            say("pong");
        else
            loop.quit();
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
