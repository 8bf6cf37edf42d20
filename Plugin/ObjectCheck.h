#pragma once

#include "Plugin/ZorvaPlugIn.h"

/// Whether an object of the host can be used at all: it is there, and its table has every entry that is
/// called. A host that left one out is told so at once instead of crashing the input thread later.
///
/// Threads: any; nothing is called.
namespace ZorvaTouch {

template <typename Table, typename... Entries>
[[nodiscard]] bool hasEntries(const Table *table, Entries Table::*...entries) noexcept {
    return table && table->size >= sizeof(Table) && ((table->*entries != nullptr) && ...);
}

[[nodiscard]] inline bool isComplete(const ZorvaValue *value) noexcept {
    using Table = ZorvaValueTable;
    return value &&
           hasEntries(value->table, &Table::retain, &Table::release, &Table::kind, &Table::booleanValue,
                      &Table::unsignedValue, &Table::doubleValue, &Table::stringValue, &Table::bytesValue,
                      &Table::count, &Table::element, &Table::key);
}

[[nodiscard]] inline bool isComplete(const ZorvaEvent *event) noexcept {
    using Table = ZorvaEventTable;
    return event && hasEntries(event->table, &Table::retain, &Table::release, &Table::type, &Table::phase,
                               &Table::timestamp, &Table::options, &Table::integerField, &Table::floatField,
                               &Table::payload);
}

[[nodiscard]] inline bool isComplete(const ZorvaQueue *queue) noexcept {
    using Table = ZorvaQueueTable;
    return queue && hasEntries(queue->table, &Table::retain, &Table::release, &Table::submit);
}

[[nodiscard]] inline bool isComplete(const ZorvaDevice *device) noexcept {
    using Table = ZorvaDeviceTable;
    return device && hasEntries(device->table, &Table::retain, &Table::release, &Table::open, &Table::close,
                                &Table::registerInputReportCallback, &Table::schedule, &Table::unschedule,
                                &Table::getFeatureReport, &Table::copyProperty, &Table::setProperty);
}

[[nodiscard]] inline bool isComplete(const ZorvaEventClient *client) noexcept {
    using Table = ZorvaEventClientTable;
    return client && hasEntries(client->table, &Table::retain, &Table::release, &Table::setMatching,
                                &Table::copyServices, &Table::registerCallback, &Table::unregisterCallback,
                                &Table::schedule, &Table::unschedule);
}

/// `createEventClient` and `setProperty` may be missing.
[[nodiscard]] inline bool isComplete(const ZorvaService *service) noexcept {
    using Table = ZorvaServiceTable;
    return service && hasEntries(service->table, &Table::retain, &Table::release, &Table::createDevice);
}

} // namespace ZorvaTouch
