#include "Plugin/ObjectCheck.h"

#include "Host/Simulated/Device.h"
#include "Plugin/EventObject.h"
#include "Plugin/ValueObject.h"
#include "Tests/Support/HostObjects.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>
#include <memory>

namespace ZorvaTouch {
namespace {

/// A copy of a table that ends early, in memory that ends there too: a sanitizer finds a read beyond it.
template <typename Table> class TruncatedTable {
public:
    TruncatedTable(const Table &whole, std::size_t size) : _bytes(new std::byte[size]) {
        std::memcpy(_bytes.get(), &whole, size);
        std::memcpy(_bytes.get(), &size, sizeof size);
    }
    [[nodiscard]] const Table *get() const {
        return static_cast<const Table *>(static_cast<const void *>(_bytes.get()));
    }

private:
    const std::unique_ptr<std::byte[]> _bytes;
};

/// Whether an object with the first bytes of this table is accepted.
template <typename Object, typename Table> bool isAcceptedWith(const Table &whole, std::size_t size) {
    const TruncatedTable<Table> table(whole, size);
    const Object object{table.get()};
    return isComplete(&object);
}

ZorvaServiceTable serviceTable() {
    return {
        .size = sizeof(ZorvaServiceTable),
        .retain = [](ZorvaService *) {},
        .release = [](ZorvaService *) {},
        .createDevice = [](ZorvaService *) -> ZorvaDevice * { return nullptr; },
        .createEventClient = [](ZorvaService *, std::uint32_t) -> ZorvaEventClient * { return nullptr; },
        .setProperty = [](ZorvaService *, const char *, const ZorvaValue *) -> ZorvaBoolean { return 0; },
    };
}

TEST(ObjectCheck, AcceptsAServiceWhoseTableEndsBeforeItsOptionalEntries) {
    EXPECT_TRUE(isAcceptedWith<ZorvaService>(serviceTable(), 48));
    EXPECT_TRUE(isAcceptedWith<ZorvaService>(serviceTable(), 40));
    EXPECT_TRUE(isAcceptedWith<ZorvaService>(serviceTable(), 32));
    EXPECT_FALSE(isAcceptedWith<ZorvaService>(serviceTable(), 31));
    EXPECT_FALSE(isAcceptedWith<ZorvaService>(serviceTable(), 24));
    EXPECT_FALSE(isAcceptedWith<ZorvaService>(serviceTable(), 8));
}

TEST(ObjectCheck, FindsAnEntryOnlyWhereTheTableReachesItsEnd) {
    const ZorvaServiceTable whole = serviceTable();
    for (const std::size_t size : {32u, 39u, 40u, 47u, 48u}) {
        const TruncatedTable<ZorvaServiceTable> table(whole, size);
        EXPECT_EQ(entryOf(*table.get(), &ZorvaServiceTable::createEventClient) != nullptr, size >= 40);
        EXPECT_EQ(entryOf(*table.get(), &ZorvaServiceTable::setProperty) != nullptr, size >= 48);
    }
}

TEST(ObjectCheck, RefusesATableWithoutItsLastRequiredEntry) {
    const auto queue = Testing::ManualQueue::create();
    EXPECT_TRUE(isAcceptedWith<ZorvaQueue>(*queue->table, 32));
    EXPECT_FALSE(isAcceptedWith<ZorvaQueue>(*queue->table, 31));
    const auto device = Simulated::Device::create();
    EXPECT_TRUE(isAcceptedWith<ZorvaDevice>(*device->table, 88));
    EXPECT_FALSE(isAcceptedWith<ZorvaDevice>(*device->table, 87));
    const auto value = makeValue(true);
    EXPECT_TRUE(isAcceptedWith<const ZorvaValue>(*value->table, 96));
    EXPECT_FALSE(isAcceptedWith<const ZorvaValue>(*value->table, 95));
    const auto event = makeEvent(HostEvent::createAccelerometer(0, {}, 0));
    EXPECT_TRUE(isAcceptedWith<const ZorvaEvent>(*event->table, 80));
    EXPECT_FALSE(isAcceptedWith<const ZorvaEvent>(*event->table, 79));
}

TEST(ObjectCheck, RefusesAHoleInFrontOfTheOptionalEntries) {
    ZorvaServiceTable table = serviceTable();
    table.release = nullptr;
    EXPECT_FALSE(isAcceptedWith<ZorvaService>(table, 48));
}

} // namespace
} // namespace ZorvaTouch
