#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Bench {

/// A file that is there as long as this object.
class TemporaryFile {
public:
    /// @throws std::system_error
    explicit TemporaryFile(std::string_view text);
    ~TemporaryFile();
    TemporaryFile(const TemporaryFile &) = delete;
    TemporaryFile &operator=(const TemporaryFile &) = delete;

    [[nodiscard]] const std::string &path() const noexcept { return _path; }
    [[nodiscard]] std::string read() const;

private:
    std::string _path;
};

enum class ProcessOutput {
    Discard,
    Capture, ///< by way of a file
};

struct ProcessResult {
    int exitStatus = 0; ///< -1 if the process was ended by a signal
    double cpuNs = 0;   ///< processor time, the system's share included
    std::string output; ///< its standard output, if captured
};

/// Runs a program and waits for its end.
/// @param command  The program's path, then its arguments.
/// @throws std::system_error  if it cannot be started.
[[nodiscard]] ProcessResult runProcess(const std::vector<std::string> &command, ProcessOutput output);

} // namespace ZorvaTouch::Bench
