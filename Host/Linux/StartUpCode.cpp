#include "Host/Linux/StartUpCode.h"

#include <link.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <string_view>

namespace ZorvaTouch::Linux {
namespace {

bool isKept(std::string_view file) noexcept {
    return file.find("linux-vdso") != std::string_view::npos || // the kernel's, in no file
           file.find("libzorvahost") != std::string_view::npos;
}

/// Code as it is in its file, so that it can be read from there again. Data that the linker has written to is
/// not.
bool isCode(const ElfW(Phdr) & segment) noexcept {
    return segment.p_type == PT_LOAD && (segment.p_flags & PF_X) != 0 && (segment.p_flags & PF_W) == 0;
}

int releaseCode(dl_phdr_info *object, std::size_t, void *) noexcept {
    if (isKept(object->dlpi_name))
        return 0;
    const auto pageSize = static_cast<std::uintptr_t>(::sysconf(_SC_PAGESIZE));
    for (int index = 0; index < object->dlpi_phnum; ++index) {
        const ElfW(Phdr) &segment = object->dlpi_phdr[index];
        if (!isCode(segment))
            continue;
        const std::uintptr_t begin = (object->dlpi_addr + segment.p_vaddr) / pageSize * pageSize;
        const std::uintptr_t end =
            (object->dlpi_addr + segment.p_vaddr + segment.p_memsz) / pageSize * pageSize;
        if (begin >= end)
            continue;
        // Refused for memory that is locked; then it stays. The linker gives addresses as numbers.
        // NOLINTNEXTLINE(performance-no-int-to-ptr)
        static_cast<void>(::madvise(reinterpret_cast<void *>(begin), end - begin, MADV_DONTNEED));
    }
    return 0;
}

} // namespace

void releaseStartUpCode() noexcept { ::dl_iterate_phdr(releaseCode, nullptr); }

} // namespace ZorvaTouch::Linux
