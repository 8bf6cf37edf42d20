#include "Host/Objects/EventSystem.h"

#include "Host/Objects/Accelerometer.h"
#include "Plugin/EventObject.h"
#include "Plugin/ValueObject.h"
#include "Tests/Unit/Host/Simulated/LoopThread.h"
#include "Tests/Unit/Host/Simulated/ManualLoop.h"

#include <gtest/gtest.h>

#include <array>
#include <functional>
#include <string>

namespace ZorvaTouch::Host {
namespace {

using Simulated::LoopThread;
using Simulated::ManualLoop;

using Texts = std::vector<std::string>;

const PropertyValue kAccelerometers =
    PropertyValue::Dictionary{{"PrimaryUsagePage", 0xFF00u}, {"PrimaryUsage", 3u}};

/// A client, and what it hears.
class Ear {
public:
    explicit Ear(EventSystem &system) : client(system.createClient()) {}

    void match(const PropertyValue &properties) {
        client->table->setMatching(client.get(), makeValue(properties).get());
    }
    std::size_t matchCount() { return client->table->copyServices(client.get(), nullptr, 0); }
    void listen() { client->table->registerCallback(client.get(), hear, this); }
    void stopListening() { client->table->unregisterCallback(client.get(), hear, this); }
    void schedule(ZorvaRunLoop *loop) { client->table->schedule(client.get(), loop, "mode"); }
    void unschedule(ZorvaRunLoop *loop) { client->table->unschedule(client.get(), loop, "mode"); }

    Ref<ZorvaEventClient> client;
    Texts heard;
    std::function<void()> onEvent; ///< after it was noted

private:
    static void hear(void *context, const ZorvaEvent *event) noexcept {
        auto &self = *static_cast<Ear *>(context);
        self.heard.push_back(jsonText(*readEvent(event)));
        if (self.onEvent)
            self.onEvent();
    }
};

class Events : public testing::Test {
protected:
    void begin() {
        ear.listen();
        ear.schedule(&loop);
    }
    ~Events() override { ear.unschedule(&loop); }

    ManualLoop loop;
    std::shared_ptr<EventSystem> system = EventSystem::create();
    Ref<Accelerometer> accelerometer = Accelerometer::create(system);
    Ear ear{*system};
};

// --- Services ------------------------------------------------------------------------------------

TEST_F(Events, AnAccelerometerIsFoundByItsUsage) {
    ear.match(kAccelerometers);
    ZorvaService *found = nullptr;
    EXPECT_EQ(ear.client->table->copyServices(ear.client.get(), &found, 1), 1u);
    EXPECT_EQ(Ref<ZorvaService>::adopt(found).get(), accelerometer.get());
}

TEST_F(Events, AServiceMatchesWithAllPropertiesOfEqualKindAndContent) {
    EXPECT_EQ(ear.matchCount(), 1u) << "unless told, everything";
    ear.match(PropertyValue::Dictionary{});
    EXPECT_EQ(ear.matchCount(), 1u);
    ear.match(PropertyValue::Dictionary{{"PrimaryUsage", 3u}});
    EXPECT_EQ(ear.matchCount(), 1u);
    ear.match(PropertyValue::Dictionary{{"PrimaryUsage", 4u}});
    EXPECT_EQ(ear.matchCount(), 0u);
    ear.match(PropertyValue::Dictionary{{"PrimaryUsage", 3.0}});
    EXPECT_EQ(ear.matchCount(), 0u) << "a double is no unsigned";
    ear.match(PropertyValue::Dictionary{{"PrimaryUsage", 3u}, {"Product", "x"}});
    EXPECT_EQ(ear.matchCount(), 0u);
    ear.match(3u);
    EXPECT_EQ(ear.matchCount(), 0u) << "no dictionary";
}

TEST_F(Events, ServicesAreCopiedUpToTheCapacityAndAllCounted) {
    const auto second = Accelerometer::create(system);
    std::array<ZorvaService *, 3> found{};
    EXPECT_EQ(ear.client->table->copyServices(ear.client.get(), found.data(), 1), 2u);
    EXPECT_EQ(Ref<ZorvaService>::adopt(found[0]).get(), accelerometer.get());
    EXPECT_EQ(found[1], nullptr);
    EXPECT_EQ(ear.client->table->copyServices(ear.client.get(), found.data(), 3), 2u);
    EXPECT_EQ(Ref<ZorvaService>::adopt(found[0]).get(), accelerometer.get());
    EXPECT_EQ(Ref<ZorvaService>::adopt(found[1]).get(), second.get());
    EXPECT_EQ(found[2], nullptr);
}

TEST_F(Events, AnUnpluggedServiceIsNotFound) {
    accelerometer->unplug();
    EXPECT_EQ(ear.matchCount(), 0u);
    accelerometer->plug();
    EXPECT_EQ(ear.matchCount(), 1u);
}

TEST_F(Events, AnAccelerometerTakesItsReportIntervalAndNothingElse) {
    const auto set = [this](const char *key, const PropertyValue &value) {
        return accelerometer->table->setProperty(accelerometer.get(), key, makeValue(value).get());
    };
    EXPECT_EQ(accelerometer->reportInterval(), std::nullopt);
    EXPECT_EQ(set("ReportInterval", 10000u), 0) << "a double";
    EXPECT_EQ(accelerometer->reportInterval(), std::nullopt);
    EXPECT_EQ(set("ReportInterval", 10000.0), 1);
    EXPECT_EQ(accelerometer->reportInterval(), 10000.0);
    EXPECT_EQ(set("PrimaryUsage", 4.0), 0);
    EXPECT_EQ(set(nullptr, 4.0), 0);
    EXPECT_EQ(accelerometer->properties().get("PrimaryUsage"), PropertyValue(3u));
}

TEST_F(Events, AnAccelerometerHasNoDeviceAndNoClients) {
    EXPECT_EQ(accelerometer->table->createDevice(accelerometer.get()), nullptr);
    EXPECT_EQ(accelerometer->table->createEventClient, nullptr);
}

TEST_F(Events, AnAccelerometerOutlivesItsSystem) {
    auto other = EventSystem::create();
    const auto orphan = Accelerometer::create(other);
    other.reset();
    orphan->deliver(1, 2, 3, 4);
    orphan->waitUntilHandled();
    orphan->unplug();
    orphan->plug();
}

// --- Events --------------------------------------------------------------------------------------

TEST_F(Events, ASampleIsHeardInThePassThatServesIt) {
    begin();
    accelerometer->deliver(0.5f, 0, -1, 77);
    EXPECT_TRUE(ear.heard.empty());
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(ear.heard, (Texts{R"({"accelerometer":true,"x":0.5,"y":0.0,"z":-1.0})"}));
    EXPECT_EQ(system->counters().heard, 1u);
}

TEST_F(Events, OneIsServedInAPass) {
    begin();
    for (int i = 0; i < 3; ++i)
        accelerometer->deliver(1, 2, 3, 4);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(ear.heard.size(), 1u);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_TRUE(loop.serveOne());
    EXPECT_FALSE(loop.serveOne());
    EXPECT_EQ(ear.heard.size(), 3u);
}

TEST_F(Events, OtherTypesAreHeardToo) {
    begin();
    accelerometer->deliver(HostEvent::createVendorDefined(5, {0xFF60, 2, 0, {}}, 0));
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(ear.heard, (Texts{R"({"vendor":true,"usagePage":65376,"usage":2})"}));
}

TEST_F(Events, OnlyScheduledClientsHear) {
    ear.listen();
    accelerometer->deliver(1, 2, 3, 4);
    ear.schedule(&loop);
    EXPECT_FALSE(loop.serveOne());
    EXPECT_TRUE(ear.heard.empty());
}

TEST_F(Events, WhatIsNotHeardWhenItsTurnComesIsDropped) {
    ear.schedule(&loop);
    accelerometer->deliver(1, 2, 3, 4);
    EXPECT_TRUE(loop.serveOne());
    begin();
    accelerometer->deliver(1, 2, 3, 4);
    ear.stopListening();
    EXPECT_TRUE(loop.serveOne());
    EXPECT_TRUE(ear.heard.empty());
    EXPECT_EQ(system->counters().dropped, 2u);
    EXPECT_EQ(system->counters().heard, 0u);
}

TEST_F(Events, EveryMatchingClientHears) {
    Ear second(*system);
    Ear deaf(*system);
    deaf.match(PropertyValue::Dictionary{{"PrimaryUsage", 4u}});
    begin();
    for (Ear *other : {&second, &deaf}) {
        other->listen();
        other->schedule(&loop);
    }
    EXPECT_EQ(loop.sourceCount(), 2u) << "nothing matches the third";
    accelerometer->deliver(1, 2, 3, 4);
    while (loop.serveOne())
        ;
    EXPECT_EQ(ear.heard.size(), 1u);
    EXPECT_EQ(second.heard.size(), 1u);
    EXPECT_TRUE(deaf.heard.empty());
    second.unschedule(&loop);
    deaf.unschedule(&loop);
}

TEST_F(Events, ACallbackThatAnotherTookAwayIsNotCalled) {
    int calls = 0;
    const ZorvaEventClientCallback count = [](void *context, const ZorvaEvent *) {
        ++*static_cast<int *>(context);
    };
    const ZorvaEventClientTable &table = *ear.client->table;
    ear.listen();
    table.registerCallback(ear.client.get(), count, &calls);
    table.registerCallback(ear.client.get(), nullptr, nullptr);
    ear.schedule(&loop);
    accelerometer->deliver(1, 2, 3, 4);
    loop.serveOne();
    EXPECT_EQ(calls, 1);
    ear.onEvent = [&] { table.unregisterCallback(ear.client.get(), count, &calls); };
    accelerometer->deliver(1, 2, 3, 4);
    loop.serveOne();
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(ear.heard.size(), 2u);
}

TEST_F(Events, SixtyThreeWaitAndTheNewestBeyondIsDropped) {
    begin();
    for (int i = 0; i < 64; ++i)
        accelerometer->deliver(static_cast<float>(i), 0, 0, 1);
    EXPECT_EQ(system->counters().dropped, 1u);
    while (loop.serveOne())
        ;
    ASSERT_EQ(ear.heard.size(), 63u);
    EXPECT_EQ(ear.heard.back(), R"({"accelerometer":true,"x":62.0,"y":0.0,"z":0.0})");
}

// --- Sources -------------------------------------------------------------------------------------

TEST_F(Events, AnUnpluggedAccelerometerTakesItsSourceAndWhatWaits) {
    begin();
    EXPECT_EQ(loop.sourceCount(), 1u);
    accelerometer->deliver(1, 2, 3, 4);
    accelerometer->unplug();
    EXPECT_EQ(loop.sourceCount(), 0u);
    accelerometer->deliver(1, 2, 3, 4);
    EXPECT_FALSE(loop.serveOne());
    EXPECT_EQ(system->counters().dropped, 1u) << "nobody was to hear the second";
    accelerometer->plug();
    EXPECT_EQ(loop.sourceCount(), 1u);
    accelerometer->deliver(1, 2, 3, 4);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(ear.heard.size(), 1u);
}

TEST_F(Events, ASourceStaysForAnotherAccelerometer) {
    const auto second = Accelerometer::create(system);
    begin();
    accelerometer->unplug();
    EXPECT_EQ(loop.sourceCount(), 1u);
    second->deliver(1, 2, 3, 4);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(ear.heard.size(), 1u);
}

TEST_F(Events, ASourceFollowsTheMatching) {
    begin();
    ear.match(PropertyValue::Dictionary{{"PrimaryUsage", 4u}});
    EXPECT_EQ(loop.sourceCount(), 0u);
    ear.match(kAccelerometers);
    EXPECT_EQ(loop.sourceCount(), 1u);
}

TEST_F(Events, AnUnscheduledClientLeavesTheLoop) {
    begin();
    EXPECT_EQ(loop.references, 2);
    accelerometer->deliver(1, 2, 3, 4);
    ear.unschedule(&loop);
    EXPECT_EQ(loop.references, 1);
    EXPECT_EQ(loop.sourceCount(), 0u);
    EXPECT_EQ(system->counters().dropped, 1u);
}

TEST_F(Events, AClientOfNobodyIsForgotten) {
    EXPECT_EQ(system->counters().clients, 1u);
    {
        Ear other(*system);
        EXPECT_EQ(system->counters().clients, 2u);
    }
    EXPECT_EQ(system->counters().clients, 1u);
}

TEST_F(Events, AClientThatIsLetGoOfHearsUntilItIsUnscheduled) {
    Ear other(*system);
    other.listen();
    other.schedule(&loop);
    ZorvaEventClient *const borrowed = other.client.get();
    other.client.reset();
    accelerometer->deliver(1, 2, 3, 4);
    other.onEvent = [&] { borrowed->table->unschedule(borrowed, &loop, "mode"); };
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(other.heard.size(), 1u);
    EXPECT_EQ(system->counters().clients, 1u);
    EXPECT_EQ(loop.references, 1);
}

// --- Waiting -------------------------------------------------------------------------------------

TEST_F(Events, NobodyWaitsForClientsWithoutASourceOrForItself) {
    accelerometer->deliver(1, 2, 3, 4);
    accelerometer->waitUntilHandled();
    ear.onEvent = [this] { accelerometer->waitUntilHandled(); };
    begin();
    accelerometer->deliver(1, 2, 3, 4);
    accelerometer->deliver(1, 2, 3, 4);
    EXPECT_TRUE(loop.serveOne());
    EXPECT_EQ(ear.heard.size(), 1u);
}

TEST(EventThreads, ASampleIsHeardOnceTheWaitIsOver) {
    const auto system = EventSystem::create();
    const auto accelerometer = Accelerometer::create(system);
    Ear ear(*system);
    LoopThread thread(
        [&](ZorvaRunLoop *loop) {
            ear.listen();
            ear.schedule(loop);
        },
        [&](ZorvaRunLoop *loop) { ear.unschedule(loop); });
    for (std::size_t count = 1; count <= 500; ++count) {
        accelerometer->deliver(1, 2, 3, count);
        accelerometer->waitUntilHandled();
        ASSERT_EQ(ear.heard.size(), count);
    }
    accelerometer->unplug();
    EXPECT_EQ(thread.join(), Host::RunOutcome::Finished);
}

} // namespace
} // namespace ZorvaTouch::Host
