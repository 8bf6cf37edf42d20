#include "Fuzz/Transcript.h"
#include "Host/Linux/IioScan.h"

#include <cmath>
#include <fuzzer/FuzzedDataProvider.h>
#include <string>

// Targets: Host/Linux/IioScan.cpp Host/Linux/IioText.cpp
//
// Length: 384
//
// Texts and scans of a sensor: any text is read or refused, what was read is possible, and whatever lies in a
// scan of any layout is three finite numbers.

using namespace ZorvaTouch::Linux;

namespace {

bool isPossible(const ScanType &type) {
    return type.bits >= 1 && type.bits <= type.storageBits && type.shift <= type.storageBits - type.bits &&
           type.storageBits <= 64 && type.size() >= 1 && type.size() <= 128;
}

void readFrequencies(FuzzedDataProvider &input) {
    const double wanted = input.ConsumeFloatingPointInRange(0.001, 1e6);
    const std::string text = input.ConsumeRandomLengthString(64);
    if (const auto closest = closestFrequency(text, wanted)) {
        ZORVA_MUST(text.find(*closest) != std::string::npos);
        ZORVA_MUST(parseIioNumber(*closest).value() > 0);
    }
}

std::vector<ScanElement> readElements(FuzzedDataProvider &input) {
    const char *const names[] = {"in_accel_x", "in_accel_y", "in_accel_z", "in_timestamp", "in_temp"};
    std::vector<ScanElement> elements;
    for (const char *const name : names) {
        const auto index = parseIioCount(input.ConsumeRandomLengthString(4));
        const auto type = parseScanType(input.ConsumeRandomLengthString(16));
        if (!index || !type)
            continue;
        ZORVA_MUST(isPossible(*type));
        elements.push_back({name, *index, *type});
    }
    return elements;
}

IioScan::Conversions readConversions(FuzzedDataProvider &input) {
    IioScan::Conversions conversions;
    for (AxisConversion &conversion : conversions)
        conversion = {.offset = parseIioNumber(input.ConsumeRandomLengthString(16)).value_or(0),
                      .scale = parseIioNumber(input.ConsumeRandomLengthString(16)).value_or(1)};
    return conversions;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    FuzzedDataProvider input(data, size);
    readFrequencies(input);
    const auto elements = readElements(input);
    const auto scan = IioScan::create(elements, readConversions(input));
    if (!scan)
        return 0;
    auto bytes = input.ConsumeBytes<std::uint8_t>(scan->size());
    bytes.resize(scan->size());
    for (const float g : scan->decode(bytes).g)
        ZORVA_MUST(std::isfinite(g));
    return 0;
}
