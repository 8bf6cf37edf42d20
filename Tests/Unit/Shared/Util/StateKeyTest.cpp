#include "Shared/Util/StateKey.h"

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Util::stripDomainFromKey;

TEST(StateKey, LeadingDomainAndItsDotAreRemoved) {
    std::string key = "Algs.someKey";
    EXPECT_TRUE(stripDomainFromKey(key, "Algs"));
    EXPECT_EQ(key, "someKey");
}

TEST(StateKey, OnlyTheFirstDomainIsRemoved) {
    std::string key = "Algs.Algs.x";
    EXPECT_TRUE(stripDomainFromKey(key, "Algs"));
    EXPECT_EQ(key, "Algs.x");
}

TEST(StateKey, NothingMayRemain) {
    std::string key = "Algs.";
    EXPECT_TRUE(stripDomainFromKey(key, "Algs"));
    EXPECT_EQ(key, "");
}

TEST(StateKey, AnEmptyDomainIsALeadingDot) {
    std::string key = ".x";
    EXPECT_TRUE(stripDomainFromKey(key, ""));
    EXPECT_EQ(key, "x");
    key = "x.y";
    EXPECT_FALSE(stripDomainFromKey(key, ""));
    EXPECT_EQ(key, "x.y");
}

TEST(StateKey, OtherKeysStayAsTheyAre) {
    for (const char *other :
         {"Algsx.y", "algs.y", "ALGS.y", "Algs", "Alg", "", ".", "x.Algs.y", " Algs.y", "Algs,y"}) {
        std::string key = other;
        EXPECT_FALSE(stripDomainFromKey(key, "Algs")) << other;
        EXPECT_EQ(key, other);
    }
}

TEST(StateKey, ADomainWithADotIsComparedWhole) {
    std::string key = "Pipeline.Algs.x";
    EXPECT_TRUE(stripDomainFromKey(key, "Pipeline.Algs"));
    EXPECT_EQ(key, "x");
}

} // namespace
} // namespace ZorvaTouch
