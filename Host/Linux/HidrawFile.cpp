#include "Host/Linux/HidrawFile.h"

#include <fcntl.h>
#include <linux/hidraw.h>
#include <sys/file.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <new>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

/// The size of a buffer is part of a request's number, and this is the largest that fits.
constexpr std::size_t kLargestRequest = (std::size_t{1} << _IOC_SIZEBITS) - 1;

IoResult resultOf(long returned) noexcept {
    if (returned < 0)
        return {.errorNumber = errno};
    return {.count = static_cast<std::size_t>(returned)};
}

unsigned long textRequest(HidrawText which, std::size_t size) noexcept {
    switch (which) {
    case HidrawText::Name:
        return HIDIOCGRAWNAME(size);
    case HidrawText::PhysicalPath:
        return HIDIOCGRAWPHYS(size);
    case HidrawText::UniqueId:
        break;
    }
    return HIDIOCGRAWUNIQ(size);
}

} // namespace

OpenedNode HidrawFile::open(const std::string &path) noexcept {
    UniqueFd descriptor(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
    if (!descriptor)
        return {.node = nullptr, .errorNumber = errno};
    try {
        return {.node = std::make_shared<HidrawFile>(std::move(descriptor)), .errorNumber = 0};
    } catch (const std::bad_alloc &) {
        return {.node = nullptr, .errorNumber = ENOMEM};
    }
}

HidrawOpener HidrawFile::opener(std::string path) {
    return [path = std::move(path)] { return open(path); };
}

IoResult HidrawFile::read(std::span<std::uint8_t> buffer) noexcept {
    return resultOf(::read(descriptor(), buffer.data(), buffer.size()));
}

IoResult HidrawFile::deviceNumber(std::uint64_t &stored) noexcept {
    struct stat status {};
    if (::fstat(descriptor(), &status) != 0)
        return {.errorNumber = errno};
    if (!S_ISCHR(status.st_mode))
        return {.errorNumber = ENOTTY};
    stored = status.st_rdev;
    return {};
}

IoResult HidrawFile::lock() noexcept { return resultOf(::flock(descriptor(), LOCK_EX | LOCK_NB)); }

IoResult HidrawFile::info(HidrawInfo &stored) noexcept {
    hidraw_devinfo info{};
    const IoResult result = resultOf(::ioctl(descriptor(), HIDIOCGRAWINFO, &info));
    // The kernel's numbers are signed, and mean the same bits.
    if (result.errorNumber == 0)
        stored = {.bus = info.bustype,
                  .vendor = static_cast<std::uint16_t>(info.vendor),
                  .product = static_cast<std::uint16_t>(info.product)};
    return result;
}

IoResult HidrawFile::text(HidrawText which, std::span<std::uint8_t> buffer) noexcept {
    const std::size_t size = std::min(buffer.size(), kLargestRequest);
    return resultOf(::ioctl(descriptor(), textRequest(which, size), buffer.data()));
}

IoResult HidrawFile::reportDescriptor(std::span<std::uint8_t> buffer) noexcept {
    int size = 0;
    if (::ioctl(descriptor(), HIDIOCGRDESCSIZE, &size) < 0)
        return {.errorNumber = errno};
    hidraw_report_descriptor report{};
    report.size = static_cast<std::uint32_t>(std::clamp<int>(size, 0, HID_MAX_DESCRIPTOR_SIZE));
    if (::ioctl(descriptor(), HIDIOCGRDESC, &report) < 0)
        return {.errorNumber = errno};
    const std::size_t count = std::min<std::size_t>(report.size, buffer.size());
    std::copy_n(report.value, count, buffer.begin());
    return {.count = count};
}

IoResult HidrawFile::featureReport(std::span<std::uint8_t> buffer) noexcept {
    const std::size_t size = std::min(buffer.size(), kLargestRequest);
    return resultOf(::ioctl(descriptor(), HIDIOCGFEATURE(size), buffer.data()));
}

} // namespace ZorvaTouch::Linux
