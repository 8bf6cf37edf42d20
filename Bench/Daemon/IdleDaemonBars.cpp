#include "Bench/Daemon/DaemonBars.h"

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <system_error>
#include <thread>

namespace ZorvaTouch::Bench {
namespace {

constexpr std::chrono::seconds kStart{1};

/// A system bus that accepts and says nothing, as long as this object lives: what a daemon without a bus does
/// is to connect again, which is not idle.
class SilentBus {
public:
    SilentBus() : _listener(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        socklen_t length = sizeof address.sun_family; // alone: the kernel chooses an abstract name
        auto *const generic = reinterpret_cast<sockaddr *>(&address);
        if (::bind(_listener, generic, length) != 0 || ::listen(_listener, 1) != 0)
            throw std::system_error(errno, std::generic_category(), "a socket");
        length = sizeof address;
        ::getsockname(_listener, generic, &length);
        const std::string name(address.sun_path + 1, length - offsetof(sockaddr_un, sun_path) - 1);
        ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:abstract=" + name).c_str(), 1);
    }
    ~SilentBus() {
        ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS");
        ::close(_listener);
    }
    SilentBus(const SilentBus &) = delete;
    SilentBus &operator=(const SilentBus &) = delete;

private:
    const int _listener;
};

/// A program that runs as long as this object, with its output thrown away.
class RunningProgram {
public:
    explicit RunningProgram(const char *program) {
        posix_spawn_file_actions_t actions;
        ::posix_spawn_file_actions_init(&actions);
        for (const int stream : {STDOUT_FILENO, STDERR_FILENO})
            ::posix_spawn_file_actions_addopen(&actions, stream, "/dev/null", O_WRONLY, 0);
        std::string path = program;
        std::array<char *, 2> arguments{path.data(), nullptr};
        const int error = ::posix_spawn(&_process, program, &actions, nullptr, arguments.data(), environ);
        ::posix_spawn_file_actions_destroy(&actions);
        if (error != 0)
            throw std::system_error(error, std::generic_category(), program);
        std::this_thread::sleep_for(kStart);
    }
    ~RunningProgram() {
        ::kill(_process, SIGTERM);
        ::waitpid(_process, nullptr, 0);
    }
    RunningProgram(const RunningProgram &) = delete;
    RunningProgram &operator=(const RunningProgram &) = delete;

    /// Resident memory in KiB.
    [[nodiscard]] double residentKiB() const { return statusOf(folder() / "status", "VmRSS:"); }
    /// How often its threads went to sleep of their own accord, ever.
    [[nodiscard]] double sleeps() const {
        double sum = 0;
        for (const auto &task : std::filesystem::directory_iterator(folder() / "task"))
            sum += statusOf(task.path() / "status", "voluntary_ctxt_switches:");
        return sum;
    }

private:
    [[nodiscard]] std::filesystem::path folder() const { return "/proc/" + std::to_string(_process); }
    static double statusOf(const std::filesystem::path &file, const std::string &key) {
        std::ifstream in(file);
        for (std::string word; in >> word;)
            if (word == key) {
                double value = 0;
                in >> value;
                return value;
            }
        throw std::system_error(ESRCH, std::generic_category(), file.string() + " has no " + key);
    }

    pid_t _process = 0;
};

} // namespace

void measureIdleDaemon(BarTable &bars, bool isShort) {
    const SilentBus bus;
    const RunningProgram daemon(ZORVA_BENCH_DAEMON);
    const RunningProgram bare(ZORVA_BENCH_BARE);
    bars.add({.name = "memory of an idle daemon",
              .unit = "KiB",
              .counterpartName = "a program that links the same",
              .figure = daemon.residentKiB(),
              .counterpart = bare.residentKiB(),
              .limit = 1.5});
    const double before = daemon.sleeps();
    const std::chrono::seconds watched(isShort ? 1 : 10);
    std::this_thread::sleep_for(watched);
    bars.add({.name = "wake-ups of an idle daemon",
              .counterpartName = "seconds",
              .figure = daemon.sleeps() - before,
              .counterpart = static_cast<double>(watched.count()),
              .limit = 0,
              .isBinding = true});
}

} // namespace ZorvaTouch::Bench
