#include "Synth/Episodes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

namespace ZorvaTouch::Synth {
namespace {

/// A great many episodes of one maker.
std::vector<Episode> draw(EpisodeMaker make, int count = 2000) {
    Random random(1);
    const Parameters parameters;
    std::vector<Episode> episodes;
    for (int i = 0; i < count; ++i)
        episodes.push_back(make(random, parameters));
    return episodes;
}

struct Extremes {
    double low = 1e9, high = -1e9;
    void add(double value) {
        low = std::min(low, value);
        high = std::max(high, value);
    }
};

template <typename Function> Extremes extremesOf(EpisodeMaker make, Function function) {
    Extremes extremes;
    for (const Episode &episode : draw(make))
        for (const Contact &contact : episode.contacts)
            extremes.add(function(contact));
    return extremes;
}

double durationMs(const Contact &contact) { return static_cast<double>(contact.duration) / 1000; }

TEST(SynthEpisodes, TapsLast40To400Ms) {
    const Extremes durations = extremesOf(makeTap, durationMs);
    EXPECT_GE(durations.low, 40);
    EXPECT_LT(durations.low, 42);
    EXPECT_LE(durations.high, 400);
    EXPECT_GT(durations.high, 398);
}

TEST(SynthEpisodes, TapsAreLightToHeavy) {
    const Extremes pressures = extremesOf(makeTap, [](const Contact &tap) { return tap.pressure; });
    EXPECT_NEAR(pressures.low, 0.3, 0.01);
    EXPECT_NEAR(pressures.high, 1, 0.01);
}

TEST(SynthEpisodes, TapsMeanEachRegionAsOften) {
    std::array<int, kPixelRegionCount> counts{};
    for (const Episode &episode : draw(makeTap, 3000))
        ++counts[episode.contacts.at(0).stops[0].region];
    EXPECT_EQ(counts[kPixelRegionNone], 0);
    for (std::size_t region = 1; region < kPixelRegionCount; ++region)
        EXPECT_NEAR(counts[region], 1000, 110);
}

TEST(SynthEpisodes, FingersLandAroundTheirAim) {
    double squares = 0;
    for (const Episode &episode : draw(makeTap, 4000)) {
        const Stop &stop = episode.contacts.at(0).stops[0];
        const double off = stop.place.x - centreOf(stop.region).x;
        squares += off * off;
    }
    EXPECT_NEAR(squares / 4000, 0.64, 0.06); // 0.8 mm squared
}

TEST(SynthEpisodes, DoubleTapsFollowEachOtherWithin60To200Ms) {
    for (const Episode &episode : draw(makeDoubleTap)) {
        ASSERT_EQ(episode.contacts.size(), 2u);
        const Contact &first = episode.contacts[0], &second = episode.contacts[1];
        EXPECT_EQ(first.stops[0].region, second.stops[0].region);
        EXPECT_GE(second.start, first.end() + 60'000);
        EXPECT_LE(second.start, first.end() + 200'000);
    }
}

TEST(SynthEpisodes, HoldsLastFrom600MsTo10S) {
    const Extremes durations = extremesOf(makeHold, durationMs);
    EXPECT_GE(durations.low, 600);
    EXPECT_LT(durations.low, 620);
    EXPECT_LE(durations.high, 10'000);
    EXPECT_GT(durations.high, 9'900);
}

TEST(SynthEpisodes, SlidesGoFromRegionToRegionBesideIt) {
    std::set<std::size_t> moves;
    for (const Episode &episode : draw(makeSlide)) {
        const Contact &slide = episode.contacts.at(0);
        moves.insert(slide.stopCount - 1);
        for (std::size_t i = 1; i < slide.stopCount; ++i) {
            EXPECT_NE(slide.stops[i].region, slide.stops[i - 1].region);
            EXPECT_TRUE(slide.stops[i].region == kPixelRegionPlayPause ||
                        slide.stops[i - 1].region == kPixelRegionPlayPause);
            EXPECT_GT(slide.stops[i].arrival, slide.stops[i - 1].departure);
        }
        EXPECT_GE(slide.stops[0].departure, 700'000u); // by then it is a hold
        EXPECT_EQ(slide.stops[slide.stopCount - 1].departure, slide.duration);
    }
    EXPECT_EQ(moves, (std::set<std::size_t>{1, 2, 3}));
}

TEST(SynthEpisodes, AccidentsMeanNoRegion) {
    for (const EpisodeMaker make : {makePalm, makeGraze, makeWater})
        for (const Episode &episode : draw(make, 100))
            for (const Contact &contact : episode.contacts)
                EXPECT_EQ(contact.stops[0].region, kPixelRegionNone);
}

TEST(SynthEpisodes, PalmsAreBroad) {
    const Extremes widths = extremesOf(makePalm, [](const Contact &palm) { return palm.width; });
    EXPECT_NEAR(widths.low, 11.7, 0.1); // 13 mm less 10 %
    EXPECT_NEAR(widths.high, 22, 0.1);  // 20 mm and 10 %
}

TEST(SynthEpisodes, ThreeInTenThumbsHaveATapMeanwhile) {
    std::size_t taps = 0;
    for (const Episode &episode : draw(makeThumb)) {
        const Contact &thumb = episode.contacts.at(0);
        EXPECT_EQ(thumb.kind, ContactKind::Thumb);
        EXPECT_TRUE(thumb.stops[0].place.x == 1 || thumb.stops[0].place.x == 17);
        taps += episode.contacts.size() - 1;
        if (episode.contacts.size() > 1) {
            EXPECT_GT(episode.contacts[1].start, thumb.attack);
            EXPECT_LT(episode.contacts[1].end(), thumb.end());
        }
    }
    EXPECT_NEAR(static_cast<double>(taps), 600, 65);
}

TEST(SynthEpisodes, GrazesCrossTheSensor) {
    for (const Episode &episode : draw(makeGraze, 100)) {
        const Contact &graze = episode.contacts.at(0);
        EXPECT_EQ(graze.centreAt(0).x + graze.centreAt(graze.duration).x, 18);
        EXPECT_NEAR(graze.centreAt(graze.duration / 2).x, 9, 0.001); // a duration may be odd
    }
}

TEST(SynthEpisodes, WaterComesInOneToFourDrops) {
    std::set<std::size_t> drops;
    for (const Episode &episode : draw(makeWater))
        drops.insert(episode.contacts.size());
    EXPECT_EQ(drops, (std::set<std::size_t>{1, 2, 3, 4}));
}

TEST(SynthEpisodes, ResetsComeInTheMiddle) {
    for (const Episode &episode : draw(makeReset)) {
        const Contact &contact = episode.contacts.at(0);
        ASSERT_TRUE(episode.reset);
        EXPECT_GE(static_cast<double>(*episode.reset), 0.2 * static_cast<double>(contact.duration) - 1);
        EXPECT_LE(static_cast<double>(*episode.reset), 0.8 * static_cast<double>(contact.duration));
    }
}

TEST(SynthEpisodes, ADayHasEverything) {
    std::set<ContactKind> kinds;
    std::size_t resets = 0;
    for (const Episode &episode : draw(makeAnything)) {
        for (const Contact &contact : episode.contacts)
            kinds.insert(contact.kind);
        resets += episode.reset.has_value();
        EXPECT_GT(episode.pause, 1'000'000u);
    }
    EXPECT_EQ(kinds.size(), 8u);
    EXPECT_NEAR(static_cast<double>(resets), 40, 20); // two in a hundred
}

TEST(SynthEpisodes, PausesAreStretched) {
    Random random(1), same(1);
    Parameters parameters;
    const Episode usual = makeTap(random, parameters);
    parameters.pauseScale = 10;
    const Episode stretched = makeTap(same, parameters);
    EXPECT_NEAR(static_cast<double>(stretched.pause), 10 * static_cast<double>(usual.pause), 10);
    EXPECT_EQ(stretched.contactsEnd(), usual.contactsEnd());
}

} // namespace
} // namespace ZorvaTouch::Synth
