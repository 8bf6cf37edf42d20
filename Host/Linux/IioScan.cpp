#include "Host/Linux/IioScan.h"

#include <algorithm>
#include <limits>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr double kMetresPerSquareSecond = 9.80665; ///< that are 1 g

std::size_t alignedTo(std::size_t alignment, std::size_t offset) noexcept {
    return (offset + alignment - 1) / alignment * alignment;
}

std::uint64_t loadStorage(const ScanType &type, std::span<const std::uint8_t> bytes) noexcept {
    const std::size_t count = std::min<std::size_t>(type.storageBits / 8, bytes.size());
    std::uint64_t value = 0;
    for (std::size_t i = 0; i < count; ++i)
        value = value << 8 | bytes[type.isBigEndian ? i : count - 1 - i];
    return value;
}

/// The bits that count, at the bottom, and copies of the sign above them if there is one.
std::uint64_t loadBits(const ScanType &type, std::span<const std::uint8_t> bytes) noexcept {
    const std::uint64_t mask = ~std::uint64_t{0} >> (64 - type.bits);
    const std::uint64_t value = loadStorage(type, bytes) >> type.shift & mask;
    const bool isNegative = type.isSigned && (value >> (type.bits - 1) & 1) != 0;
    return isNegative ? value | ~mask : value;
}

/// As a float, which ends sooner than a double.
float narrow(double value) noexcept {
    constexpr auto kLargest = static_cast<double>(std::numeric_limits<float>::max());
    return static_cast<float>(std::clamp(value, -kLargest, kLargest));
}

bool hasDuplicates(const std::vector<ScanElement> &sorted) {
    return std::adjacent_find(sorted.begin(), sorted.end(),
                              [](const ScanElement &left, const ScanElement &right) {
                                  return left.index == right.index;
                              }) != sorted.end();
}

} // namespace

double decodeRaw(const ScanType &type, std::span<const std::uint8_t> bytes) noexcept {
    const std::uint64_t bits = loadBits(type, bytes);
    return type.isSigned ? static_cast<double>(static_cast<std::int64_t>(bits)) : static_cast<double>(bits);
}

std::optional<IioScan> IioScan::create(std::vector<ScanElement> elements, const Conversions &conversions) {
    std::ranges::sort(elements, {}, &ScanElement::index);
    if (hasDuplicates(elements))
        return std::nullopt;
    IioScan scan;
    scan._conversions = conversions;
    std::size_t largest = 1;
    for (const ScanElement &element : elements) {
        const std::size_t begin = alignedTo(element.type.size(), scan._size);
        scan.place(element, begin);
        scan._size = begin + element.type.size();
        largest = std::max(largest, element.type.size());
    }
    scan._size = alignedTo(largest, scan._size);
    return scan.isComplete() ? std::optional(scan) : std::nullopt;
}

void IioScan::place(const ScanElement &element, std::size_t begin) {
    const Field field{begin, element.type};
    for (std::size_t axis = 0; axis < kAccelElements.size(); ++axis)
        if (element.name == kAccelElements[axis])
            _axes[axis] = field;
    if (element.name == kTimestampElement)
        _timestamp = field;
}

bool IioScan::isComplete() const noexcept {
    return std::ranges::all_of(_axes, [](const auto &axis) { return axis && axis->type.repeat == 1; });
}

AccelSample IioScan::decode(std::span<const std::uint8_t> scan) const noexcept {
    AccelSample sample;
    for (std::size_t axis = 0; axis < _axes.size(); ++axis) {
        const double raw = decodeRaw(_axes[axis]->type, scan.subspan(_axes[axis]->begin));
        const AxisConversion &conversion = _conversions[axis];
        sample.g[axis] = narrow((raw + conversion.offset) * conversion.scale / kMetresPerSquareSecond);
    }
    if (_timestamp)
        sample.nanoseconds =
            static_cast<std::int64_t>(loadBits(_timestamp->type, scan.subspan(_timestamp->begin)));
    return sample;
}

} // namespace ZorvaTouch::Linux
