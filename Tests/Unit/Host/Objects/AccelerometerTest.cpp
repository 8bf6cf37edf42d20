#include "Host/Objects/Accelerometer.h"

#include "Plugin/ValueObject.h"
#include "Tests/Unit/Host/Simulated/ManualLoop.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <optional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace ZorvaTouch::Host {
namespace {

using Simulated::ManualLoop;
using testing::ElementsAre;
using testing::IsEmpty;

/// Writes down what it hears.
class Observer final : public AccelerometerObserver {
public:
    void onReportInterval(double microseconds) noexcept override {
        heard.push_back(std::to_string(microseconds));
    }
    void onListening(bool isListenedTo) noexcept override {
        heard.emplace_back(isListenedTo ? "on" : "off");
        if (const auto action = std::exchange(onNext, nullptr))
            action();
    }
    std::vector<std::string> take() { return std::exchange(heard, {}); }

    std::vector<std::string> heard;
    std::function<void()> onNext; ///< once
};

/// A client that looks for accelerometers.
class Client {
public:
    explicit Client(EventSystem &system) : client(system.createClient()) { match(3); }

    void match(unsigned usage) {
        const auto matching = makeValue(PropertyValue::Dictionary{{"PrimaryUsage", usage}});
        client->table->setMatching(client.get(), matching.get());
    }
    void schedule(ZorvaRunLoop *loop) { client->table->schedule(client.get(), loop, "mode"); }
    void unschedule(ZorvaRunLoop *loop) { client->table->unschedule(client.get(), loop, "mode"); }
    std::size_t matchCount() { return client->table->copyServices(client.get(), nullptr, 0); }

    Ref<ZorvaEventClient> client;
};

class Observed : public testing::Test {
protected:
    bool set(const char *key, const PropertyValue &value) {
        return accelerometer->table->setProperty(accelerometer.get(), key, makeValue(value).get()) != 0;
    }
    ~Observed() override {
        for (Client *const each : {&client, &second})
            each->unschedule(&loop);
    }

    ManualLoop loop;
    const std::shared_ptr<EventSystem> system = EventSystem::create();
    std::shared_ptr<Observer> observer = std::make_shared<Observer>();
    Ref<Accelerometer> accelerometer = Accelerometer::create(system, observer);
    Client client{*system}, second{*system};
};

TEST_F(Observed, AReportIntervalIsToldEachTimeItIsTaken) {
    EXPECT_TRUE(set("ReportInterval", 10000.0));
    EXPECT_TRUE(set("ReportInterval", 10000.0));
    EXPECT_FALSE(set("ReportInterval", 10000u));
    EXPECT_FALSE(set("ReportIntervals", 1.0));
    accelerometer->properties().makeReadOnly("ReportInterval");
    EXPECT_FALSE(set("ReportInterval", 20000.0));
    EXPECT_THAT(observer->take(), ElementsAre("10000.000000", "10000.000000"));
}

TEST_F(Observed, TheFirstAndTheLastWhoListenAreTold) {
    EXPECT_THAT(observer->take(), IsEmpty()) << "to be there is not to listen";
    client.schedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
    second.schedule(&loop);
    client.unschedule(&loop);
    EXPECT_THAT(observer->take(), IsEmpty());
    second.unschedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("off"));
    second.unschedule(&loop);
    EXPECT_THAT(observer->take(), IsEmpty());
}

TEST_F(Observed, OnlyThoseWhoMatchListen) {
    client.match(4);
    client.schedule(&loop);
    EXPECT_THAT(observer->take(), IsEmpty());
    client.match(3);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
    client.match(4);
    EXPECT_THAT(observer->take(), ElementsAre("off"));
}

TEST_F(Observed, AnotherPlaceIsNoEnd) {
    ManualLoop other;
    client.schedule(&loop);
    client.schedule(&other);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
    client.unschedule(&loop);
    EXPECT_THAT(observer->take(), IsEmpty());
    client.unschedule(&other);
    EXPECT_THAT(observer->take(), ElementsAre("off"));
}

TEST_F(Observed, NobodyListensToOneThatIsUnplugged) {
    client.schedule(&loop);
    accelerometer->unplug();
    accelerometer->plug();
    EXPECT_THAT(observer->take(), ElementsAre("on", "off", "on"));
}

TEST_F(Observed, OneThatComesIsListenedToAtOnceByThoseWhoAreThere) {
    client.schedule(&loop);
    const auto late = std::make_shared<Observer>();
    const auto other = Accelerometer::create(system, late);
    EXPECT_THAT(late->take(), ElementsAre("on"));
    other->withdraw();
}

TEST_F(Observed, EachHasItsOwnListeners) {
    const auto late = std::make_shared<Observer>();
    const auto other = Accelerometer::create(system, late);
    other->properties().set("PrimaryUsage", 4u);
    client.schedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
    EXPECT_THAT(late->take(), IsEmpty());
}

TEST_F(Observed, WhatChangesWhileItIsToldIsToldAfterwards) {
    observer->onNext = [this] {
        client.unschedule(&loop);
        observer->heard.emplace_back("told");
    };
    client.schedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("on", "told", "off"));
}

TEST_F(Observed, WhatDidNotLastIsLeftOut) {
    observer->onNext = [this] {
        client.unschedule(&loop);
        client.schedule(&loop);
    };
    client.schedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
}

TEST_F(Observed, AnObserverThatIsGoneHearsNothing) {
    observer.reset();
    EXPECT_TRUE(set("ReportInterval", 10000.0));
    client.schedule(&loop);
    EXPECT_EQ(loop.sourceCount(), 1u);
}

// --- Withdrawn ---------------------------------------------------------------------------------------------

TEST_F(Observed, OneThatIsWithdrawnIsNeverFoundAgain) {
    client.schedule(&loop);
    EXPECT_EQ(loop.sourceCount(), 1u);
    accelerometer->deliver(1, 2, 3, 4);
    accelerometer->withdraw();
    EXPECT_EQ(loop.sourceCount(), 0u);
    EXPECT_EQ(client.matchCount(), 0u);
    EXPECT_EQ(system->counters().dropped, 1u);
    accelerometer->plug();
    accelerometer->withdraw();
    accelerometer->deliver(1, 2, 3, 4);
    EXPECT_EQ(client.matchCount(), 0u);
    EXPECT_EQ(loop.sourceCount(), 0u);
}

TEST_F(Observed, OneThatIsWithdrawnHearsNoMoreOfWhoListens) {
    client.schedule(&loop);
    accelerometer->withdraw();
    client.unschedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
}

TEST_F(Observed, OneMayBeWithdrawnWhileItIsTold) {
    observer->onNext = [this] { accelerometer->withdraw(); };
    client.schedule(&loop);
    EXPECT_THAT(observer->take(), ElementsAre("on"));
    EXPECT_EQ(client.matchCount(), 0u);
}

// --- Threads -----------------------------------------------------------------------------------------------

/// Counts what it hears, and holds that it comes in order.
class OrderObserver final : public AccelerometerObserver {
public:
    void onReportInterval(double) noexcept override {}
    void onListening(bool isListenedTo) noexcept override {
        if (isOn.exchange(isListenedTo) == isListenedTo)
            wasInOrder = false;
    }
    std::atomic<bool> isOn = false, wasInOrder = true;
};

TEST(ObservedThreads, TheLastWordIsHowItIs) {
    const auto system = EventSystem::create();
    const auto observer = std::make_shared<OrderObserver>();
    const auto accelerometer = Accelerometer::create(system, observer);
    const auto comeAndGo = [&] {
        ManualLoop loop;
        Client client(*system);
        for (int i = 0; i < 500; ++i) {
            client.schedule(&loop);
            client.unschedule(&loop);
        }
    };
    std::thread other(comeAndGo);
    comeAndGo();
    other.join();
    EXPECT_FALSE(observer->isOn);
    EXPECT_TRUE(observer->wasInOrder);
}

} // namespace
} // namespace ZorvaTouch::Host
