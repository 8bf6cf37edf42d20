#pragma once

#include <exception>
#include <stdexcept>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {
class FileFailure;
}

namespace ZorvaTouch::Tools {

/// Something that ends the program with status 2. `what()` is what the user reads after "zorvatouch: ".
class CliError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// The reader of a pipe has closed it, as `head` does: the program ends without a message.
class ClosedPipe : public std::exception {
public:
    [[nodiscard]] const char *what() const noexcept override { return "the reader has closed the pipe"; }
};

/// A failed operation on a file, as "NAME: cannot open: No such file or directory".
[[nodiscard]] CliError fileError(std::string_view name, const Host::FileFailure &failure);

} // namespace ZorvaTouch::Tools
