#include "Tools/Hosting/HostedService.h"

#include "Plugin/ValueObject.h"
#include "Shared/Util/Hex.h"
#include "Shared/Util/Json.h"

#include <array>
#include <charconv>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint32_t kNoOptions = 0;

std::string hexText(ZorvaStatus status) {
    std::array<char, 8> digits;
    const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), status, 16).ptr;
    return "0x" + std::string(digits.data(), end);
}

/// Numbers of an array with points between them, anything else as JSON.
std::string versionText(const PropertyValue &version) {
    if (const std::string *const text = version.asString())
        return *text;
    const PropertyValue::Array *const parts = version.asArray();
    if (!parts)
        return Util::jsonText(version);
    std::string text;
    for (const PropertyValue &part : *parts)
        text.append(text.empty() ? "" : ".").append(Util::jsonText(part));
    return text;
}

} // namespace

std::shared_ptr<const Host::PlugInFile> openPlugIn(const std::string &file) {
    try {
        return std::make_shared<const Host::PlugInFile>(file);
    } catch (const Host::PlugInFailure &error) {
        throw HostingError(error.what());
    }
}

HostedService::HostedService(std::shared_ptr<const Host::PlugInFile> plugIn) : _plugIn(std::move(plugIn)) {
    ZorvaPlugInFactory factory = nullptr;
    try {
        factory = _plugIn->factory(ZORVA_TOUCH_FACTORY_NAME);
    } catch (const std::runtime_error &error) {
        throw HostingError(error.what());
    }
    _plug = static_cast<PlugInInterfaceTable **>(factory(nullptr, kZorvaHidServicePlugInType));
    if (!_plug)
        fail("the factory makes no HID service");
    void *hid = nullptr;
    const ZorvaStatus status = (*_plug)->QueryInterface(_plug, kZorvaHidServiceInterface, &hid);
    if (status != ZORVA_STATUS_SUCCESS || !hid) {
        (*_plug)->Release(_plug); // the destructor does not run
        fail("the service has no HID interface");
    }
    _hid = static_cast<HidServiceInterfaceTable **>(hid);
}

HostedService::~HostedService() {
    unschedule();
    if (_isOpen)
        (*_hid)->close(_hid, kNoOptions);
    if (_isStarted)
        (*_plug)->Stop(_plug);
    (*_hid)->Release(_hid);
    (*_plug)->Release(_plug);
}

void HostedService::start(ZorvaService *offered) {
    const Ref<const ZorvaValue> properties = makeValue(PropertyValue::Dictionary());
    std::int32_t score = 0;
    require((*_plug)->Probe(_plug, properties.get(), offered, &score), "probe");
    require((*_plug)->Start(_plug, properties.get(), offered), "start");
    _isStarted = true;
    _isOpen = (*_hid)->open(_hid, kNoOptions) != 0;
    if (!_isOpen)
        fail("the service cannot open the device");
}

void HostedService::setEventCallback(ZorvaEventCallback callback, void *target) noexcept {
    (*_hid)->setEventCallback(_hid, callback, target, nullptr);
}

void HostedService::schedule(ZorvaQueue *queue) {
    _queue = queue;
    (*_hid)->scheduleWithDispatchQueue(_hid, queue);
    requireScheduled();
}

/// Takes a service that does not say whether it is scheduled for one that is.
void HostedService::requireScheduled() {
    const auto status = property("ServiceStatus");
    const PropertyValue *const reason = status ? status->find("Reason") : nullptr;
    const std::string *const text = reason ? reason->asString() : nullptr;
    if (!text)
        return;
    unschedule();
    fail("the service cannot read reports: " + *text);
}

void HostedService::unschedule() noexcept {
    if (ZorvaQueue *const queue = std::exchange(_queue, nullptr))
        (*_hid)->unscheduleFromDispatchQueue(_hid, queue);
}

std::optional<PropertyValue> HostedService::property(const std::string &key) const {
    const auto value = Ref<const ZorvaValue>::adopt((*_hid)->copyProperty(_hid, key.c_str()));
    return value ? std::optional(readValue(value.get())) : std::nullopt;
}

bool HostedService::setProperty(const std::string &key, const PropertyValue &value) {
    return (*_hid)->setProperty(_hid, key.c_str(), makeValue(value).get()) != 0;
}

std::string HostedService::version() const {
    const auto version = property("Version");
    return version ? versionText(*version) : "?";
}

void HostedService::fail(const std::string &problem) const { throw HostingError(file() + ": " + problem); }

void HostedService::require(ZorvaStatus status, const char *operation) const {
    if (status != ZORVA_STATUS_SUCCESS)
        fail(std::string(operation) + " failed with status " + hexText(status));
}

} // namespace ZorvaTouch::Tools
