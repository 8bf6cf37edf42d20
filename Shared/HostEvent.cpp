#include "Shared/HostEvent.h"

#include "Shared/Util/Numeric.h"
#include "Shared/Util/Text.h"

#include <cmath>
#include <utility>

namespace ZorvaTouch {
namespace {

void appendMember(std::string &text, const char *name, std::uint64_t value) {
    text.append(name);
    Util::appendUnsigned(text, value);
}

std::string digitizerText(const HostEvent &event) {
    std::string text;
    appendMember(text, "{\"mask\":", event.digitizer()->eventMask);
    if (event.phase() == kEventPhaseNone)
        text.append(",\"phase\":null");
    else
        appendMember(text, ",\"phase\":", event.phase());
    appendMember(text,
                 ",\"y\":", Util::truncateToUint64(event.digitizer()->y)); // a region code, always whole
    appendMember(text, ",\"frame\":",
                 static_cast<std::uint64_t>(event.integerField(kDigitizerFieldFrameNumber).value_or(0)));
    text.push_back('}');
    return text;
}

std::string vendorDefinedText(const VendorDefinedFields &fields) {
    std::string text;
    appendMember(text, "{\"vendor\":true,\"usagePage\":", fields.usagePage);
    appendMember(text, ",\"usage\":", fields.usage);
    text.push_back('}');
    return text;
}

void appendNumber(std::string &text, const char *name, float value) {
    text.append(name);
    if (std::isfinite(value))
        Util::appendShortest(text, static_cast<double>(value));
    else
        text.append("null");
}

std::string accelerometerText(const AccelerometerFields &fields) {
    std::string text;
    appendNumber(text, "{\"accelerometer\":true,\"x\":", fields.x);
    appendNumber(text, ",\"y\":", fields.y);
    appendNumber(text, ",\"z\":", fields.z);
    text.push_back('}');
    return text;
}

} // namespace

std::shared_ptr<HostEvent> HostEvent::createDigitizer(std::uint64_t timestamp, const DigitizerFields &fields,
                                                      std::uint32_t options) {
    return std::make_shared<HostEvent>(timestamp, fields, options);
}

std::shared_ptr<HostEvent> HostEvent::createVendorDefined(std::uint64_t timestamp, VendorDefinedFields fields,
                                                          std::uint32_t options) {
    return std::make_shared<HostEvent>(timestamp, std::move(fields), options);
}

std::shared_ptr<HostEvent> HostEvent::createAccelerometer(std::uint64_t timestamp,
                                                          const AccelerometerFields &fields,
                                                          std::uint32_t options) {
    return std::make_shared<HostEvent>(timestamp, fields, options);
}

HostEvent::HostEvent(std::uint64_t timestamp, HostEventFields fields, std::uint32_t options)
    : _timestamp(timestamp), _fields(std::move(fields)), _options(options) {}

HostEventType HostEvent::type() const noexcept {
    if (digitizer())
        return HostEventType::Digitizer;
    return vendorDefined() ? HostEventType::VendorDefined : HostEventType::Accelerometer;
}

std::optional<std::int64_t> HostEvent::integerField(std::uint32_t code) const noexcept {
    const auto field = _integerFields.find(code);
    return field == _integerFields.end() ? std::nullopt : std::optional(field->second);
}

void HostEvent::setIntegerField(std::uint32_t code, std::int64_t value) { _integerFields[code] = value; }

std::string jsonText(const HostEvent &event) {
    if (event.digitizer())
        return digitizerText(event);
    if (event.vendorDefined())
        return vendorDefinedText(*event.vendorDefined());
    return accelerometerText(*event.accelerometer());
}

} // namespace ZorvaTouch
