#include "Synth/Script.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Synth {
namespace {

/// A tap of 100 ms with a reset in its middle, and 50 ms of nothing.
Episode makeShortTap(Random & /*random*/, const Parameters & /*parameters*/) {
    Contact tap;
    tap.duration = 100'000;
    tap.stopAt({}, 0, 0);
    Episode episode;
    episode.contacts.push_back(tap);
    episode.reset = 50'000;
    episode.pause = 50'000;
    return episode;
}

/// Half of them last 1 s instead.
Episode makeShortOrLong(Random &random, const Parameters &parameters) {
    Episode episode = makeShortTap(random, parameters);
    if (random.next() % 2 == 0)
        episode.contacts[0].duration = 1'000'000;
    return episode;
}

constexpr Scenario kShortTaps{"short-taps", "", 1, makeShortTap, nullptr};

TEST(SynthScript, BeginsAfter300Milliseconds) {
    Script script(kShortTaps, Parameters(), Random(1), Script::kForEver);
    script.advance(299'999);
    EXPECT_TRUE(script.contacts().empty());
    script.advance(300'000);
    ASSERT_EQ(script.contacts().size(), 1u);
    EXPECT_EQ(script.contacts()[0].start, 300'000u);
}

TEST(SynthScript, EpisodesFollowEachOtherWithTheirPauses) {
    Script script(kShortTaps, Parameters(), Random(1), Script::kForEver);
    script.advance(700'000); // at 300, 450 and 600 ms
    ASSERT_EQ(script.contacts().size(), 3u);
    EXPECT_EQ(script.contacts()[2].start, 600'000u);
    EXPECT_EQ(script.contacts()[2].end(), 700'000u);
}

TEST(SynthScript, EachResetIsTakenOnce) {
    Script script(kShortTaps, Parameters(), Random(1), Script::kForEver);
    script.advance(500'000);
    EXPECT_EQ(script.takeReset(349'999), std::nullopt);
    EXPECT_EQ(script.takeReset(500'000), 350'000u);
    EXPECT_EQ(script.takeReset(500'000), 500'000u);
    EXPECT_EQ(script.takeReset(500'000), std::nullopt);
}

TEST(SynthScript, NothingLastsBeyondTheEnd) {
    Script script(kShortTaps, Parameters(), Random(1), 549'999); // the second one would end at 550 ms
    script.advance(10'000'000);
    EXPECT_EQ(script.contacts().size(), 1u);
    Script longer(kShortTaps, Parameters(), Random(1), 550'000);
    longer.advance(10'000'000);
    EXPECT_EQ(longer.contacts().size(), 2u);
}

TEST(SynthScript, TheLastEpisodesAreShortEnough) {
    const Scenario shortOrLong{"short-or-long", "", 1, makeShortOrLong, nullptr};
    for (std::uint64_t seed = 0; seed < 20; ++seed) {
        Script script(shortOrLong, Parameters(), Random(seed),
                      700'000); // room for short ones at 300, 450 and 600 ms
        script.advance(10'000'000);
        EXPECT_EQ(script.contacts().size(), 3u);
    }
}

} // namespace
} // namespace ZorvaTouch::Synth
