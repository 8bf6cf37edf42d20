#include "Shared/Algs.h"

#include "Tests/Support/FramesScript.h"

#include <gtest/gtest.h>

#include <limits>

namespace ZorvaTouch {
namespace {

using Scripted::FrameFeeder;

class AlgsStateKeys : public ::testing::Test {
protected:
    /// Writes a value and reads it back.
    PropertyValue written(std::string_view key, const PropertyValue &value) {
        algs.setState(key, value);
        return algs.getState(key);
    }

    PropertyValue factor(std::string_view index) {
        return algs.getState("VirtualNormalizationFactors." + std::string(index));
    }

    Algs algs{Ports::silentLogProvider()};
};

const double kNan = std::numeric_limits<double>::quiet_NaN();

TEST_F(AlgsStateKeys, HaveTheirDefaults) {
    EXPECT_EQ(algs.getState("EnableHoldSuppression"), PropertyValue(true));
    EXPECT_EQ(algs.getState("EnableTapSuppression"), PropertyValue(true));
    EXPECT_EQ(algs.getState("HoldTimeoutMilliseconds"), PropertyValue(500u));
    EXPECT_EQ(algs.getState("ActivationThreshold"), PropertyValue(200.0));
}

TEST_F(AlgsStateKeys, EveryVirtualPixelHasAFactor) {
    const std::array<float, 23> factors{0.6667f, 0.4444f, 0.6667f, 0.5714f, 0.6667f, 0.5714f,
                                        0.6667f, 0.4651f, 0.6667f, 0.6667f, 0.4f,    0.4f,
                                        0.4f,    0.4f,    0.4f,    0.5714f, 0.4f,    0.4f,
                                        0.4f,    0.4f,    0.4444f, 0.5714f, 0.6667f};
    for (std::size_t i = 0; i < factors.size(); ++i)
        EXPECT_EQ(factor(std::to_string(i)), PropertyValue(factors[i])) << "factor " << i;
}

TEST_F(AlgsStateKeys, FactorsAreSinglePrecision) {
    // The float next to 0.6667 is 0.666700005531311...
    ASSERT_NE(factor("0").asDouble(), nullptr);
    EXPECT_EQ(*factor("0").asDouble(), 0.666700005531311035);
    EXPECT_EQ(written("VirtualNormalizationFactors.0", 0.1), PropertyValue(0.100000001490116119));
}

TEST_F(AlgsStateKeys, BooleanKeysAreOnForEveryNumberButZero) {
    const struct {
        PropertyValue value;
        bool on;
    } cases[] = {
        {true, true},
        {false, false},
        {1u, true},
        {0u, false},
        {2u, true},
        {0.5, true},
        {0.0, false},
        {-0.0, false},
        {-1.0, true},
        {kNan, true},
        {"true", false},
        {"1", false},
        {{}, false},
        {PropertyValue::Bytes{1}, false},
        {PropertyValue::Array{true}, false},
        {PropertyValue::Dictionary{{"a", true}}, false},
    };
    for (const char *key : {"EnableHoldSuppression", "EnableTapSuppression"}) {
        for (const auto &[value, on] : cases) {
            algs.setState(key, !on);
            EXPECT_EQ(written(key, value), PropertyValue(on))
                << key << ", kind " << static_cast<int>(value.kind());
        }
    }
}

TEST_F(AlgsStateKeys, TheTimeOutKeepsTheLowThirtyTwoBits) {
    const char *key = "HoldTimeoutMilliseconds";
    EXPECT_EQ(written(key, 4294967796u), PropertyValue(500u)) << "2^32 + 500";
    EXPECT_EQ(written(key, 4294967295u), PropertyValue(4294967295u));
    EXPECT_EQ(written(key, 4294967296u), PropertyValue(0u));
    EXPECT_EQ(written(key, 18446744073709551615u), PropertyValue(4294967295u)) << "2^64 - 1";
}

TEST_F(AlgsStateKeys, TheTimeOutTakesAnyNumberAsUnsigned) {
    const char *key = "HoldTimeoutMilliseconds";
    EXPECT_EQ(written(key, 750.9), PropertyValue(750u));
    EXPECT_EQ(written(key, -5.0), PropertyValue(0u));
    EXPECT_EQ(written(key, 1e300), PropertyValue(4294967295u)) << "2^64 - 1, then the low 32 bits";
    EXPECT_EQ(written(key, kNan), PropertyValue(0u));
    EXPECT_EQ(written(key, true), PropertyValue(1u));
    EXPECT_EQ(written(key, "750"), PropertyValue(0u)) << "text is no number";
}

TEST_F(AlgsStateKeys, TheThresholdIsRoundedToSinglePrecision) {
    const char *key = "ActivationThreshold";
    EXPECT_EQ(written(key, 250u), PropertyValue(250.0));
    EXPECT_EQ(written(key, 0.1), PropertyValue(0.100000001490116119));
    EXPECT_EQ(written(key, 16777217u), PropertyValue(16777216.0))
        << "2^24 + 1, a tie, goes to the even neighbour";
    EXPECT_EQ(written(key, 18446744073709551615u), PropertyValue(18446744073709551616.0));
    EXPECT_EQ(written(key, 1e300), PropertyValue(std::numeric_limits<double>::infinity()));
    EXPECT_EQ(written(key, -3.5), PropertyValue(-3.5));
    EXPECT_EQ(written(key, true), PropertyValue(1.0));
    EXPECT_EQ(written(key, "250"), PropertyValue(0.0));
    EXPECT_EQ(written(key, PropertyValue()), PropertyValue(0.0));
}

TEST_F(AlgsStateKeys, WritesTakeEffectFromTheNextFrame) {
    FrameFeeder feeder(algs);
    EXPECT_EQ(feeder.frame(1000, {{'H', 300}}), "may-begin 3");
    algs.setState("ActivationThreshold", 1000.0);
    EXPECT_TRUE(algs.pixels()[7].isTouched) << "not before";
    feeder.frame(1010, {{'H', 300}});
    EXPECT_EQ(algs.pixels()[7].normalizedValue, 0.3f); // 300 / 1000
    EXPECT_FALSE(algs.handStats().isTouching);
}

TEST_F(AlgsStateKeys, AShorterTimeOutMakesAHold) {
    algs.setState("HoldTimeoutMilliseconds", 20u);
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 500}});
    EXPECT_EQ(feeder.frame(1020, {{'H', 500}}), "");
    EXPECT_EQ(feeder.frame(1021, {{'H', 500}}), "hold-start 3");
}

TEST_F(AlgsStateKeys, ATimeOutOfZeroHoldsFromTheSecondFrame) {
    algs.setState("HoldTimeoutMilliseconds", "none");
    FrameFeeder feeder(algs);
    EXPECT_EQ(feeder.frame(1000, {{'H', 500}}), "may-begin 3");
    EXPECT_EQ(feeder.frame(1001, {{'H', 500}}), "hold-start 3");
}

TEST_F(AlgsStateKeys, AFactorIsItsVirtualPixelsGain) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 100}});
    EXPECT_EQ(algs.virtualPixels()[15].value, 57) << "100 x 0.5714 in GHI";
    algs.setState("VirtualNormalizationFactors.15", 1.5);
    EXPECT_EQ(algs.virtualImage().normalizationFactors[15], 1.5f);
    EXPECT_EQ(algs.virtualPixels()[15].value, 57) << "not before the next frame";
    feeder.frame(1010, {{'H', 100}});
    EXPECT_EQ(algs.virtualPixels()[15].value, 150);
    EXPECT_EQ(algs.virtualPixels()[16].value, 0);
}

TEST_F(AlgsStateKeys, ANonNumberMakesAFactorZero) {
    EXPECT_EQ(written("VirtualNormalizationFactors.15", "much"), PropertyValue(0.0));
    FrameFeeder(algs).frame(1000, {{'H', 100}});
    EXPECT_EQ(algs.virtualPixels()[15].value, 0);
}

TEST_F(AlgsStateKeys, FactorIndicesAreReadAsAStreamReadsThem) {
    for (std::uint64_t i = 0; i < 23; ++i)
        algs.setState("VirtualNormalizationFactors." + std::to_string(i), 100u + i);
    const struct {
        const char *index;
        double value;
    } cases[] = {
        {"7", 107.0},
        {"007", 107.0},
        {"+7", 107.0},
        {" 7", 107.0},
        {"\t\n7", 107.0},
        {"7 ", 107.0},
        {"7.5", 107.0},
        {"7x", 107.0},
        {"22", 122.0},
        {"", 100.0},
        {"x", 100.0},
        {"abc7", 100.0},
        {"0x10", 100.0},
        {"010", 110.0},
        {".7", 100.0},
        {"-0", 100.0},
        {"--7", 100.0},
        {"1e1", 101.0},
        {"VirtualNormalizationFactors.7", 100.0},
        {"-18446744073709551615", 101.0}, // negated modulo 2^64, as for any unsigned number of a stream
    };
    for (const auto &[index, value] : cases)
        EXPECT_EQ(factor(index), PropertyValue(value)) << '"' << index << '"';
}

TEST_F(AlgsStateKeys, FactorIndicesOutOfRangeAreIgnored) {
    for (const char *index :
         {"23", "24", "1000000", "4294967296", "18446744073709551615", "18446744073709551616",
          "99999999999999999999999", "-1", "-7", "-99999999999999999999999"}) {
        EXPECT_TRUE(factor(index).isNull()) << index;
        algs.setState("VirtualNormalizationFactors." + std::string(index), 5.0);
    }
    for (std::uint64_t i = 0; i < 23; ++i)
        EXPECT_NE(factor(std::to_string(i)), PropertyValue(5.0)) << "factor " << i << " was written";
}

TEST_F(AlgsStateKeys, AFactorKeyWithoutANumberIsFactorZero) {
    algs.setState("VirtualNormalizationFactors.first", 0.25);
    EXPECT_EQ(factor("0"), PropertyValue(0.25));
    EXPECT_EQ(factor("first"), PropertyValue(0.25));
}

TEST_F(AlgsStateKeys, UnknownKeysReadAsNullAndAreIgnored) {
    const char *keys[] = {"",
                          "enableTapSuppression",
                          "EnableTapSuppression ",
                          "EnableTapSuppression.x",
                          "Algs.EnableTapSuppression",
                          "activationthreshold",
                          "VirtualNormalizationFactors",
                          "VirtualNormalizationFactorsX.1",
                          "virtualNormalizationFactors.1",
                          "holdTimeout"};
    for (const char *key : keys) {
        algs.setState(key, 7u);
        EXPECT_TRUE(algs.getState(key).isNull()) << key;
        EXPECT_FALSE(Algs::isWritableKey(key)) << key;
    }
    EXPECT_EQ(algs.getState("EnableTapSuppression"), PropertyValue(true));
    EXPECT_EQ(algs.getState("ActivationThreshold"), PropertyValue(200.0));
}

PropertyValue tapCount(const PropertyValue &stats) { return *stats.find("Dispatched")->find("numTaps"); }

TEST_F(AlgsStateKeys, CountersAreTwoDictionariesOfTwelve) {
    const PropertyValue stats = algs.getState("EventStats");
    ASSERT_NE(stats.asDictionary(), nullptr);
    EXPECT_EQ(stats.asDictionary()->size(), 2u);
    for (const char *name : {"Dispatched", "Rejected"}) {
        ASSERT_NE(stats.find(name), nullptr);
        ASSERT_NE(stats.find(name)->asDictionary(), nullptr);
        EXPECT_EQ(stats.find(name)->asDictionary()->size(), 12u);
        for (const auto &[key, value] : *stats.find(name)->asDictionary())
            EXPECT_EQ(value, PropertyValue(0u)) << key;
    }
}

TEST_F(AlgsStateKeys, DebugInfoIsTheCountersUnderOneName) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    feeder.frame(1020, {});
    const PropertyValue info = algs.getState("DebugInfo");
    ASSERT_NE(info.asDictionary(), nullptr);
    EXPECT_EQ(info.asDictionary()->size(), 1u);
    ASSERT_NE(info.find("EventStats"), nullptr);
    EXPECT_EQ(*info.find("EventStats"), algs.getState("EventStats"));
    EXPECT_EQ(tapCount(*info.find("EventStats")), PropertyValue(1u));
}

TEST_F(AlgsStateKeys, ResetEventStatsClearsTheCountersWhateverItsValue) {
    for (const PropertyValue &value : {PropertyValue(), PropertyValue(false), PropertyValue("no")}) {
        FrameFeeder feeder(algs);
        feeder.frame(1000, {{'H', 300}});
        feeder.frame(1020, {});
        ASSERT_EQ(tapCount(algs.getState("EventStats")), PropertyValue(1u));
        algs.setState("ResetEventStats", value);
        EXPECT_EQ(tapCount(algs.getState("EventStats")), PropertyValue(0u));
    }
}

TEST_F(AlgsStateKeys, ReadOnlyAndWriteOnlyKeysStaySo) {
    FrameFeeder feeder(algs);
    feeder.frame(1000, {{'H', 300}});
    feeder.frame(1020, {});
    EXPECT_TRUE(algs.getState("ResetEventStats").isNull());
    EXPECT_EQ(tapCount(algs.getState("EventStats")), PropertyValue(1u))
        << "reading the key reset the counters";
    algs.setState("EventStats", 0u);
    algs.setState("DebugInfo", 0u);
    EXPECT_EQ(tapCount(algs.getState("EventStats")), PropertyValue(1u));
}

TEST_F(AlgsStateKeys, WritableKeysAreTold) {
    for (const char *key : {"EnableHoldSuppression", "EnableTapSuppression", "HoldTimeoutMilliseconds",
                            "ActivationThreshold", "ResetEventStats", "VirtualNormalizationFactors.0",
                            "VirtualNormalizationFactors.22", "VirtualNormalizationFactors.x"})
        EXPECT_TRUE(Algs::isWritableKey(key)) << key;
    for (const char *key :
         {"EventStats", "DebugInfo", "VirtualNormalizationFactors.23",
          "VirtualNormalizationFactors.18446744073709551616", "VirtualNormalizationFactors"})
        EXPECT_FALSE(Algs::isWritableKey(key)) << key;
}

} // namespace
} // namespace ZorvaTouch
