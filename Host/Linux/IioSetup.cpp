#include "Host/Linux/IioSetup.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <cstddef>
#include <exception>
#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kElements = "scan_elements/";
constexpr const char *kEnable = "buffer/enable";
constexpr const char *kTrigger = "trigger/current_trigger";
constexpr const char *kTriggers = "subsystem/devices";

constexpr double kMicrosecondsPerSecond = 1'000'000;
constexpr double kLowestFrequency = 0.001,
                 kHighestFrequency = 1'000'000; // Hz; beyond is no wish but a mistake
constexpr int kDecimals = 6;                    // that the kernel reads

// --- Scans -------------------------------------------------------------------------------------------------

bool isWanted(const std::string &element) {
    return element == kTimestampElement || std::ranges::find(kAccelElements, element) != kAccelElements.end();
}

/// Turns an element on or off as it is wanted. @return Whether it is on: some go on and off with others.
bool prepareElement(const IioSysfs &device, const std::string &element) {
    const std::string enable = kElements + element + "_en";
    const bool isOn = device.count(enable) != 0;
    if (isWanted(element) && !isOn)
        device.set(enable, "1");
    else if (!isWanted(element) && isOn)
        device.trySet(enable, "0");
    return device.count(enable) != 0;
}

double numberOr(const IioSysfs &device, const std::optional<std::string> &name, double missing) {
    return name ? device.number(*name) : missing;
}

/// Attributes of an axis, or of all axes together.
AxisConversion conversionOf(const IioSysfs &device, const std::string &axis) {
    const auto scale = device.firstOf({axis + "_scale", "in_accel_scale"});
    if (!scale)
        throw IioFailure(device.folder() + " does not say the scale of " + axis, 0);
    return {.offset = numberOr(device, device.firstOf({axis + "_offset", "in_accel_offset"}), 0),
            .scale = device.number(*scale)};
}

// --- Triggers ----------------------------------------------------------------------------------------------

/// Names of the trigger that comes with a device, the better one first.
std::array<std::string, 2> ownTriggers(const IioSysfs &device) {
    const std::string name = device.text("name");
    const std::string &folder = device.folder();
    const std::size_t digits = folder.find_last_not_of("0123456789") + 1;
    return {name + "-dev" + folder.substr(digits), name + "-trigger"};
}

std::optional<std::string> findTrigger(const IioSysfs &device) {
    std::vector<std::string> there;
    for (const std::string &number : device.names(kTriggers, "trigger", ""))
        there.push_back(device.text(std::string(kTriggers) + "/trigger" + number + "/name"));
    for (const std::string &own : ownTriggers(device))
        if (std::ranges::find(there, own) != there.end())
            return own;
    return std::nullopt;
}

// --- Frequencies -------------------------------------------------------------------------------------------

std::string frequencyText(double hertz) {
    std::array<char, 32> digits{};
    const char *const end = std::to_chars(digits.data(), digits.data() + digits.size(), hertz,
                                          std::chars_format::fixed, kDecimals)
                                .ptr;
    std::string text(digits.data(), static_cast<std::size_t>(end - digits.data()));
    text.erase(text.find_last_not_of('0') + 1); // there is always a point
    if (text.back() == '.')
        text.pop_back();
    return text;
}

/// @return Whether the device has taken it.
bool offer(const IioSysfs &device, const std::string &name, const std::string &text) {
    try {
        device.set(name, text);
        return true;
    } catch (const IioFailure &) {
        return false;
    }
}

/// Asks for the frequency of the device's list that comes closest.
void offerClosest(const IioSysfs &device, const std::string &name, double hertz) {
    const std::string list = name + "_available";
    if (!device.has(list))
        return;
    if (const auto closest = closestFrequency(device.text(list), hertz))
        static_cast<void>(offer(device, name, *closest));
}

bool isSampling(const std::string &frequency) { return parseIioNumber(frequency).value_or(0) > 0; }

} // namespace

IioScan prepareScan(const IioSysfs &device) {
    std::vector<ScanElement> elements;
    for (const std::string &element : device.names("scan_elements", "", "_en"))
        if (prepareElement(device, element))
            elements.push_back({.name = element,
                                .index = device.count(kElements + element + "_index"),
                                .type = device.scanType(kElements + element + "_type")});
    IioScan::Conversions conversions;
    for (std::size_t axis = 0; axis < conversions.size(); ++axis)
        conversions[axis] = conversionOf(device, kAccelElements[axis]);
    auto scan = IioScan::create(std::move(elements), conversions);
    if (!scan)
        throw IioFailure(device.folder() + " has no buffer with an x, a y and a z", 0);
    return *scan;
}

void prepareTrigger(const IioSysfs &device) {
    if (!device.has(kTrigger) || !device.text(kTrigger).empty())
        return;
    const auto trigger = findTrigger(device);
    if (!trigger)
        throw IioFailure(device.folder() + " has no trigger; write the name of one to its " + kTrigger, 0);
    device.set(kTrigger, *trigger);
}

bool prepareClock(const IioSysfs &device) { return device.trySet("current_timestamp_clock", "monotonic"); }

void prepareBuffer(const IioSysfs &device) {
    device.trySet("buffer/length", std::to_string(kIioBufferLength));
    device.trySet("buffer/watermark", "1");
}

void startBuffer(const IioSysfs &device) { device.set(kEnable, "1"); }

void stopBuffer(const IioSysfs &device) noexcept {
    try {
        device.trySet(kEnable, "0");
    } catch (const std::exception &) { // without memory; closing the node stops it as well
    }
}

std::optional<std::string> setSamplingInterval(const IioSysfs &device, double intervalUs) {
    const auto name = device.firstOf(
        {"in_accel_sampling_frequency", "in_accel_x_sampling_frequency", "sampling_frequency"});
    if (!name)
        return std::nullopt;
    const std::string before = device.text(*name);
    const double hertz = kMicrosecondsPerSecond / intervalUs;
    if (!(hertz >= kLowestFrequency && hertz <= kHighestFrequency))
        return before;
    if (!offer(device, *name, frequencyText(hertz)))
        offerClosest(device, *name, hertz);
    if (!isSampling(device.text(*name)) && isSampling(before))
        static_cast<void>(offer(device, *name, before));
    return device.text(*name);
}

} // namespace ZorvaTouch::Linux
