#include "Host/Linux/IioScan.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

namespace gen = rc::gen;

rc::Gen<ScanType> anyType() {
    return gen::mapcat(gen::element(8u, 16u, 32u, 64u), [](unsigned storage) {
        return gen::mapcat(gen::inRange(1u, storage + 1), [storage](unsigned bits) {
            return gen::construct<ScanType>(gen::arbitrary<bool>(), gen::arbitrary<bool>(), gen::just(bits),
                                            gen::just(storage), gen::element(1u, 2u, 4u, 8u, 16u),
                                            gen::inRange(0u, storage - bits + 1));
        });
    });
}

std::string textOf(const ScanType &type) {
    return std::string(type.isBigEndian ? "be:" : "le:") + (type.isSigned ? 's' : 'u') +
           std::to_string(type.bits) + '/' + std::to_string(type.storageBits) +
           (type.repeat > 1 ? "X" + std::to_string(type.repeat) : "") + ">>" + std::to_string(type.shift);
}

/// Puts a value's bits into a scan one by one, as the format says, among bits that do not count.
void store(const ScanType &type, std::uint64_t value, std::uint8_t *bytes) {
    const unsigned count = type.storageBits / 8;
    for (unsigned bit = 0; bit < type.bits; ++bit) {
        const unsigned place = bit + type.shift;
        std::uint8_t &byte = bytes[type.isBigEndian ? count - 1 - place / 8 : place / 8];
        const auto mask = static_cast<std::uint8_t>(1u << place % 8);
        byte = static_cast<std::uint8_t>((value >> bit & 1) != 0 ? byte | mask : byte & ~mask);
    }
}

RC_GTEST_PROP(IioTextProperty, AnyFormatIsReadBack, ()) {
    const ScanType type = *anyType();
    RC_ASSERT(parseScanType(textOf(type)) == type);
}

RC_GTEST_PROP(IioTextProperty, WhatIsReadIsPossible, (const std::string &junk)) {
    std::string text = textOf(*anyType());
    const auto place = *gen::inRange<std::size_t>(0, text.size() + 1);
    const auto length = *gen::inRange<std::size_t>(0, 3);
    text.replace(place, length, junk.substr(0, 2));
    if (const auto type = parseScanType(text)) {
        RC_ASSERT(type->bits >= 1 && type->bits + type->shift <= type->storageBits);
        RC_ASSERT(type->storageBits <= 64 && type->size() <= 128);
    }
}

RC_GTEST_PROP(IioValueProperty, AnySignedValueIsReadBack, (std::vector<std::uint8_t> around)) {
    ScanType type = *anyType();
    type.isSigned = true;
    type.bits = std::min(type.bits, 53u); // that a double keeps
    const std::int64_t half = std::int64_t{1} << (type.bits - 1);
    const auto value = *gen::inRange<std::int64_t>(-half, half);
    around.resize(8);
    store(type, static_cast<std::uint64_t>(value), around.data());
    RC_ASSERT(decodeRaw(type, around) == static_cast<double>(value));
}

RC_GTEST_PROP(IioValueProperty, AnyUnsignedValueIsReadBack, (std::vector<std::uint8_t> around)) {
    ScanType type = *anyType();
    type.isSigned = false;
    type.bits = std::min(type.bits, 53u);
    const auto value = *gen::inRange<std::uint64_t>(0, std::uint64_t{1} << type.bits);
    around.resize(8);
    store(type, value, around.data());
    RC_ASSERT(decodeRaw(type, around) == static_cast<double>(value));
}

/// Elements with any formats and indices, in any order: the axes, the time, and some others.
std::vector<ScanElement> anyElements() {
    const auto others = *gen::inRange<std::size_t>(0, 5);
    const auto indices = *gen::unique<std::vector<unsigned>>(4 + others, gen::inRange(0u, 60u));
    std::vector<ScanElement> elements;
    for (const unsigned index : indices)
        elements.push_back({"in_other" + std::to_string(index), index, *anyType()});
    for (std::size_t axis = 0; axis < kAccelElements.size(); ++axis) {
        elements[axis].name = kAccelElements[axis];
        elements[axis].type.repeat = 1;
        elements[axis].type.bits = std::min(elements[axis].type.bits, 20u);
    }
    elements[3] = {kTimestampElement, elements[3].index, *parseScanType("le:s64/64>>0")};
    std::rotate(elements.begin(), elements.begin() + *gen::inRange<std::ptrdiff_t>(0, 4), elements.end());
    return elements;
}

RC_GTEST_PROP(IioScanProperty, ElementsLieOneAfterTheOtherAtMultiplesOfTheirSize, ()) {
    std::vector<ScanElement> elements = anyElements();
    const auto scan = IioScan::create(elements, {{{0, 9.80665}, {0, 9.80665}, {0, 9.80665}}});
    RC_ASSERT(scan.has_value());
    std::ranges::sort(elements, {}, &ScanElement::index);
    std::vector<std::uint8_t> bytes(scan->size());
    AccelSample expected;
    std::size_t begin = 0, largest = 0;
    for (const ScanElement &element : elements) {
        const std::size_t size = element.type.size();
        while (begin % size != 0)
            ++begin;
        largest = std::max(largest, size);
        const auto value = *gen::inRange<std::uint64_t>(0, 2) * (element.type.bits > 1 ? 1 : 0);
        store(element.type, value, bytes.data() + begin);
        for (std::size_t axis = 0; axis < kAccelElements.size(); ++axis)
            if (element.name == kAccelElements[axis])
                expected.g[axis] = static_cast<float>(value);
        if (element.name == kTimestampElement)
            expected.nanoseconds = static_cast<std::int64_t>(value);
        begin += size;
    }
    RC_ASSERT(scan->size() >= begin && scan->size() - begin < largest && scan->size() % largest == 0);
    RC_ASSERT(scan->decode(bytes) == expected);
}

} // namespace
} // namespace ZorvaTouch::Linux
