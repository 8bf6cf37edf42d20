#include "Bench/AllocationCounter.h"
#include "Host/Runtime/SystemPlatform.h"

#include <gtest/gtest.h>

#include <unistd.h>

// A pass of the run loop that serves a source allocates nothing, whatever the source. This program has its
// own `operator new`, which counts, also for the host's library.

namespace ZorvaTouch::Host {
namespace {

using Bench::AllocationCounter;

class RunLoopAllocations : public ::testing::Test {
protected:
    RunLoopAllocations() { EXPECT_EQ(::pipe(pipe), 0); }
    ~RunLoopAllocations() override {
        ::close(pipe[0]);
        ::close(pipe[1]);
    }

    /// Allocations of a thousand passes, `provoke` before each, once the first is done.
    template <typename Provoke> std::uint64_t ofAThousandPasses(const Provoke &provoke) {
        provoke();
        EXPECT_EQ(loop->runOneSource("mode"), RunOutcome::HandledSource);
        const AllocationCounter counter;
        for (int pass = 0; pass < 1000; ++pass) {
            provoke();
            if (loop->runOneSource("mode") != RunOutcome::HandledSource)
                return ~std::uint64_t{0};
        }
        return counter.count();
    }

    SystemPlatform platform{"error"};
    std::shared_ptr<RunLoop> loop = platform.createRunLoop();
    ZorvaRunLoop *boundary = loop->boundary();
    int pipe[2] = {-1, -1};
};

TEST_F(RunLoopAllocations, TheCounterSeesWhatTheLibraryAllocates) {
    const AllocationCounter counter;
    for (int closure = 0; closure < 100; ++closure)
        loop->perform("mode", [] {});
    EXPECT_GT(counter.count(), 0u);
}

TEST_F(RunLoopAllocations, APassThatServesADescriptorAllocatesNothing) {
    const auto readOne = [](void *context) {
        char byte = 0;
        EXPECT_EQ(::read(*static_cast<int *>(context), &byte, 1), 1);
    };
    EXPECT_NE(boundary->table->addDescriptor(boundary, "mode", pipe[0], readOne, &pipe[0]), 0u);
    EXPECT_EQ(ofAThousandPasses([this] { EXPECT_EQ(::write(pipe[1], "x", 1), 1); }), 0u);
}

TEST_F(RunLoopAllocations, ASignalAndThePassThatServesItAllocateNothing) {
    const auto source = boundary->table->addSource(
        boundary, "mode", [](void *) {}, nullptr);
    EXPECT_NE(boundary->table->addDescriptor(
                  boundary, "mode", pipe[0], [](void *) {}, nullptr),
              0u);
    EXPECT_EQ(ofAThousandPasses([&] { boundary->table->signalSource(boundary, source); }), 0u);
}

} // namespace
} // namespace ZorvaTouch::Host
