#include "Plugin/EventObject.h"
#include "Plugin/ValueObject.h"
#include "Plugin/ZorvaHIDService.h"
#include "Tests/Support/HostObjects.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

namespace ZorvaTouch {
namespace {

using Testing::ManualQueue;
using Testing::ProbeService;
using Calls = std::vector<std::string>;

/// A service that writes down each operation with its arguments, then does what the test says, then succeeds.
class WritingService final : public ZorvaHIDService {
public:
    Calls calls;
    Calls failures; ///< "operation: reason"
    std::function<void()> thenDo = [] {};
    const void *lastPointer = nullptr; ///< the last pointer argument

    ZorvaStatus probeWithService(ZorvaService *service, const ZorvaValue *properties,
                                 std::int32_t *outScore) override {
        lastPointer = service;
        note("probe " + textOf(properties) + (outScore ? " score" : ""));
        return ZORVA_STATUS_SUCCESS;
    }
    ZorvaStatus startWithService(ZorvaService *service, const ZorvaValue *properties) override {
        lastPointer = service;
        note("start " + textOf(properties));
        return ZORVA_STATUS_SUCCESS;
    }
    ZorvaStatus stop() override {
        note("stop");
        return ZORVA_STATUS_SUCCESS;
    }
    bool openWithOptions(std::uint32_t options) override {
        note("open " + std::to_string(options));
        return true;
    }
    void closeWithOptions(std::uint32_t options) override { note("close " + std::to_string(options)); }
    PropertyValue getPropertyForKey(const char *key) override {
        note(std::string("get ") + (key ? key : "null"));
        return answer;
    }
    bool setPropertyForKey(const PropertyValue &value, const char *key) override {
        note("set " + (value.asString() ? *value.asString() : "null") + " for " + (key ? key : "null"));
        return true;
    }
    void setEventCallback(ZorvaEventCallback callback, void *target, void *refcon) override {
        note(std::string("callback ") + (callback ? "some" : "null") + (target == this ? " target" : "") +
             (refcon == &calls ? " refcon" : ""));
    }
    void scheduleWithDispatchQueue(ZorvaQueue *queue) override {
        lastPointer = queue;
        note("schedule");
    }
    void unscheduleWithDispatchQueue(ZorvaQueue *queue) override {
        lastPointer = queue;
        note("unschedule");
    }
    Ref<const ZorvaEvent> copyEventWithType(std::uint32_t type, const ZorvaEvent *matching,
                                            std::uint32_t options) override {
        lastPointer = matching;
        note("copyEvent " + std::to_string(type) + " " + std::to_string(options));
        return makeEvent(HostEvent::createAccelerometer(1, {}, 0));
    }
    ZorvaStatus setOutputEvent(const ZorvaEvent *event) override {
        lastPointer = event;
        note("output");
        return ZORVA_STATUS_SUCCESS;
    }
    void reportFailure(const char *operation, const char *reason) noexcept override {
        failures.push_back(std::string(operation) + ": " + reason);
    }

    PropertyValue answer = "answer";

private:
    static std::string textOf(const ZorvaValue *value) {
        const PropertyValue read = readValue(value);
        return read.asString() ? *read.asString() : "null";
    }
    void note(const std::string &call) {
        calls.push_back(call);
        thenDo();
    }
};

void noCallback(void *, void *, void *, const ZorvaEvent *, std::uint32_t) {}

class Trampolines : public ::testing::Test {
protected:
    ~Trampolines() override { EXPECT_EQ((*plugIn)->Release(plugIn), 0u); }

    Calls takeFailures() { return std::exchange(service.failures, {}); }

    WritingService &service = *new WritingService;
    PlugInInterfaceTable **const plugIn = service.getPluginInterface();
    HidServiceInterfaceTable **const hid = service.getServiceInterface();
    const Ref<ManualQueue> queue = ManualQueue::create();
    const Ref<ProbeService> offered = ProbeService::create(nullptr);
    const Ref<const ZorvaValue> text = makeValue("text");
    const Ref<const ZorvaEvent> event = makeEvent(HostEvent::createAccelerometer(0, {}, 0));
};

// --- Arguments and results -------------------------------------------------------------------------

TEST_F(Trampolines, OfThePlugInPassTheServiceBeforeItsProperties) {
    std::int32_t score = 0;
    EXPECT_EQ((*plugIn)->Probe(plugIn, text.get(), offered.get(), &score), 0u);
    EXPECT_EQ(service.lastPointer, offered.get());
    EXPECT_EQ((*plugIn)->Start(plugIn, text.get(), offered.get()), 0u);
    EXPECT_EQ(service.lastPointer, offered.get());
    EXPECT_EQ((*plugIn)->Stop(plugIn), 0u);
    EXPECT_EQ(service.calls, (Calls{"probe text score", "start text", "stop"}));
}

TEST_F(Trampolines, OfTheServicePassTheirArgumentsOn) {
    EXPECT_EQ((*hid)->open(hid, 0xFFFFFFFF), 1);
    (*hid)->close(hid, 3);
    EXPECT_EQ((*hid)->setProperty(hid, "key", text.get()), 1);
    (*hid)->setEventCallback(hid, noCallback, &service, &service.calls);
    EXPECT_EQ((*hid)->setOutputEvent(hid, event.get()), 0u);
    EXPECT_EQ(service.lastPointer, event.get());
    EXPECT_EQ(service.calls, (Calls{"open 4294967295", "close 3", "set text for key",
                                    "callback some target refcon", "output"}));
}

TEST_F(Trampolines, HandOverAPropertyWithAReference) {
    const auto copied = Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, "key"));
    EXPECT_EQ(readValue(copied.get()), PropertyValue("answer"));
    service.answer = {};
    EXPECT_EQ((*hid)->copyProperty(hid, nullptr), nullptr);
    EXPECT_EQ(service.calls, (Calls{"get key", "get null"}));
}

TEST_F(Trampolines, HandOverAnEventWithAReference) {
    const auto copied = Ref<const ZorvaEvent>::adopt((*hid)->copyEvent(hid, 11, event.get(), 6));
    EXPECT_EQ(copied->table->timestamp(copied.get()), 1u);
    EXPECT_EQ(service.lastPointer, event.get());
    EXPECT_EQ(service.calls, (Calls{"copyEvent 11 6"}));
}

TEST_F(Trampolines, HoldTheQueueForTheTimeOfTheCall) {
    std::uint32_t during = 0;
    service.thenDo = [&] { during = queue->references(); };
    (*hid)->scheduleWithDispatchQueue(hid, queue.get());
    EXPECT_EQ(service.lastPointer, queue.get());
    EXPECT_EQ(during, 2u);
    EXPECT_EQ(queue->references(), 1u);
    during = 0;
    (*hid)->unscheduleFromDispatchQueue(hid, queue.get());
    EXPECT_EQ(during, 2u);
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(Trampolines, TakeAQueueThatIsNotWholeForNone) {
    ZorvaQueueTable table = *queue->table;
    table.submit = nullptr;
    ZorvaQueue broken{&table};
    (*hid)->scheduleWithDispatchQueue(hid, &broken);
    EXPECT_EQ(service.lastPointer, nullptr);
    service.lastPointer = &service;
    broken.table = nullptr;
    (*hid)->unscheduleFromDispatchQueue(hid, &broken);
    EXPECT_EQ(service.lastPointer, nullptr);
    EXPECT_EQ(service.calls, (Calls{"schedule", "unschedule"}));
}

TEST_F(Trampolines, HoldTheServiceForTheTimeOfTheCall) {
    (*hid)->AddRef(hid);
    std::uint32_t left = 0;
    service.thenDo = [&] {
        left = (*hid)->Release(hid); // the host's second reference, given back in the midst of a call
    };
    EXPECT_EQ((*hid)->open(hid, 0), 1);
    EXPECT_EQ(left, 2u);
}

// --- Exceptions end at the boundary ------------------------------------------------------------------

/// Every operation through its table, each with the result that a failure has.
class FailingTrampolines : public Trampolines {
protected:
    void expectEveryOperationToFail() {
        std::int32_t score = 5;
        EXPECT_EQ((*plugIn)->Probe(plugIn, nullptr, nullptr, &score), 0xE00002BEu);
        EXPECT_EQ(score, 5);
        EXPECT_EQ((*plugIn)->Start(plugIn, nullptr, nullptr), 0xE00002BEu);
        EXPECT_EQ((*plugIn)->Stop(plugIn), 0xE00002BEu);
        EXPECT_EQ((*hid)->open(hid, 0), 0);
        (*hid)->close(hid, 0);
        EXPECT_EQ((*hid)->copyProperty(hid, "key"), nullptr);
        EXPECT_EQ((*hid)->setProperty(hid, "key", nullptr), 0);
        (*hid)->setEventCallback(hid, nullptr, nullptr, nullptr);
        (*hid)->scheduleWithDispatchQueue(hid, queue.get());
        (*hid)->unscheduleFromDispatchQueue(hid, queue.get());
        EXPECT_EQ((*hid)->copyEvent(hid, 0, nullptr, 0), nullptr);
        EXPECT_EQ((*hid)->setOutputEvent(hid, nullptr), 0xE00002BEu);
        EXPECT_EQ(queue->references(), 1u);
    }
};

TEST_F(FailingTrampolines, ReportAnExceptionOnceWithItsText) {
    service.thenDo = [] { throw std::runtime_error("no luck"); };
    expectEveryOperationToFail();
    EXPECT_EQ(takeFailures(),
              (Calls{"Probe: no luck", "Start: no luck", "Stop: no luck", "open: no luck", "close: no luck",
                     "copyProperty: no luck", "setProperty: no luck", "setEventCallback: no luck",
                     "scheduleWithDispatchQueue: no luck", "unscheduleFromDispatchQueue: no luck",
                     "copyEvent: no luck", "setOutputEvent: no luck"}));
}

TEST_F(FailingTrampolines, ReportWhatIsNoException) {
    service.thenDo = [] { throw 7; };
    expectEveryOperationToFail();
    const Calls failures = takeFailures();
    ASSERT_EQ(failures.size(), 12u);
    for (const std::string &failure : failures)
        EXPECT_TRUE(failure.ends_with(": unknown exception")) << failure;
}

TEST_F(FailingTrampolines, LeaveTheServiceInUse) {
    service.thenDo = [] { throw std::bad_alloc(); };
    EXPECT_EQ((*hid)->open(hid, 0), 0);
    service.thenDo = [] {};
    EXPECT_EQ((*hid)->open(hid, 0), 1);
    EXPECT_EQ((*hid)->AddRef(hid), 2u);
    EXPECT_EQ((*hid)->Release(hid), 1u);
}

/// A text whose length is absurd.
struct AbsurdText : ZorvaValue {
    AbsurdText() : ZorvaValue{&absurdTable}, absurdTable(*makeValue("").get()->table) {
        absurdTable.kind = [](const ZorvaValue *) { return std::uint32_t{kZorvaValueString}; };
        absurdTable.stringValue = [](const ZorvaValue *, std::size_t *length) {
            *length = SIZE_MAX;
            return "short";
        };
    }
    ZorvaValueTable absurdTable;
};

TEST_F(FailingTrampolines, RefuseAValueBeyondTheLimitsInEitherDirection) {
    const Testing::EndlessValue endless;
    EXPECT_EQ((*hid)->setProperty(hid, "key", &endless), 0);
    EXPECT_TRUE(service.calls.empty());
    PropertyValue deep;
    for (int level = 0; level < 64; ++level)
        deep = PropertyValue::Array{deep};
    service.answer = *deep.asArray()->begin(); // 64 levels
    EXPECT_TRUE(Ref<const ZorvaValue>::adopt((*hid)->copyProperty(hid, "key")));
    service.answer = deep;
    EXPECT_EQ((*hid)->copyProperty(hid, "key"), nullptr);
    EXPECT_EQ(takeFailures(), (Calls{"setProperty: a value has more than 64 levels",
                                     "copyProperty: a value has more than 64 levels"}));
}

TEST_F(FailingTrampolines, ReportAValueThatCannotBeRead) {
    const AbsurdText absurd;
    EXPECT_EQ((*hid)->setProperty(hid, "key", &absurd), 0);
    EXPECT_TRUE(service.calls.empty());
    EXPECT_EQ(takeFailures(), (Calls{"setProperty: a value has an impossible length"}));
}

} // namespace
} // namespace ZorvaTouch
