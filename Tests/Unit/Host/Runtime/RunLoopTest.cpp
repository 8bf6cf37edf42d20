#include "Host/Interface/RunLoop.h"

#include "Tests/Unit/Host/Runtime/RunLoopFixture.h"

#include <algorithm>
#include <list>
#include <stdexcept>

namespace ZorvaTouch::Host {
namespace {

class RunLoops : public RuntimeTests::RunLoopFixture {};

using RuntimeTests::ScopedThread;

// --- Ends of a pass --------------------------------------------------------------------------------

TEST_F(RunLoops, AModeWithoutSourcesIsFinished) {
    addSource('a', {}, "another mode");
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(pass(), RunOutcome::Finished);
}

TEST_F(RunLoops, AStopBeforeThePassEndsItOnce) {
    addSource('a');
    loop->stop();
    loop->stop();
    EXPECT_EQ(pass(), RunOutcome::Stopped);
    signal(1);
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
}

TEST_F(RunLoops, AStopWinsOverAnEmptyMode) {
    loop->stop();
    EXPECT_EQ(pass(), RunOutcome::Stopped);
    EXPECT_EQ(pass(), RunOutcome::Finished);
}

TEST_F(RunLoops, AStopWinsOverAReadySourceWhichStaysReady) {
    signal(addSource('a'));
    loop->stop();
    EXPECT_EQ(pass(), RunOutcome::Stopped);
    EXPECT_EQ(served, "");
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, AStopFromASourceWinsOverHavingServedIt) {
    signal(addSource('a', [this] { loop->stop(); }));
    EXPECT_EQ(pass(), RunOutcome::Stopped);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, AStopFromAClosureKeepsTheOtherClosuresForTheNextPass) {
    signal(addSource('a'));
    loop->perform("mode", [this] { loop->stop(); });
    loop->perform("mode", [this] { served.push_back('2'); });
    EXPECT_EQ(pass(), RunOutcome::Stopped);
    EXPECT_EQ(served, "");
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "2a");
}

TEST_F(RunLoops, AStopFromAnotherThreadEndsAPassThatWaits) {
    addSource('a');
    const auto isInPass = platform.createSemaphore();
    loop->perform("mode", [&] { isInPass->signal(); });
    const ScopedThread other([&] {
        isInPass->wait();
        loop->stop();
    });
    EXPECT_EQ(pass(), RunOutcome::Stopped);
}

// --- Signalled sources -----------------------------------------------------------------------------

TEST_F(RunLoops, SeveralSignalsAreServedAtLeastOnceAndThenNoMore) {
    const auto a = addSource('a');
    const auto b = addSource('b');
    signal(a);
    signal(a);
    signal(a);
    signal(b);
    passes(2);
    signal(b);
    passes(1);
    EXPECT_EQ(served, "abb");
}

TEST_F(RunLoops, ASignalWithinItsOwnServiceIsServedAgain) {
    std::uint64_t a = 0;
    a = addSource('a', [&] {
        if (served.size() == 1)
            signal(a);
    });
    signal(a);
    passes(2);
    EXPECT_EQ(served, "aa");
}

TEST_F(RunLoops, ASignalFromAnotherThreadWakesTheLoop) {
    const auto a = addSource('a');
    const auto isInPass = platform.createSemaphore();
    loop->perform("mode", [&] { isInPass->signal(); });
    const ScopedThread other([&] {
        isInPass->wait();
        signal(a);
    });
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, UnknownNumbersAreIgnored) {
    const auto a = addSource('a');
    signal(0);
    signal(a + 1);
    remove(0);
    remove(a + 1);
    signal(a);
    passes(1);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, WhoHasWaitedLongestIsServedFirst) {
    const auto a = addSource('a');
    const auto b = addSource('b');
    const auto c = addSource('c');
    signal(b);
    signal(c);
    signal(a);
    signal(b);
    passes(3);
    EXPECT_EQ(served, "bca");
}

TEST_F(RunLoops, ASourceOfAnotherModeStaysReady) {
    const auto a = addSource('a', {}, "other");
    const auto b = addSource('b');
    signal(a);
    signal(b);
    EXPECT_EQ(pass("mode"), RunOutcome::HandledSource);
    EXPECT_EQ(served, "b");
    EXPECT_EQ(pass("other"), RunOutcome::HandledSource);
    EXPECT_EQ(served, "ba");
}

// --- Removing and adding ---------------------------------------------------------------------------

TEST_F(RunLoops, ASourceThatRemovesItselfIsTheLastToBeServed) {
    std::uint64_t a = 0;
    a = addSource('a', [&] {
        signal(a);
        remove(a);
    });
    signal(a);
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, AReadySourceThatAnotherRemovesIsNotServed) {
    std::uint64_t b = 0;
    const auto a = addSource('a', [&] { remove(b); });
    b = addSource('b');
    signal(a);
    signal(b);
    passes(1);
    signal(a);
    passes(1);
    EXPECT_EQ(served, "aa");
}

TEST_F(RunLoops, RemovingTheLastSourceOnAnotherThreadFinishesAPassThatWaits) {
    const auto a = addSource('a');
    const auto isInPass = platform.createSemaphore();
    loop->perform("mode", [&] { isInPass->signal(); });
    const ScopedThread other([&] {
        isInPass->wait();
        remove(a);
    });
    EXPECT_EQ(pass(), RunOutcome::Finished);
}

/// The completion of a removal on another thread: it may free the source's context.
TEST_F(RunLoops, AFunctionHandedOverAfterARemovalComesAfterTheLastCallOfTheSource) {
    const auto isInCall = platform.createSemaphore();
    const auto isRemoved = platform.createSemaphore();
    const auto a = addSource('a', [&] {
        isInCall->signal();
        isRemoved->wait();
        served.push_back('.'); // the context is still needed
    });
    RuntimeTests::Callable freeing([this] { served.push_back('f'); });
    signal(a);
    const ScopedThread other([&] {
        isInCall->wait();
        remove(a);
        EXPECT_EQ(boundary->table->perform(boundary, "mode", &RuntimeTests::Callable::call,
                                           &RuntimeTests::Callable::call, &freeing),
                  1);
        isRemoved->signal();
    });
    passes(1);
    EXPECT_EQ(served, "a.");
    signal(addSource('b'));
    passes(1);
    EXPECT_EQ(served, "a.fb");
}

TEST_F(RunLoops, ASourceAddedByAClosureBelongsToThePass) {
    loop->perform("mode", [this] { signal(addSource('a')); });
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, ASourceWithoutModeOrFunctionIsRefusedWithALine) {
    EXPECT_EQ(boundary->table->addSource(
                  boundary, nullptr, [](void *) {}, nullptr),
              0u);
    EXPECT_EQ(boundary->table->addSource(boundary, "mode", nullptr, nullptr), 0u);
    EXPECT_EQ(log.text(), "error subsystem=org.zorva.hid.ZorvaTouch category=RunLoop "
                          "refused: no mode or no function\n"
                          "error subsystem=org.zorva.hid.ZorvaTouch category=RunLoop "
                          "refused: no mode or no function\n");
}

// --- Closures --------------------------------------------------------------------------------------

TEST_F(RunLoops, ClosuresRunInOrderBeforeTheSourceAndAreNoSource) {
    signal(addSource('a'));
    loop->perform("mode", [this] { served.push_back('1'); });
    loop->perform("other", [this] { served.push_back('x'); });
    loop->perform("mode", [this] { served.push_back('2'); });
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "12a");
    EXPECT_EQ(pass("other"), RunOutcome::Finished);
    EXPECT_EQ(served, "12ax");
}

TEST_F(RunLoops, AClosureFromAnotherThreadWakesTheLoop) {
    addSource('a');
    const auto isInPass = platform.createSemaphore();
    loop->perform("mode", [&] { isInPass->signal(); });
    const ScopedThread other([&] {
        isInPass->wait();
        loop->perform("mode", [this] { loop->stop(); });
    });
    EXPECT_EQ(pass(), RunOutcome::Stopped);
}

TEST_F(RunLoops, ClosuresThatMakeClosuresLeaveRoomForSources) {
    std::function<void()> again = [&] { loop->perform("mode", again); };
    again();
    const RuntimeTests::Pipe pipe;
    pipe.write("x");
    addDescriptor('a', pipe.readEnd());
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "a");
}

TEST_F(RunLoops, WhatAClosureThrowsComesOutAndTheLoopGoesOn) {
    signal(addSource('a'));
    loop->perform("mode", [] { throw std::runtime_error("a closure has failed"); });
    loop->perform("mode", [this] { served.push_back('2'); });
    EXPECT_THROW((void)pass(), std::runtime_error);
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "2a");
}

TEST_F(RunLoops, APassWithinAClosureServesAndStopsForItself) {
    signal(addSource('a'));
    signal(addSource('b'));
    loop->perform("mode", [this] {
        EXPECT_EQ(pass(), RunOutcome::HandledSource);
        loop->stop();
        EXPECT_EQ(pass(), RunOutcome::Stopped);
        served.push_back('1');
    });
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "a1b");
}

TEST_F(RunLoops, AFunctionOfTheBoundaryIsRunOrDiscardedNeverBoth) {
    std::string calls;
    RuntimeTests::Callable note([&] { calls.push_back('.'); });
    const auto run = [](void *context) {
        RuntimeTests::Callable::call(context);
        RuntimeTests::Callable::call(context);
    };
    EXPECT_EQ(boundary->table->perform(boundary, "mode", run, &RuntimeTests::Callable::call, &note), 1);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(calls, "..") << "run";
    EXPECT_EQ(boundary->table->perform(boundary, "mode", run, &RuntimeTests::Callable::call, &note), 1);
    loop.reset();
    EXPECT_EQ(calls, "...") << "discarded";
}

TEST_F(RunLoops, ARefusedFunctionIsNeitherRunNorDiscarded) {
    std::string calls;
    RuntimeTests::Callable note([&] { calls.push_back('.'); });
    const ZorvaFunction call = &RuntimeTests::Callable::call;
    EXPECT_EQ(boundary->table->perform(boundary, "mode", nullptr, call, &note), 0);
    EXPECT_EQ(boundary->table->perform(boundary, nullptr, call, call, &note), 0);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    loop.reset();
    EXPECT_EQ(calls, "");
}

// --- The loop's own life ---------------------------------------------------------------------------

TEST_F(RunLoops, ClosuresLeftOverAreDestroyedUnrun) {
    const auto witness = std::make_shared<int>(0);
    bool hasRun = false;
    loop->perform("mode", [&hasRun, witness] { hasRun = true; });
    EXPECT_EQ(witness.use_count(), 2);
    loop.reset();
    EXPECT_EQ(witness.use_count(), 1);
    EXPECT_FALSE(hasRun);
}

TEST_F(RunLoops, WhoRetainsTheBoundaryKeepsTheLoop) {
    const auto witness = std::make_shared<int>(0);
    loop->perform("mode", [witness] {});
    boundary->table->retain(boundary);
    loop.reset();
    EXPECT_EQ(witness.use_count(), 2);
    signal(addSource('a'));
    boundary->table->release(boundary);
    EXPECT_EQ(witness.use_count(), 1);
    EXPECT_EQ(served, "") << "sources left over are not served";
}

TEST_F(RunLoops, AnyThreadMayDoAnything) {
    constexpr int kRounds = 300;
    const auto endless = addSource('.');
    const RuntimeTests::Pipe pipe;
    pipe.write("x");
    {
        std::list<ScopedThread> threads;
        for (int thread = 0; thread < 2; ++thread)
            threads.emplace_back([&] {
                for (int round = 0; round < kRounds; ++round) {
                    const auto source = boundary->table->addDescriptor(
                        boundary, "mode", pipe.readEnd(), [](void *) {}, nullptr);
                    signal(endless);
                    loop->perform("mode", [] {});
                    remove(source);
                }
                loop->perform("mode", [this] { served.push_back('|'); });
            });
        while (std::count(served.begin(), served.end(), '|') != 2) {
            signal(endless);
            ASSERT_EQ(pass(), RunOutcome::HandledSource);
        }
    }
    remove(endless);
    EXPECT_EQ(pass(), RunOutcome::Finished);
}

} // namespace
} // namespace ZorvaTouch::Host
