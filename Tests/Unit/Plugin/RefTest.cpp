#include "Plugin/Ref.h"

#include "Tests/Support/HostObjects.h"

#include <gtest/gtest.h>

#include <utility>

namespace ZorvaTouch {
namespace {

using Testing::ManualQueue;

class RefToQueue : public ::testing::Test {
protected:
    const Ref<ManualQueue> queue = ManualQueue::create();
};

TEST_F(RefToQueue, AdoptsTheMakersReference) { EXPECT_EQ(queue->references(), 1u); }

TEST_F(RefToQueue, AddsAReferenceAndTakesItBack) {
    {
        const auto second = Ref<ZorvaQueue>::retain(queue.get());
        EXPECT_EQ(queue->references(), 2u);
        EXPECT_EQ(second.get(), queue.get());
    }
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(RefToQueue, CopiesAddAndMovesDoNot) {
    Ref<ManualQueue> copy = queue;
    EXPECT_EQ(queue->references(), 2u);
    const Ref<ManualQueue> moved = std::move(copy);
    EXPECT_EQ(queue->references(), 2u);
    EXPECT_EQ(moved.get(), queue.get());
}

TEST_F(RefToQueue, AssignmentReleasesWhatWasThere) {
    const Ref<ManualQueue> other = ManualQueue::create();
    Ref<ManualQueue> ref = queue;
    ref = other;
    EXPECT_EQ(queue->references(), 1u);
    EXPECT_EQ(other->references(), 2u);
    Ref<ManualQueue> &same = ref;
    ref = same;
    EXPECT_EQ(other->references(), 2u);
    EXPECT_EQ(ref.get(), other.get());
}

TEST_F(RefToQueue, ResetReleasesOnce) {
    Ref<ManualQueue> ref = queue;
    ref.reset();
    ref.reset();
    EXPECT_FALSE(ref);
    EXPECT_EQ(queue->references(), 1u);
}

TEST_F(RefToQueue, HandsItsReferenceOver) {
    Ref<ManualQueue> ref = queue;
    ManualQueue *const handedOver = ref.release();
    EXPECT_FALSE(ref);
    EXPECT_EQ(queue->references(), 2u);
    const auto adopted = Ref<ManualQueue>::adopt(handedOver);
    EXPECT_EQ(queue->references(), 2u);
}

TEST(Ref, MayBeNull) {
    const auto none = Ref<ZorvaQueue>::retain(nullptr);
    const Ref<ZorvaQueue> copy = none;
    EXPECT_FALSE(none);
    EXPECT_FALSE(copy);
    EXPECT_EQ(copy.get(), nullptr);
}

} // namespace
} // namespace ZorvaTouch
