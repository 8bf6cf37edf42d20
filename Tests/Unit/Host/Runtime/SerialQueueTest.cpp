#include "Host/Runtime/SerialQueue.h"

#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include <gtest/gtest.h>

#include <memory>
#include <pthread.h>
#include <stdexcept>
#include <string>
#include <thread>
#include <utility>

namespace ZorvaTouch::Host {
namespace {

using RuntimeTests::Callable;
using RuntimeTests::ScopedThread;

/// A queue whose log is in memory.
class SerialQueues : public ::testing::Test {
protected:
    SerialQueues() { setProcessPlatform(&platform); }
    ~SerialQueues() override { setProcessPlatform(nullptr); }

    static bool submit(ZorvaQueue *queue, Callable &run, Callable &discard) {
        using Both = std::pair<Callable *, Callable *>;
        const auto callFirst = [](void *context) {
            const std::unique_ptr<Both> both(static_cast<Both *>(context));
            Callable::call(both->first);
        };
        const auto callSecond = [](void *context) {
            const std::unique_ptr<Both> both(static_cast<Both *>(context));
            Callable::call(both->second);
        };
        auto both = std::make_unique<Both>(&run, &discard);
        if (!queue->table->submit(queue, callFirst, callSecond, both.get()))
            return false;
        both.release(); // NOLINT(bugprone-unused-return-value): the function's now
        return true;
    }

    RuntimeTests::LogText log;
    SystemPlatform platform{"error", log.file()};
    std::string calls;
    Callable run{[this] { calls.push_back('r'); }};
    Callable discard{[this] { calls.push_back('d'); }};
};

TEST_F(SerialQueues, RunInOrderOnTheirThread) {
    SerialQueue queue("a queue");
    std::thread::id thread;
    char name[16] = {};
    queue.submit([&] {
        thread = std::this_thread::get_id();
        ::pthread_getname_np(::pthread_self(), name, sizeof(name));
    });
    for (char c = 'a'; c <= 'e'; ++c)
        queue.submit([&, c] {
            calls.push_back(c);
            EXPECT_EQ(std::this_thread::get_id(), thread);
        });
    queue.drain();
    EXPECT_EQ(calls, "abcde");
    EXPECT_NE(thread, std::this_thread::get_id());
    EXPECT_STREQ(name, "a queue");
}

TEST_F(SerialQueues, TakeWorkFromTheirOwnFunctions) {
    SerialQueue queue("queue");
    const auto isDone = platform.createSemaphore();
    queue.submit([&] {
        queue.submit([&] {
            calls.push_back('2');
            isDone->signal();
        });
        calls.push_back('1');
    });
    isDone->wait();
    EXPECT_EQ(calls, "12");
}

TEST_F(SerialQueues, LiveOnWhenAFunctionThrows) {
    SerialQueue queue("queue");
    queue.submit([] { throw std::runtime_error("no luck"); });
    queue.submit([] { throw 1; });
    queue.submit([this] { calls.push_back('3'); });
    queue.drain();
    EXPECT_EQ(calls, "3");
    EXPECT_EQ(log.text(), "error subsystem=org.zorva.hid.ZorvaTouch category=SerialQueue "
                          "queue: a function has failed: no luck\n"
                          "error subsystem=org.zorva.hid.ZorvaTouch category=SerialQueue "
                          "queue: a function has failed\n");
}

TEST_F(SerialQueues, RunWhatTheBoundarySubmits) {
    SerialQueue queue("queue");
    EXPECT_TRUE(submit(queue.boundary(), run, discard));
    EXPECT_TRUE(submit(queue.boundary(), run, discard));
    queue.drain();
    EXPECT_EQ(calls, "rr");
}

TEST_F(SerialQueues, FinishTheRunningFunctionAndDiscardTheRestWhenTheyEnd) {
    const auto isRunning = platform.createSemaphore();
    const auto mayEnd = platform.createSemaphore();
    const auto witness = std::make_shared<int>(0);
    auto queue = std::make_unique<SerialQueue>("queue");
    const auto reference = Ref<ZorvaQueue>::retain(queue->boundary());
    Callable longFunction([&] {
        isRunning->signal();
        mayEnd->wait();
        calls.push_back('l');
    });
    Callable nothing([] {});
    Callable lastDiscard([&] { calls.push_back('D'); });
    EXPECT_TRUE(submit(queue->boundary(), longFunction, discard));
    EXPECT_TRUE(submit(queue->boundary(), run, discard));
    queue->submit([witness] {});
    EXPECT_TRUE(submit(queue->boundary(), run, lastDiscard));
    isRunning->wait();
    const ScopedThread other([&] {
        // The end has been asked for as soon as nothing is taken any more.
        while (submit(reference.get(), nothing, nothing))
            std::this_thread::yield();
        mayEnd->signal();
    });
    queue.reset();
    EXPECT_EQ(calls, "ldD");
    EXPECT_EQ(witness.use_count(), 1);
}

TEST_F(SerialQueues, RefuseWhatComesAfterTheirEnd) {
    auto queue = std::make_unique<SerialQueue>("queue");
    const auto reference = Ref<ZorvaQueue>::retain(queue->boundary());
    queue.reset();
    EXPECT_FALSE(submit(reference.get(), run, discard));
    EXPECT_EQ(calls, "");
}

TEST_F(SerialQueues, RefuseNoFunction) {
    SerialQueue queue("queue");
    EXPECT_EQ(queue.boundary()->table->submit(queue.boundary(), nullptr, &Callable::call, &discard), 0);
    queue.drain();
    EXPECT_EQ(calls, "");
}

TEST_F(SerialQueues, EndOnTheirOwnThreadToo) {
    const auto isDiscarded = platform.createSemaphore();
    Callable tell([&] { isDiscarded->signal(); });
    auto *const queue = new SerialQueue("queue");
    const auto isReady = platform.createSemaphore();
    queue->submit([&, queue] {
        isReady->wait();
        delete queue;
        calls.push_back('e');
    });
    EXPECT_TRUE(submit(queue->boundary(), run, tell));
    isReady->signal();
    isDiscarded->wait();
    EXPECT_EQ(calls, "e");
}

TEST_F(SerialQueues, AreNotDrainedByThemselves) {
    SerialQueue queue("queue");
    queue.submit([&] {
        queue.drain();
        calls.push_back('1');
    });
    queue.drain();
    EXPECT_EQ(calls, "1");
    EXPECT_EQ(log.text(), "error subsystem=org.zorva.hid.ZorvaTouch category=SerialQueue "
                          "queue: drain was called on the queue itself\n");
}

TEST_F(SerialQueues, SayWhenThePriorityIsNotToBeHad) {
    SerialQueue queue("queue", 1000);
    queue.submit([this] { calls.push_back('1'); });
    queue.drain();
    EXPECT_EQ(calls, "1");
    EXPECT_EQ(log.text(), "error subsystem=org.zorva.hid.ZorvaTouch category=SerialQueue "
                          "queue: no real-time priority: Invalid argument\n");
}

} // namespace
} // namespace ZorvaTouch::Host
