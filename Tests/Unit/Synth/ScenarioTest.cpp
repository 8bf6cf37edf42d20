#include "Synth/Scenario.h"

#include "Shared/RecordingContainer.h"
#include "Synth/Stream.h"

#include <gtest/gtest.h>

#include <cctype>
#include <cstdint>
#include <ostream>
#include <string>
#include <string_view>

namespace ZorvaTouch::Synth {
namespace {

/// FNV-1a, 64 bits.
std::uint64_t checksumOf(std::string_view text) {
    std::uint64_t sum = 0xCBF29CE484222325u;
    for (const char c : text)
        sum = (sum ^ static_cast<unsigned char>(c)) * 0x100000001B3u;
    return sum;
}

struct Checksum {
    std::string_view scenario;
    double accelRate;
    std::uint64_t value; ///< of the recording's text, seed 1, the scenario's duration
};

// Every compiler, optimization and processor must come to these. They change with the generator on purpose
// only: then the golden recordings, the table and the plots of Docs/Synth.md change too.
constexpr std::array<Checksum, kScenarioCount + 1> kChecksums{{
    {"idle", 0, 0x7DA8FECAA1277840u},
    {"taps", 0, 0xAC5EED49B407E1D0u},
    {"double-taps", 0, 0xF92C28D86C11CC7Au},
    {"holds", 0, 0x298CFA778BF9D888u},
    {"slides", 0, 0x348E8EC0A1929001u},
    {"palms", 0, 0x9302BD892F2EAE24u},
    {"thumbs", 0, 0x3FE3479BB71A54C5u},
    {"grazes", 0, 0x43BC79C93B03AE08u},
    {"water", 0, 0x56BECBE8C93B2962u},
    {"drift", 0, 0xA2FE7D23A998F048u},
    {"link-faults", 0, 0x25BC2F69B697AEA1u},
    {"resets", 0, 0x694F88AF83AA1408u},
    {"day", 0, 0x882F51844DFEA93Au},
    {"day", 100, 0xE97842C0A66DCCBAu},
}};

void PrintTo(const Checksum &checksum, std::ostream *out) { *out << checksum.scenario; }

class SynthScenarioChecksum : public ::testing::TestWithParam<Checksum> {};

TEST_P(SynthScenarioChecksum, IsTheSameOnEveryMachine) {
    const Scenario &scenario = *scenarioNamed(GetParam().scenario);
    Parameters parameters = parametersOf(scenario);
    parameters.accelRate = GetParam().accelRate;
    const std::string text = writeRecordingContainer(synthesize(scenario, parameters, 1, scenario.duration));
    EXPECT_EQ(checksumOf(text), GetParam().value)
        << GetParam().scenario << " is now 0x" << std::hex << std::uppercase << checksumOf(text) << "u";
}

std::string testName(const ::testing::TestParamInfo<Checksum> &info) {
    std::string name(info.param.scenario);
    std::erase_if(name, [](unsigned char c) { return !std::isalnum(c); });
    return name + (info.param.accelRate > 0 ? "WithAccelerometer" : "");
}

INSTANTIATE_TEST_SUITE_P(All, SynthScenarioChecksum, ::testing::ValuesIn(kChecksums), testName);

TEST(SynthScenario, TheChecksumIsThePublishedOne) {
    EXPECT_EQ(checksumOf(""), 0xCBF29CE484222325u);
    EXPECT_EQ(checksumOf("foobar"), 0x85944171F73967E8u);
}

TEST(SynthScenario, AllHaveAChecksum) {
    for (std::size_t i = 0; i < kScenarioCount; ++i)
        EXPECT_EQ(scenarios()[i].name, kChecksums[i].scenario);
}

TEST(SynthScenario, IsFoundByItsWholeName) {
    EXPECT_EQ(scenarioNamed("taps"), &scenarios()[1]);
    EXPECT_EQ(scenarioNamed("tap"), nullptr);
    EXPECT_EQ(scenarioNamed(""), nullptr);
}

TEST(SynthScenario, SomeHaveDefaultsOfTheirOwn) {
    EXPECT_EQ(parametersOf(*scenarioNamed("link-faults")).dropRate, 5);
    EXPECT_EQ(parametersOf(*scenarioNamed("drift")).warmDrift, 120);
    EXPECT_EQ(parametersOf(*scenarioNamed("taps")).dropRate, 0);
}

} // namespace
} // namespace ZorvaTouch::Synth
