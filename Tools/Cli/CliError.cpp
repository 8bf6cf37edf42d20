#include "Tools/Cli/CliError.h"

#include "Host/Runtime/Files.h"

namespace ZorvaTouch::Tools {

CliError fileError(std::string_view name, const Host::FileFailure &failure) {
    std::string text(name);
    text.append(": cannot ").append(failure.operation).append(": ").append(failure.code().message());
    return CliError(text);
}

} // namespace ZorvaTouch::Tools
