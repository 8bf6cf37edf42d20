#include "Plugin/ValueObject.h"
#include "Plugin/ZorvaHIDService.h"
#include "Tests/Support/HostObjects.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <latch>
#include <string>
#include <thread>
#include <vector>

namespace ZorvaTouch {
namespace {

using Testing::ManualQueue;

/// A service that overrides nothing, and counts how often it is deleted.
class BareService final : public ZorvaHIDService {
public:
    explicit BareService(int &deletions) : _deletions(deletions) {}

private:
    ~BareService() override { ++_deletions; }
    int &_deletions;
};

constexpr ZorvaUuid kBaseIdentifier{
    {0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0xC0, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x46}};

/// A host that holds the one reference to a bare service.
class ServiceTables : public ::testing::Test {
protected:
    ServiceTables() : service(*new BareService(deletions)) {}
    ~ServiceTables() override {
        if (deletions == 0) {
            EXPECT_EQ((*plugIn)->Release(plugIn), 0u);
        }
        EXPECT_EQ(deletions, 1);
    }

    int deletions = 0;
    BareService &service;
    PlugInInterfaceTable **const plugIn = service.getPluginInterface();
    HidServiceInterfaceTable **const hid = service.getServiceInterface();
};

// --- What is in the tables -------------------------------------------------------------------------

TEST_F(ServiceTables, BeginWithTheObjectAndHaveEveryEntry) {
    const PlugInInterfaceTable &first = **plugIn;
    EXPECT_EQ(first.object, static_cast<ZorvaHIDService *>(&service));
    EXPECT_EQ(first.version, 1);
    EXPECT_EQ(first.revision, 0);
    EXPECT_TRUE(first.QueryInterface && first.AddRef && first.Release && first.Probe && first.Start &&
                first.Stop);
    const HidServiceInterfaceTable &second = **hid;
    EXPECT_EQ(second.object, first.object);
    EXPECT_TRUE(second.QueryInterface && second.AddRef && second.Release && second.open && second.close &&
                second.copyProperty && second.setProperty && second.setEventCallback &&
                second.scheduleWithDispatchQueue && second.unscheduleFromDispatchQueue && second.copyEvent &&
                second.setOutputEvent);
}

TEST(ServiceTablesLayout, IsEightAndThirteenSlots) {
    EXPECT_EQ(sizeof(PlugInInterfaceTable), 64u);
    EXPECT_EQ(sizeof(HidServiceInterfaceTable), 104u);
    EXPECT_EQ(sizeof(ZorvaUuid), 16u);
    EXPECT_EQ(sizeof(ZorvaBoolean), 1u);
}

// --- QueryInterface --------------------------------------------------------------------------------

TEST_F(ServiceTables, AnswerBothIdentifiersFromEitherTable) {
    for (int table = 0; table < 2; ++table) {
        const auto query = table == 0 ? (*plugIn)->QueryInterface : (*hid)->QueryInterface;
        void *const self = table == 0 ? static_cast<void *>(plugIn) : static_cast<void *>(hid);
        void *found = nullptr;
        EXPECT_EQ(query(self, kZorvaPlugInInterface, &found), ZORVA_STATUS_SUCCESS);
        EXPECT_EQ(found, plugIn);
        EXPECT_EQ(query(self, kZorvaHidServiceInterface, &found), ZORVA_STATUS_SUCCESS);
        EXPECT_EQ(found, hid);
        EXPECT_EQ((*plugIn)->Release(plugIn), 2u);
        EXPECT_EQ((*hid)->Release(hid), 1u);
    }
}

TEST_F(ServiceTables, LeaveThePointerAndTheCountAloneForOtherIdentifiers) {
    int place = 0;
    ZorvaUuid nearly = kZorvaHidServiceInterface;
    nearly.bytes[15] = 0xF6;
    for (const ZorvaUuid &identifier : {kBaseIdentifier, kZorvaHidServicePlugInType, nearly, ZorvaUuid{}}) {
        void *found = &place;
        EXPECT_EQ((*plugIn)->QueryInterface(plugIn, identifier, &found), 0x80000004u);
        EXPECT_EQ((*hid)->QueryInterface(hid, identifier, &found), 0x80000004u);
        EXPECT_EQ(found, &place);
    }
    EXPECT_EQ((*plugIn)->AddRef(plugIn), 2u);
    EXPECT_EQ((*plugIn)->Release(plugIn), 1u);
}

TEST_F(ServiceTables, HaveNoInterfaceWithoutAPlaceForIt) {
    EXPECT_EQ((*plugIn)->QueryInterface(plugIn, kZorvaPlugInInterface, nullptr), 0x80000004u);
    EXPECT_EQ((*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, nullptr), 0x80000004u);
    EXPECT_EQ((*plugIn)->AddRef(plugIn), 2u);
    EXPECT_EQ((*plugIn)->Release(plugIn), 1u);
}

// --- Counting --------------------------------------------------------------------------------------

TEST_F(ServiceTables, CountTogether) {
    EXPECT_EQ((*plugIn)->AddRef(plugIn), 2u);
    EXPECT_EQ((*hid)->AddRef(hid), 3u);
    EXPECT_EQ((*plugIn)->Release(plugIn), 2u);
    EXPECT_EQ((*hid)->Release(hid), 1u);
    EXPECT_EQ(deletions, 0);
    EXPECT_EQ((*hid)->Release(hid), 0u);
    EXPECT_EQ(deletions, 1);
}

TEST_F(ServiceTables, ReleasedOnManyThreadsDeleteOnce) {
    constexpr int kThreads = 4, kRounds = 5'000;
    for (int reference = 1; reference < kThreads; ++reference)
        (*plugIn)->AddRef(plugIn);
    std::latch begin(kThreads);
    {
        std::vector<std::jthread> threads;
        for (int index = 0; index < kThreads; ++index)
            threads.emplace_back([&] {
                begin.arrive_and_wait();
                for (int round = 0; round < kRounds; ++round) {
                    (*hid)->AddRef(hid);
                    (*hid)->Release(hid);
                }
                (*plugIn)->Release(plugIn);
            });
    }
    EXPECT_EQ(deletions, 1);
}

// --- What a service does that overrides nothing ----------------------------------------------------

TEST_F(ServiceTables, OfABareServiceSupportNothing) {
    std::int32_t score = 77;
    EXPECT_EQ((*plugIn)->Probe(plugIn, nullptr, nullptr, &score), 0xE00002C7u);
    EXPECT_EQ(score, 77);
    EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, nullptr), 0xE00002C7u);
    EXPECT_EQ((*plugIn)->Stop(plugIn), 0xE00002C7u);
    EXPECT_EQ((*hid)->open(hid, 1), 0);
    (*hid)->close(hid, 1);
    EXPECT_EQ((*hid)->copyProperty(hid, "Version"), nullptr);
    EXPECT_EQ((*hid)->setProperty(hid, "Version", makeValue(true).get()), 0);
    (*hid)->setEventCallback(hid, nullptr, nullptr, nullptr);
    EXPECT_EQ((*hid)->copyEvent(hid, kZorvaEventDigitizer, nullptr, 0), nullptr);
    EXPECT_EQ((*hid)->setOutputEvent(hid, nullptr), 0xE00002C7u);
}

TEST_F(ServiceTables, OfABareServiceKeepNoQueue) {
    const auto queue = ManualQueue::create();
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    (*hid)->unscheduleFromDispatchQueue(hid, queue.get());
    (*hid)->scheduleWithDispatchQueue(hid, nullptr);
    (*hid)->unscheduleFromDispatchQueue(hid, nullptr);
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(ServiceTables, OfNothingFailWithoutAService) {
    EXPECT_EQ((*plugIn)->QueryInterface(nullptr, kZorvaPlugInInterface, nullptr), 0x80000004u);
    EXPECT_EQ((*plugIn)->AddRef(nullptr), 0u);
    EXPECT_EQ((*plugIn)->Release(nullptr), 0u);
    EXPECT_EQ((*plugIn)->Probe(nullptr, nullptr, nullptr, nullptr), 0xE00002BEu);
    EXPECT_EQ((*plugIn)->Start(nullptr, nullptr, nullptr), 0xE00002BEu);
    EXPECT_EQ((*plugIn)->Stop(nullptr), 0xE00002BEu);
    EXPECT_EQ((*hid)->open(nullptr, 0), 0);
    (*hid)->close(nullptr, 0);
    EXPECT_EQ((*hid)->copyProperty(nullptr, "Version"), nullptr);
    EXPECT_EQ((*hid)->setProperty(nullptr, "Version", nullptr), 0);
    (*hid)->setEventCallback(nullptr, nullptr, nullptr, nullptr);
    (*hid)->scheduleWithDispatchQueue(nullptr, nullptr);
    (*hid)->unscheduleFromDispatchQueue(nullptr, nullptr);
    EXPECT_EQ((*hid)->copyEvent(nullptr, 0, nullptr, 0), nullptr);
    EXPECT_EQ((*hid)->setOutputEvent(nullptr, nullptr), 0xE00002BEu);
}

} // namespace
} // namespace ZorvaTouch
