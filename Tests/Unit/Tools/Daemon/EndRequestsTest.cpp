#include "Tools/Daemon/EndRequests.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Tools {
namespace {

TEST(EndRequests, TheFirstBeginsTheEndAndTheSecondIsOnlyAcknowledged) {
    EndRequests requests;
    EXPECT_EQ(requests.take(7), EndStep::Begin);
    EXPECT_EQ(requests.take(7), EndStep::Acknowledge);
}

TEST(EndRequests, AThirdWithinTwoSecondsOfTheSecondHurriesOnce) {
    EndRequests requests;
    EXPECT_EQ(requests.take(0), EndStep::Begin);
    EXPECT_EQ(requests.take(1'000'000'000), EndStep::Acknowledge);
    EXPECT_EQ(requests.take(3'000'000'000), EndStep::Hurry);
    EXPECT_EQ(requests.take(3'000'000'001), EndStep::Ignore);
    EXPECT_EQ(requests.take(9'000'000'000), EndStep::Ignore);
}

TEST(EndRequests, ALaterThirdIsAcknowledgedAndItsOwnTwoSecondsBegin) {
    EndRequests requests;
    EXPECT_EQ(requests.take(0), EndStep::Begin);
    EXPECT_EQ(requests.take(1'000'000'000), EndStep::Acknowledge);
    EXPECT_EQ(requests.take(3'000'000'001), EndStep::Acknowledge);
    EXPECT_EQ(requests.take(5'000'000'001), EndStep::Hurry);
}

} // namespace
} // namespace ZorvaTouch::Tools
