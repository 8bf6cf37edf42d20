#include "Service/ZorvaTouchHIDService.h"
#include "Shared/Util/Hex.h"
#include "Shared/Util/StateKey.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace ZorvaTouch {
namespace {

/// The firmware's debug reports, in the order in which they are read.
constexpr std::array<std::uint32_t, 10> kFirmwareDebugReportIds{0x04, 0x10, 0x11, 0x12, 0x13,
                                                                0x1D, 0x32, 0x3B, 0x3C, 0x3F};
constexpr std::size_t kFirmwareDebugReportSize = 128;     ///< bytes that are asked for
constexpr std::size_t kFactoryResetHoldDurationSize = 32; ///< likewise

/// What "ServicePluginDebug" gathers.
constexpr std::array<const char *, 5> kDebugKeys{"Version", "FirmwareDebugReports", "Recording",
                                                 "Pipeline.DebugInfo", "Pipeline.Algs.DebugInfo"};

/// Text of a value for the log.
std::string logText(const PropertyValue &value) {
    switch (value.kind()) {
    case PropertyValue::Kind::Null:
        return "(null)";
    case PropertyValue::Kind::Boolean:
        return *value.asBool() ? "true" : "false";
    case PropertyValue::Kind::Unsigned:
        return fmt::format("{}", *value.asUnsigned());
    case PropertyValue::Kind::Double:
        return fmt::format("{}", *value.asDouble());
    case PropertyValue::Kind::String:
        return *value.asString();
    case PropertyValue::Kind::Bytes:
        return fmt::format("({} bytes)", value.asBytes()->size());
    case PropertyValue::Kind::Array:
        return fmt::format("({} elements)", value.asArray()->size());
    case PropertyValue::Kind::Dictionary:
        return fmt::format("({} entries)", value.asDictionary()->size());
    }
    return {};
}

} // namespace

/// A property that the service answers itself.
struct ZorvaTouchHIDService::OwnProperty {
    std::string_view key;
    PropertyValue (ZorvaTouchHIDService::*read)();
};

const std::array<ZorvaTouchHIDService::OwnProperty, 6> ZorvaTouchHIDService::kOwnProperties{{
    {"Version", &ZorvaTouchHIDService::version},
    {"FirmwareDebugReports", &ZorvaTouchHIDService::firmwareDebugReports},
    {"FactoryResetHoldDuration", &ZorvaTouchHIDService::factoryResetHoldDuration},
    {"Recording", &ZorvaTouchHIDService::recording},
    {"ServicePluginDebug", &ZorvaTouchHIDService::servicePluginDebug},
    {"ServiceStatus", &ZorvaTouchHIDService::serviceStatus},
}};

PropertyValue ZorvaTouchHIDService::getPropertyForKey(const char *key) {
    _log.debug("getPropertyForKey:{}", key ? key : "(null)");
    if (!key)
        return {};
    std::string stateKey = key;
    if (Util::stripDomainFromKey(stateKey, kPipelineDomain))
        return pipelineState(stateKey);
    const auto own = std::find_if(kOwnProperties.begin(), kOwnProperties.end(),
                                  [&](const OwnProperty &property) { return property.key == stateKey; });
    return own == kOwnProperties.end() ? _zorvaDevice.property(key) : (this->*own->read)();
}

bool ZorvaTouchHIDService::setPropertyForKey(const PropertyValue &value, const char *key) {
    if (_log.isEnabled(Ports::LogLevel::Debug))
        _log.debug("setProperty:{} forKey:{}", logText(value), key ? key : "(null)");
    if (!key)
        return false;
    std::string stateKey = key;
    if (!Util::stripDomainFromKey(stateKey, kPipelineDomain))
        return _zorvaDevice.setProperty(key, value); // the service's own keys too: they are read-only
    setPipelineState(stateKey, value);
    return true; // whatever the pipeline made of it
}

PropertyValue ZorvaTouchHIDService::pipelineState(const std::string &key) {
    const Host::MutexLock lock(_pipelineLock);
    return _pipeline->getState(key);
}

void ZorvaTouchHIDService::setPipelineState(const std::string &key, const PropertyValue &value) {
    const Host::MutexLock lock(_pipelineLock);
    _recording.setState(_platform.clock().nowTicks(), key, value);
}

PropertyValue ZorvaTouchHIDService::version() {
    return PropertyValue::Array{std::uint32_t{26}, std::uint32_t{0}, std::uint32_t{0}};
}

PropertyValue ZorvaTouchHIDService::firmwareDebugReports() {
    PropertyValue::Dictionary reports;
    for (const std::uint32_t id : kFirmwareDebugReportIds) {
        std::array<std::uint8_t, kFirmwareDebugReportSize> buffer{};
        const auto [status, length] = _zorvaDevice.getFeatureReport(id, buffer);
        reports[fmt::format("0x{:02x}", id)] =
            status == ZORVA_STATUS_SUCCESS
                ? Util::hexStringFromBytes(std::span(buffer).first(length))
                : fmt::format("Failed to get report ID 0x{:x}: 0x{:x}", id, status);
    }
    return reports;
}

PropertyValue ZorvaTouchHIDService::factoryResetHoldDuration() {
    using FeatureReport::FactoryResetHoldDuration;
    std::array<std::uint8_t, kFactoryResetHoldDurationSize> buffer{};
    const auto [status, length] = _zorvaDevice.getFeatureReport(FactoryResetHoldDuration::kReportId, buffer);
    if (status != ZORVA_STATUS_SUCCESS)
        return {};
    const auto report = FactoryResetHoldDuration::parse(buffer.data(), length);
    return report ? PropertyValue(report->duration) : PropertyValue();
}

PropertyValue ZorvaTouchHIDService::recording() {
    try {
        return copyOfRecording()
            .json(); // outside of the lock: the input-report thread waits for the copy alone
    } catch (const std::exception &error) {
        _log.error("Failed to write the recording: {}", error.what());
        return {};
    }
}

PipelineRecording ZorvaTouchHIDService::copyOfRecording() {
    const Host::MutexLock lock(_pipelineLock);
    return _recording;
}

PropertyValue ZorvaTouchHIDService::servicePluginDebug() {
    PropertyValue::Dictionary gathered;
    for (const char *const key : kDebugKeys)
        if (PropertyValue value = getPropertyForKey(key); !value.isNull())
            gathered[key] = std::move(value);
    return gathered;
}

PropertyValue ZorvaTouchHIDService::serviceStatus() {
    const Host::MutexLock lock(_pipelineLock);
    PropertyValue::Dictionary status{{"Scheduled", _notScheduledReason.empty()}};
    if (!_notScheduledReason.empty())
        status["Reason"] = _notScheduledReason;
    return status;
}

} // namespace ZorvaTouch
