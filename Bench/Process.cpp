#include "Bench/Process.h"

#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <system_error>
#include <unistd.h>

extern char **environ;

namespace ZorvaTouch::Bench {
namespace {

void require(int error, const std::string &what) {
    if (error != 0)
        throw std::system_error(error, std::generic_category(), what);
}

/// Starts the command with its standard output in a file. @return The process.
pid_t start(const std::vector<std::string> &command, const char *outputPath) {
    std::vector<char *> arguments;
    for (const std::string &argument : command)
        arguments.push_back(
            const_cast<char *>(argument.c_str())); // the interface's type; nobody writes to it
    arguments.push_back(nullptr);

    posix_spawn_file_actions_t actions;
    require(posix_spawn_file_actions_init(&actions), "starting a process");
    posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, outputPath, O_WRONLY, 0);
    pid_t process = 0;
    const int error = posix_spawn(&process, arguments[0], &actions, nullptr, arguments.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    require(error, command.front());
    return process;
}

double nanoseconds(const timeval &time) {
    return static_cast<double>(time.tv_sec) * 1e9 + static_cast<double>(time.tv_usec) * 1e3;
}

ProcessResult waitFor(pid_t process) {
    int status = 0;
    rusage usage{};
    while (wait4(process, &status, 0, &usage) < 0)
        require(errno == EINTR ? 0 : errno, "waiting for a process");
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1,
            nanoseconds(usage.ru_utime) + nanoseconds(usage.ru_stime),
            {}};
}

} // namespace

TemporaryFile::TemporaryFile(std::string_view text)
    : _path((std::filesystem::temp_directory_path() / "zorvatouch-bench-XXXXXX").string()) {
    const int descriptor = mkstemp(_path.data());
    require(descriptor < 0 ? errno : 0, _path);
    close(descriptor);
    std::ofstream(_path, std::ios::binary) << text;
}

TemporaryFile::~TemporaryFile() { unlink(_path.c_str()); }

std::string TemporaryFile::read() const {
    std::ifstream file(_path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

ProcessResult runProcess(const std::vector<std::string> &command, ProcessOutput output) {
    if (output == ProcessOutput::Discard)
        return waitFor(start(command, "/dev/null"));
    const TemporaryFile file("");
    ProcessResult result = waitFor(start(command, file.path().c_str()));
    result.output = file.read();
    return result;
}

} // namespace ZorvaTouch::Bench
