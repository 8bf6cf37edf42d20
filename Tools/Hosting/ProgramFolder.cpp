#include "Tools/Hosting/ProgramFolder.h"

#include <filesystem>
#include <system_error>

namespace ZorvaTouch::Tools {

std::string besideProgram(std::string_view relative) {
    std::error_code error;
    const auto program = std::filesystem::read_symlink("/proc/self/exe", error);
    return (program.parent_path() / relative).lexically_normal().string();
}

} // namespace ZorvaTouch::Tools
