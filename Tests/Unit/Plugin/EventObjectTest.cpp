#include "Plugin/EventObject.h"

#include "Shared/HostEvent.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <optional>
#include <vector>

namespace ZorvaTouch {
namespace {

using Event = Ref<const ZorvaEvent>;

std::optional<std::int64_t> integer(const Event &event, std::uint32_t field) {
    std::int64_t value = 0;
    const ZorvaBoolean has = event->table->integerField(event.get(), field, &value);
    return has == 1 ? std::optional(value) : std::nullopt;
}

std::optional<double> real(const Event &event, std::uint32_t field) {
    double value = 0;
    const ZorvaBoolean has = event->table->floatField(event.get(), field, &value);
    return has == 1 ? std::optional(value) : std::nullopt;
}

/// A digitizer event in which no two fields are equal.
std::shared_ptr<HostEvent> distinctDigitizer() {
    auto event = HostEvent::createDigitizer(0x1122334455667788,
                                            {.transducerType = 1,
                                             .transducerIndex = 2,
                                             .identity = 3,
                                             .eventMask = 0xFFFFFFFF,
                                             .buttonMask = 5,
                                             .x = 6.5,
                                             .y = 7.5,
                                             .z = -8.5,
                                             .tipPressure = 9.5,
                                             .barrelPressure = 10.5,
                                             .inRange = true,
                                             .touch = false},
                                            0x80000001);
    event->setPhase(kEventPhaseMayBegin);
    event->setIntegerField(kDigitizerFieldFrameNumber, 4294967295);
    return event;
}

// --- Ours to them ----------------------------------------------------------------------------------

TEST(EventObject, OfADigitizerHasEveryField) {
    const Event event = makeEvent(distinctDigitizer());
    EXPECT_EQ(event->table->size, sizeof(ZorvaEventTable));
    EXPECT_EQ(event->table->type(event.get()), 11u);
    EXPECT_EQ(event->table->phase(event.get()), 128u);
    EXPECT_EQ(event->table->timestamp(event.get()), 0x1122334455667788u);
    EXPECT_EQ(event->table->options(event.get()), 0x80000001u);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerTransducer), 1);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerIndex), 2);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerIdentity), 3);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerMask), 4294967295);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerButtons), 5);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerRange), 1);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerTouch), 0);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerFrame), 4294967295);
    EXPECT_EQ(real(event, kZorvaFieldDigitizerX), 6.5);
    EXPECT_EQ(real(event, kZorvaFieldDigitizerY), 7.5);
    EXPECT_EQ(real(event, kZorvaFieldDigitizerZ), -8.5);
    EXPECT_EQ(real(event, kZorvaFieldDigitizerPressure), 9.5);
    EXPECT_EQ(real(event, kZorvaFieldDigitizerBarrelPressure), 10.5);
}

TEST(EventObject, HasNeitherOtherFieldsNorAPayloadOfOthers) {
    const Event event = makeEvent(distinctDigitizer());
    EXPECT_EQ(integer(event, kZorvaFieldVendorUsage), std::nullopt);
    EXPECT_EQ(integer(event, kZorvaFieldDigitizerX), std::nullopt); // a float
    EXPECT_EQ(real(event, kZorvaFieldDigitizerMask), std::nullopt); // an integer
    EXPECT_EQ(real(event, kZorvaFieldAccelerometerX), std::nullopt);
    EXPECT_EQ(integer(event, 0), std::nullopt);
    EXPECT_EQ(integer(event, 0xFFFFFFFF), std::nullopt);
    std::size_t length = 99;
    EXPECT_EQ(event->table->payload(event.get(), &length), nullptr);
    EXPECT_EQ(length, 0u);
}

TEST(EventObject, StoresNothingForAFieldThatItLacks) {
    const Event event = makeEvent(distinctDigitizer());
    std::int64_t number = 77;
    EXPECT_EQ(event->table->integerField(event.get(), 1, &number), 0);
    EXPECT_EQ(number, 77);
    double value = 0.75;
    EXPECT_EQ(event->table->floatField(event.get(), 1, &value), 0);
    EXPECT_EQ(value, 0.75);
}

TEST(EventObject, OfAVendorDefinedEventHasItsPayload) {
    const Event event = makeEvent(HostEvent::createVendorDefined(
        5, {.usagePage = 0xFF60, .usage = 2, .version = 0xFFFFFFFF, .payload = {9, 8}}, 0));
    EXPECT_EQ(event->table->type(event.get()), 1u);
    EXPECT_EQ(event->table->phase(event.get()), 0u);
    EXPECT_EQ(integer(event, kZorvaFieldVendorUsagePage), 0xFF60);
    EXPECT_EQ(integer(event, kZorvaFieldVendorUsage), 2);
    EXPECT_EQ(integer(event, kZorvaFieldVendorVersion), 4294967295);
    std::size_t length = 0;
    const std::uint8_t *const payload = event->table->payload(event.get(), &length);
    EXPECT_EQ(std::vector<std::uint8_t>(payload, payload + length), (std::vector<std::uint8_t>{9, 8}));
}

TEST(EventObject, OfAnAccelerometerWidensItsFields) {
    const Event event = makeEvent(HostEvent::createAccelerometer(5, {0.5f, -0.1f, 1.0f}, 0));
    EXPECT_EQ(event->table->type(event.get()), 13u);
    EXPECT_EQ(real(event, kZorvaFieldAccelerometerX), 0.5);
    EXPECT_EQ(real(event, kZorvaFieldAccelerometerY), static_cast<double>(-0.1f));
    EXPECT_EQ(real(event, kZorvaFieldAccelerometerZ), 1.0);
}

TEST(EventObject, KeepsItsEvent) {
    auto host = HostEvent::createAccelerometer(41, {}, 0);
    const Event event = makeEvent(host);
    const Event kept = event;
    host.reset();
    EXPECT_EQ(kept->table->timestamp(kept.get()), 41u);
}

// --- Theirs to us ----------------------------------------------------------------------------------

TEST(EventObject, OfADigitizerReadsBackFieldByField) {
    const auto read = readEvent(makeEvent(distinctDigitizer()).get());
    ASSERT_TRUE(read && read->digitizer());
    const DigitizerFields &fields = *read->digitizer();
    EXPECT_EQ(read->timestamp(), 0x1122334455667788u);
    EXPECT_EQ(read->options(), 0x80000001u);
    EXPECT_EQ(read->phase(), 128);
    EXPECT_EQ(read->integerField(kDigitizerFieldFrameNumber), 4294967295);
    EXPECT_EQ(fields.transducerType, 1u);
    EXPECT_EQ(fields.transducerIndex, 2u);
    EXPECT_EQ(fields.identity, 3u);
    EXPECT_EQ(fields.eventMask, 0xFFFFFFFFu);
    EXPECT_EQ(fields.buttonMask, 5u);
    EXPECT_EQ(fields.x, 6.5);
    EXPECT_EQ(fields.y, 7.5);
    EXPECT_EQ(fields.z, -8.5);
    EXPECT_EQ(fields.tipPressure, 9.5);
    EXPECT_EQ(fields.barrelPressure, 10.5);
    EXPECT_TRUE(fields.inRange);
    EXPECT_FALSE(fields.touch);
}

TEST(EventObject, WithoutAFrameNumberReadsBackWithoutOne) {
    const auto read = readEvent(makeEvent(HostEvent::createDigitizer(0, {}, 0)).get());
    ASSERT_TRUE(read);
    EXPECT_EQ(read->integerField(kDigitizerFieldFrameNumber), std::nullopt);
}

TEST(EventObject, OfAVendorDefinedEventReadsBack) {
    const auto read =
        readEvent(makeEvent(HostEvent::createVendorDefined(
                                6, {.usagePage = 0xFFFF, .usage = 3, .version = 4, .payload = {1, 2, 3}}, 7))
                      .get());
    ASSERT_TRUE(read && read->vendorDefined());
    EXPECT_EQ(read->timestamp(), 6u);
    EXPECT_EQ(read->options(), 7u);
    EXPECT_EQ(read->vendorDefined()->usagePage, 0xFFFF);
    EXPECT_EQ(read->vendorDefined()->usage, 3);
    EXPECT_EQ(read->vendorDefined()->version, 4u);
    EXPECT_EQ(read->vendorDefined()->payload, (std::vector<std::uint8_t>{1, 2, 3}));
}

TEST(EventObject, OfAnAccelerometerReadsBackToTheBit) {
    const auto read = readEvent(makeEvent(HostEvent::createAccelerometer(8, {0.1f, -0.2f, 3.0f}, 9)).get());
    ASSERT_TRUE(read && read->accelerometer());
    EXPECT_EQ(read->timestamp(), 8u);
    EXPECT_EQ(read->accelerometer()->x, 0.1f);
    EXPECT_EQ(read->accelerometer()->y, -0.2f);
    EXPECT_EQ(read->accelerometer()->z, 3.0f);
}

/// An event of somebody else: a type, no fields, and a payload that is not there.
struct ForeignEvent : ZorvaEvent {
    explicit ForeignEvent(std::uint32_t eventType) : ZorvaEvent{&kTable}, type(eventType) {}
    std::uint32_t type;

    static const ZorvaEventTable kTable;
};

const ZorvaEventTable ForeignEvent::kTable{
    .size = sizeof(ZorvaEventTable),
    .retain = [](const ZorvaEvent *) {},
    .release = [](const ZorvaEvent *) {},
    .type = [](const ZorvaEvent *event) { return static_cast<const ForeignEvent *>(event)->type; },
    .phase = [](const ZorvaEvent *) { return std::uint32_t{4}; },
    .timestamp = [](const ZorvaEvent *) { return std::uint64_t{12}; },
    .options = [](const ZorvaEvent *) { return std::uint32_t{0}; },
    .integerField = [](const ZorvaEvent *, std::uint32_t, std::int64_t *) { return ZorvaBoolean{0}; },
    .floatField = [](const ZorvaEvent *, std::uint32_t, double *) { return ZorvaBoolean{0}; },
    .payload = [](const ZorvaEvent *, std::size_t *length) -> const std::uint8_t * {
        *length = 5;
        return nullptr;
    },
};

TEST(ForeignEvent, WithoutFieldsHasZeros) {
    const ForeignEvent foreign(kZorvaEventAccelerometer);
    const auto read = readEvent(&foreign);
    ASSERT_TRUE(read && read->accelerometer());
    EXPECT_EQ(read->timestamp(), 12u);
    EXPECT_EQ(read->phase(), 4);
    EXPECT_EQ(read->accelerometer()->x, 0.0f);
}

TEST(ForeignEvent, WithoutItsPayloadHasNone) {
    const ForeignEvent foreign(kZorvaEventVendorDefined);
    const auto read = readEvent(&foreign);
    ASSERT_TRUE(read && read->vendorDefined());
    EXPECT_TRUE(read->vendorDefined()->payload.empty());
}

TEST(ForeignEvent, OfAnUnknownTypeIsNotRead) {
    for (const std::uint32_t type : {0u, 2u, 12u, 14u, 0xFFFFFFFFu}) {
        const ForeignEvent foreign(type);
        EXPECT_EQ(readEvent(&foreign), nullptr) << type;
    }
}

TEST(ForeignEvent, ThatIsNoneOrNotWholeIsNotRead) {
    EXPECT_EQ(readEvent(nullptr), nullptr);
    ForeignEvent foreign(kZorvaEventDigitizer);
    foreign.table = nullptr;
    EXPECT_EQ(readEvent(&foreign), nullptr);
    ZorvaEventTable table = ForeignEvent::kTable;
    foreign.table = &table;
    EXPECT_NE(readEvent(&foreign), nullptr);
    table.payload = nullptr;
    EXPECT_EQ(readEvent(&foreign), nullptr);
}

} // namespace
} // namespace ZorvaTouch
