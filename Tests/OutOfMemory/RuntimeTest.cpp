#include "Host/Runtime/SerialQueue.h"
#include "Tests/OutOfMemory/FrugalHost.h"
#include "Tests/OutOfMemory/Refusal.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <unistd.h>

namespace ZorvaTouch::Host {
namespace {

using ZorvaTouch::Testing::forEachRefusal;
using ZorvaTouch::Testing::Refusal;

class RuntimeOutOfMemory : public ::testing::Test {
protected:
    RuntimeOutOfMemory() { EXPECT_EQ(::pipe(pipe), 0); }
    ~RuntimeOutOfMemory() override {
        ::close(pipe[0]);
        ::close(pipe[1]);
    }

    static void count(void *context) { ++*static_cast<int *>(context); }

    ZorvaTouch::Testing::FrugalPlatform platform;
    int pipe[2] = {-1, -1};
};

TEST_F(RuntimeOutOfMemory, ARunLoopIsMadeOrNot) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  std::shared_ptr<RunLoop> loop;
                  const bool isDone = refusal.allows([&] { loop = platform.createRunLoop(); });
                  EXPECT_EQ(loop != nullptr, isDone);
              }),
              0u);
}

TEST_F(RuntimeOutOfMemory, ASourceIsAddedOrNot) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const auto loop = platform.createRunLoop();
                  ZorvaRunLoop *const boundary = loop->boundary();
                  int served = 0;
                  const auto source = refusal.during(
                      [&] { return boundary->table->addSource(boundary, "mode", count, &served); });
                  boundary->table->signalSource(boundary, source);
                  EXPECT_EQ(loop->runOneSource("mode"),
                            source != 0 ? RunOutcome::HandledSource : RunOutcome::Finished);
                  EXPECT_EQ(served, source != 0 ? 1 : 0);
              }),
              0u);
}

TEST_F(RuntimeOutOfMemory, ADescriptorIsWatchedOrNot) {
    ASSERT_EQ(::write(pipe[1], "x", 1), 1); // readable from the start
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const auto loop = platform.createRunLoop();
                  ZorvaRunLoop *const boundary = loop->boundary();
                  int served = 0;
                  const auto source = refusal.during([&] {
                      return boundary->table->addDescriptor(boundary, "mode", pipe[0], count, &served);
                  });
                  EXPECT_EQ(loop->runOneSource("mode"),
                            source != 0 ? RunOutcome::HandledSource : RunOutcome::Finished);
                  EXPECT_EQ(served, source != 0 ? 1 : 0);
              }),
              0u);
}

TEST_F(RuntimeOutOfMemory, AFunctionIsRunOrRefused) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  const auto loop = platform.createRunLoop();
                  ZorvaRunLoop *const boundary = loop->boundary();
                  int run = 0, discarded = 0;
                  static int *theDiscarded = nullptr;
                  theDiscarded = &discarded;
                  const bool isTaken = refusal.during([&] {
                      return boundary->table->perform(
                          boundary, "mode", count, [](void *) { ++*theDiscarded; }, &run);
                  });
                  EXPECT_EQ(loop->runOneSource("mode"), RunOutcome::Finished);
                  EXPECT_EQ(run, isTaken ? 1 : 0);
                  EXPECT_EQ(discarded, 0) << "a function that was refused stays the caller's";
              }),
              0u);
}

TEST_F(RuntimeOutOfMemory, APassNeedsNoMemory) {
    const auto loop = platform.createRunLoop();
    ZorvaRunLoop *const boundary = loop->boundary();
    int served = 0;
    ASSERT_EQ(::write(pipe[1], "x", 1), 1);
    ASSERT_NE(boundary->table->addDescriptor(boundary, "mode", pipe[0], count, &served), 0u);
    forEachRefusal([&](Refusal &refusal) {
        EXPECT_EQ(refusal.during([&] { return loop->runOneSource("mode"); }), RunOutcome::HandledSource);
    });
    EXPECT_GT(served, 0);
}

TEST_F(RuntimeOutOfMemory, AQueueIsMadeOrNot) {
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  std::unique_ptr<SerialQueue> queue;
                  const bool isDone =
                      refusal.allows([&] { queue = std::make_unique<SerialQueue>("test-queue"); });
                  EXPECT_EQ(queue != nullptr, isDone);
              }),
              0u);
}

TEST_F(RuntimeOutOfMemory, AQueueTakesAFunctionOrRefusesIt) {
    SerialQueue queue("test-queue");
    ZorvaQueue *const boundary = queue.boundary();
    EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                  int run = 0;
                  const bool isTaken =
                      refusal.during([&] { return boundary->table->submit(boundary, count, count, &run); });
                  queue.drain();
                  EXPECT_EQ(run, isTaken ? 1 : 0);
              }),
              0u);
}

TEST_F(RuntimeOutOfMemory, AQueueSurvivesAFunctionThatFailsWithoutMemoryForTheLogRecord) {
    setProcessPlatform(&platform); // the queue's log
    {
        SerialQueue queue("a name that is longer than a short string");
        EXPECT_GT(forEachRefusal([&](Refusal &refusal) {
                      const auto failAndWait = [&] {
                          queue.submit([] {
                              throw std::runtime_error("a reason that is longer than a short string");
                          });
                          queue.drain();
                      };
                      (void)refusal.allows(failAndWait, Refusal::Threads::All);
                  }),
                  0u);
    }
    setProcessPlatform(nullptr);
}

} // namespace
} // namespace ZorvaTouch::Host
