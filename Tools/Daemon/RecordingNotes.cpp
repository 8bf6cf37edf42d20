#include "Tools/Daemon/RecordingNotes.h"

#include "Shared/Pipeline.h"
#include "Shared/Ports/Log.h"
#include "Shared/VirtualImage.h"

#include <array>
#include <cstdio>
#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::array<std::string_view, 4> kSwitches{"Algs.ActivationThreshold", "Algs.EnableHoldSuppression",
                                                    "Algs.EnableTapSuppression",
                                                    "Algs.HoldTimeoutMilliseconds"};

std::vector<std::string> tunableKeys() {
    std::vector<std::string> keys(kSwitches.begin(), kSwitches.end());
    for (std::size_t pixel = 0; pixel < kVirtualPixelCount; ++pixel)
        keys.push_back("Algs.VirtualNormalizationFactors." + std::to_string(pixel));
    return keys;
}

/// Those that differ from a new pipeline's.
PropertyValue changedTunables(const HostedService &service) {
    const Pipeline defaults(Ports::silentLogProvider());
    PropertyValue::Dictionary changed;
    for (const std::string &key : tunableKeys())
        if (auto value = service.property("Pipeline." + key); value && *value != defaults.getState(key))
            changed[key] = std::move(*value);
    return changed;
}

/// Properties that the device does not have are left out.
PropertyValue describeDevice(const HostedService &service, bool withSerial) {
    constexpr std::array kKeys{std::pair("VendorID", "VendorID"), std::pair("ProductID", "ProductID"),
                               std::pair("Product", "Name"), std::pair("SerialNumber", "SerialNumber")};
    PropertyValue::Dictionary described;
    for (const auto &[property, key] : kKeys)
        if (withSerial || std::string_view(property) != "SerialNumber")
            if (auto value = service.property(property); value && !value->isNull())
                described[key] = std::move(*value);
    return described;
}

std::string hexText(std::uint64_t number) {
    std::array<char, 17> digits{};
    std::snprintf(digits.data(), digits.size(), "%016llx", static_cast<unsigned long long>(number));
    return digits.data();
}

Frame noteFrame(const std::string &key, const PropertyValue &value, std::uint64_t timestampNs) {
    return {.type = FrameType::Metadata, .timestampNs = timestampNs, .key = key, .value = value, .data = {}};
}

} // namespace

std::uint64_t fnv1a64(std::span<const std::uint8_t> bytes) noexcept {
    std::uint64_t hash = 0xCBF29CE484222325;
    for (const std::uint8_t byte : bytes) {
        hash ^= byte;
        hash *= 0x100000001B3;
    }
    return hash;
}

RecordingNotes notesOf(const HostedService &service, bool withSerial) {
    RecordingNotes notes{
        {"Software", PropertyValue::Dictionary{{"Program", "zorvatouchd " ZORVA_VERSION},
                                               {"Service", service.version()}}},
        {"Device", describeDevice(service, withSerial)},
        {"Tunables", changedTunables(service)},
    };
    const auto descriptor = service.property("ReportDescriptor");
    if (const PropertyValue::Bytes *const bytes = descriptor ? descriptor->asBytes() : nullptr)
        notes["ReportDescriptor"] =
            PropertyValue::Dictionary{{"Bytes", bytes->size()}, {"FNV1a64", hexText(fnv1a64(*bytes))}};
    return notes;
}

FrameList withNotes(const RecordingNotes &notes, const FrameList &frames, std::uint64_t nowNs) {
    const std::uint64_t timestampNs = frames.empty() ? nowNs : frames[0].timestampNs;
    FrameList all;
    for (const auto &[key, value] : notes)
        all.append(noteFrame(key, value, timestampNs));
    for (const FrameView &frame : frames)
        all.append(frame.toFrame());
    return all;
}

} // namespace ZorvaTouch::Tools
