#include "Plugin/EventObject.h"

#include "Plugin/BoundaryObject.h"
#include "Plugin/ObjectCheck.h"

#include <array>
#include <cstdint>
#include <utility>

namespace ZorvaTouch {
namespace {

/// One integer or float field of an event's kind, by its code.
template <typename Fields, typename Value> struct Field {
    std::uint32_t code;
    Value (*read)(const Fields &fields);
};
template <typename Fields> using IntegerField = Field<Fields, std::int64_t>;
template <typename Fields> using FloatField = Field<Fields, double>;

constexpr std::array<IntegerField<DigitizerFields>, 7> kDigitizerIntegers{{
    {kZorvaFieldDigitizerTransducer, [](const DigitizerFields &f) { return std::int64_t{f.transducerType}; }},
    {kZorvaFieldDigitizerIndex, [](const DigitizerFields &f) { return std::int64_t{f.transducerIndex}; }},
    {kZorvaFieldDigitizerIdentity, [](const DigitizerFields &f) { return std::int64_t{f.identity}; }},
    {kZorvaFieldDigitizerButtons, [](const DigitizerFields &f) { return std::int64_t{f.buttonMask}; }},
    {kZorvaFieldDigitizerMask, [](const DigitizerFields &f) { return std::int64_t{f.eventMask}; }},
    {kZorvaFieldDigitizerRange, [](const DigitizerFields &f) { return std::int64_t{f.inRange}; }},
    {kZorvaFieldDigitizerTouch, [](const DigitizerFields &f) { return std::int64_t{f.touch}; }},
}};
constexpr std::array<FloatField<DigitizerFields>, 5> kDigitizerFloats{{
    {kZorvaFieldDigitizerX, [](const DigitizerFields &f) { return f.x; }},
    {kZorvaFieldDigitizerY, [](const DigitizerFields &f) { return f.y; }},
    {kZorvaFieldDigitizerZ, [](const DigitizerFields &f) { return f.z; }},
    {kZorvaFieldDigitizerPressure, [](const DigitizerFields &f) { return f.tipPressure; }},
    {kZorvaFieldDigitizerBarrelPressure, [](const DigitizerFields &f) { return f.barrelPressure; }},
}};
constexpr std::array<IntegerField<VendorDefinedFields>, 3> kVendorIntegers{{
    {kZorvaFieldVendorUsagePage, [](const VendorDefinedFields &f) { return std::int64_t{f.usagePage}; }},
    {kZorvaFieldVendorUsage, [](const VendorDefinedFields &f) { return std::int64_t{f.usage}; }},
    {kZorvaFieldVendorVersion, [](const VendorDefinedFields &f) { return std::int64_t{f.version}; }},
}};
constexpr std::array<FloatField<AccelerometerFields>, 3> kAccelerometerFloats{{
    {kZorvaFieldAccelerometerX, [](const AccelerometerFields &f) { return static_cast<double>(f.x); }},
    {kZorvaFieldAccelerometerY, [](const AccelerometerFields &f) { return static_cast<double>(f.y); }},
    {kZorvaFieldAccelerometerZ, [](const AccelerometerFields &f) { return static_cast<double>(f.z); }},
}};

/// Stores the field of that code, if the event has such fields and one of that code.
template <typename Fields, typename Value, std::size_t Count>
bool readField(const Fields *fields, const std::array<Field<Fields, Value>, Count> &table, std::uint32_t code,
               Value *value) {
    if (!fields)
        return false;
    for (const Field<Fields, Value> &field : table)
        if (field.code == code) {
            *value = field.read(*fields);
            return true;
        }
    return false;
}

class EventObject final : public BoundaryObject<EventObject, ZorvaEvent> {
public:
    explicit EventObject(std::shared_ptr<const HostEvent> event)
        : BoundaryObject(&kTable), _event(std::move(event)) {}

private:
    static const ZorvaEventTable kTable;

    static const HostEvent &eventOf(const ZorvaEvent *event) noexcept { return *of(event)._event; }

    static std::uint32_t type(const ZorvaEvent *event) noexcept {
        return static_cast<std::uint32_t>(eventOf(event).type());
    }
    static std::uint32_t phase(const ZorvaEvent *event) noexcept { return eventOf(event).phase(); }
    static std::uint64_t timestamp(const ZorvaEvent *event) noexcept { return eventOf(event).timestamp(); }
    static std::uint32_t options(const ZorvaEvent *event) noexcept { return eventOf(event).options(); }

    static ZorvaBoolean integerField(const ZorvaEvent *event, std::uint32_t code,
                                     std::int64_t *value) noexcept {
        const HostEvent &host = eventOf(event);
        if (const auto field = host.integerField(code)) {
            *value = *field;
            return 1;
        }
        return readField(host.digitizer(), kDigitizerIntegers, code, value) ||
               readField(host.vendorDefined(), kVendorIntegers, code, value);
    }
    static ZorvaBoolean floatField(const ZorvaEvent *event, std::uint32_t code, double *value) noexcept {
        const HostEvent &host = eventOf(event);
        return readField(host.digitizer(), kDigitizerFloats, code, value) ||
               readField(host.accelerometer(), kAccelerometerFloats, code, value);
    }
    static const std::uint8_t *payload(const ZorvaEvent *event, std::size_t *length) noexcept {
        const VendorDefinedFields *const fields = eventOf(event).vendorDefined();
        *length = fields ? fields->payload.size() : 0;
        return fields ? fields->payload.data() : nullptr;
    }

    const std::shared_ptr<const HostEvent> _event;
};

const ZorvaEventTable EventObject::kTable{
    .size = sizeof(ZorvaEventTable),
    .retain = EventObject::retain<const ZorvaEvent>,
    .release = EventObject::release<const ZorvaEvent>,
    .type = EventObject::type,
    .phase = EventObject::phase,
    .timestamp = EventObject::timestamp,
    .options = EventObject::options,
    .integerField = EventObject::integerField,
    .floatField = EventObject::floatField,
    .payload = EventObject::payload,
};

template <typename Integer> Integer integerOf(const ZorvaEvent *event, std::uint32_t code) {
    std::int64_t value = 0;
    return event->table->integerField(event, code, &value) ? static_cast<Integer>(value) : Integer{};
}

double floatOf(const ZorvaEvent *event, std::uint32_t code) {
    double value = 0;
    return event->table->floatField(event, code, &value) ? value : 0;
}

DigitizerFields readDigitizer(const ZorvaEvent *event) {
    return {
        .transducerType = integerOf<std::uint32_t>(event, kZorvaFieldDigitizerTransducer),
        .transducerIndex = integerOf<std::uint32_t>(event, kZorvaFieldDigitizerIndex),
        .identity = integerOf<std::uint32_t>(event, kZorvaFieldDigitizerIdentity),
        .eventMask = integerOf<std::uint32_t>(event, kZorvaFieldDigitizerMask),
        .buttonMask = integerOf<std::uint32_t>(event, kZorvaFieldDigitizerButtons),
        .x = floatOf(event, kZorvaFieldDigitizerX),
        .y = floatOf(event, kZorvaFieldDigitizerY),
        .z = floatOf(event, kZorvaFieldDigitizerZ),
        .tipPressure = floatOf(event, kZorvaFieldDigitizerPressure),
        .barrelPressure = floatOf(event, kZorvaFieldDigitizerBarrelPressure),
        .inRange = integerOf<std::int64_t>(event, kZorvaFieldDigitizerRange) != 0,
        .touch = integerOf<std::int64_t>(event, kZorvaFieldDigitizerTouch) != 0,
    };
}

VendorDefinedFields readVendorDefined(const ZorvaEvent *event) {
    std::size_t length = 0;
    const std::uint8_t *const payload = event->table->payload(event, &length);
    VendorDefinedFields fields{
        .usagePage = integerOf<std::uint16_t>(event, kZorvaFieldVendorUsagePage),
        .usage = integerOf<std::uint16_t>(event, kZorvaFieldVendorUsage),
        .version = integerOf<std::uint32_t>(event, kZorvaFieldVendorVersion),
        .payload = {},
    };
    if (payload && length <= PTRDIFF_MAX) // longer than memory is nothing that was ever sent
        fields.payload.assign(payload, payload + length);
    return fields;
}

/// Narrowed as a maker widened them: a float that is not one of ours is rounded once.
AccelerometerFields readAccelerometer(const ZorvaEvent *event) {
    return {
        .x = static_cast<float>(floatOf(event, kZorvaFieldAccelerometerX)),
        .y = static_cast<float>(floatOf(event, kZorvaFieldAccelerometerY)),
        .z = static_cast<float>(floatOf(event, kZorvaFieldAccelerometerZ)),
    };
}

} // namespace

Ref<const ZorvaEvent> makeEvent(std::shared_ptr<const HostEvent> event) {
    return Ref<const ZorvaEvent>::adopt(new EventObject(std::move(event)));
}

std::shared_ptr<HostEvent> readEvent(const ZorvaEvent *event) {
    if (!isComplete(event))
        return nullptr;
    const ZorvaEventTable &table = *event->table;
    std::shared_ptr<HostEvent> read;
    switch (table.type(event)) {
    case kZorvaEventDigitizer:
        read = HostEvent::createDigitizer(table.timestamp(event), readDigitizer(event), table.options(event));
        std::int64_t frame;
        if (table.integerField(event, kZorvaFieldDigitizerFrame, &frame))
            read->setIntegerField(kDigitizerFieldFrameNumber, frame);
        break;
    case kZorvaEventVendorDefined:
        read = HostEvent::createVendorDefined(table.timestamp(event), readVendorDefined(event),
                                              table.options(event));
        break;
    case kZorvaEventAccelerometer:
        read = HostEvent::createAccelerometer(table.timestamp(event), readAccelerometer(event),
                                              table.options(event));
        break;
    default:
        return nullptr;
    }
    read->setPhase(static_cast<std::uint16_t>(table.phase(event)));
    return read;
}

} // namespace ZorvaTouch
