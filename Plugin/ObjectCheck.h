#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <cstddef>

/// Whether an object of the host can be used at all: it is there, and its table has every entry that is
/// called. The check at the start replaces a crash of the input thread later.
///
/// A table may be smaller than the one of this header if only optional entries are missing at its end.
///
/// Threads: any; nothing is called.
namespace ZorvaTouch {

/// An entry of a table; null if the table is too small to have it. Nothing beyond `table.size` is read.
template <typename Table, typename Entry>
[[nodiscard]] Entry entryOf(const Table &table, Entry Table::*entry) noexcept {
    static constexpr Table kLayout{};
    const auto *const begin = static_cast<const std::byte *>(static_cast<const void *>(&kLayout));
    const auto *const end = static_cast<const std::byte *>(static_cast<const void *>(&(kLayout.*entry) + 1));
    return table.size >= static_cast<std::size_t>(end - begin) ? table.*entry : nullptr;
}

template <typename Table, typename... Entries>
[[nodiscard]] bool hasEntries(const Table *table, Entries Table::*...entries) noexcept {
    return table && ((entryOf(*table, entries) != nullptr) && ...);
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

/// `createEventClient` and `setProperty` are optional: ask for them with `entryOf`.
[[nodiscard]] inline bool isComplete(const ZorvaService *service) noexcept {
    using Table = ZorvaServiceTable;
    return service && hasEntries(service->table, &Table::retain, &Table::release, &Table::createDevice);
}

} // namespace ZorvaTouch
