#include "Synth/Episodes.h"

#include <algorithm>
#include <array>

namespace ZorvaTouch::Synth {
namespace {

constexpr std::array kRegions{kPixelRegionPlayPause, kPixelRegionVolumeDown, kPixelRegionVolumeUp};

struct Range {
    double low, high;
    [[nodiscard]] double draw(Random &random) const noexcept { return random.between(low, high); }
};

/// Seconds, of which a time is drawn.
Microseconds drawTime(Random &random, Range seconds) noexcept { return microseconds(seconds.draw(random)); }

Microseconds drawPause(Random &random, const Parameters &parameters, Range seconds) noexcept {
    return microseconds(seconds.draw(random) * parameters.pauseScale);
}

Point drawAround(Point aim, Random &random, const Parameters &parameters) noexcept {
    const double x = aim.x + parameters.placement * random.gaussian();
    const double y = aim.y + parameters.placement * random.gaussian();
    return {.x = x, .y = y};
}

Point drawOnSensor(Random &random) noexcept {
    const double x = random.between(0, kSensorWidthMm);
    const double y = random.between(0, kSensorHeightMm);
    return {.x = x, .y = y};
}

/// How a kind of contact is pressed. Times in seconds; attack and release are shortened where a contact has
/// no time for them.
struct Press {
    Range pressure, attack, duration, release;
};

/// Widths vary by 10 % either way.
Contact drawContact(ContactKind kind, double width, const Press &press, Random &random) noexcept {
    Contact contact;
    contact.kind = kind;
    contact.width = width * random.between(0.9, 1.1);
    contact.pressure = press.pressure.draw(random);
    contact.duration = drawTime(random, press.duration);
    contact.attack = std::min(drawTime(random, press.attack), contact.duration * 2 / 5);
    contact.release = std::min(drawTime(random, press.release), contact.duration * 2 / 5);
    return contact;
}

/// A fingertip that means a region and stays there.
Contact drawFinger(ContactKind kind, PixelRegion region, const Press &press, Random &random,
                   const Parameters &parameters) noexcept {
    Contact contact = drawContact(kind, parameters.fingerWidth, press, random);
    contact.stopAt(drawAround(centreOf(region), random, parameters), 0, 0, region);
    return contact;
}

constexpr Press kTapPress{
    .pressure = {0.3, 1}, .attack = {0.012, 0.03}, .duration = {0.04, 0.4}, .release = {0.015, 0.04}};
constexpr Press kQuickTapPress{
    .pressure = {0.35, 1}, .attack = {0.012, 0.025}, .duration = {0.05, 0.14}, .release = {0.015, 0.035}};
constexpr Press kHoldPress{
    .pressure = {0.4, 1}, .attack = {0.02, 0.08}, .duration = {0.6, 2.5}, .release = {0.03, 0.08}};
constexpr Press kLongHoldPress{
    .pressure = {0.4, 1}, .attack = {0.02, 0.08}, .duration = {2.5, 10}, .release = {0.03, 0.08}};
constexpr Press kPalmPress{
    .pressure = {0.3, 0.9}, .attack = {0.04, 0.15}, .duration = {0.2, 3}, .release = {0.04, 0.2}};
constexpr Press kThumbPress{
    .pressure = {0.2, 0.5}, .attack = {0.2, 0.5}, .duration = {2, 7}, .release = {0.1, 0.3}};
constexpr Press kGrazePress{
    .pressure = {0.15, 0.4}, .attack = {0.02, 0.05}, .duration = {0.06, 0.25}, .release = {0.02, 0.05}};
constexpr Press kDropPress{
    .pressure = {0.1, 0.5}, .attack = {0.05, 0.6}, .duration = {1.5, 5}, .release = {0.3, 1}};

Episode episodeOf(const Contact &contact, Microseconds pause) {
    Episode episode;
    episode.contacts.push_back(contact);
    episode.pause = pause;
    return episode;
}

/// One hold in five is a long one.
Contact drawHold(Random &random, const Parameters &parameters) noexcept {
    const Press &press = random.chance(0.2) ? kLongHoldPress : kHoldPress;
    Contact hold = drawFinger(ContactKind::Hold, random.pick(kRegions), press, random, parameters);
    hold.sag = random.between(0, 0.2);
    return hold;
}

/// The region beside this one. From the middle either of the others.
PixelRegion drawNeighbour(PixelRegion region, Random &random) noexcept {
    if (region != kPixelRegionPlayPause)
        return kPixelRegionPlayPause;
    return random.chance(0.5) ? kPixelRegionVolumeUp : kPixelRegionVolumeDown;
}

} // namespace

Microseconds Episode::contactsEnd() const noexcept {
    Microseconds end = 0;
    for (const Contact &contact : contacts)
        end = std::max(end, contact.end());
    return end;
}

Episode makeTap(Random &random, const Parameters &parameters) {
    const PixelRegion region = random.pick(kRegions);
    const Contact tap = drawFinger(ContactKind::Tap, region, kTapPress, random, parameters);
    return episodeOf(tap, drawPause(random, parameters, {0.3, 1.2}));
}

Episode makeDoubleTap(Random &random, const Parameters &parameters) {
    const PixelRegion region = random.pick(kRegions);
    const Contact first = drawFinger(ContactKind::DoubleTap, region, kQuickTapPress, random, parameters);
    Contact second = drawFinger(ContactKind::DoubleTap, region, kQuickTapPress, random, parameters);
    second.start = first.end() + drawTime(random, {0.06, 0.2});
    Episode episode = episodeOf(first, drawPause(random, parameters, {0.5, 1.5}));
    episode.contacts.push_back(second);
    return episode;
}

Episode makeHold(Random &random, const Parameters &parameters) {
    const Contact hold = drawHold(random, parameters);
    return episodeOf(hold, drawPause(random, parameters, {0.4, 1.2}));
}

Episode makeLongHold(Random &random, const Parameters &parameters) {
    const PixelRegion region = random.pick(kRegions);
    const Contact hold = drawFinger(ContactKind::Hold, region, kLongHoldPress, random, parameters);
    return episodeOf(hold, drawPause(random, parameters, {1, 3}));
}

Episode makeSlide(Random &random, const Parameters &parameters) {
    PixelRegion region = random.pick(kRegions);
    Contact slide = drawFinger(ContactKind::Hold, region, kHoldPress, random, parameters);
    slide.stops[0].departure = drawTime(random, {0.7, 1.3});
    for (std::size_t moves = 1 + random.below(Contact::kMaxStops - 1); moves > 0; --moves) {
        region = drawNeighbour(region, random);
        const Microseconds arrival =
            slide.stops[slide.stopCount - 1].departure + drawTime(random, {0.1, 0.4});
        const Microseconds departure = arrival + drawTime(random, {0.4, 0.9});
        slide.stopAt(drawAround(centreOf(region), random, parameters), arrival, departure, region);
    }
    slide.duration = slide.stops[slide.stopCount - 1].departure;
    return episodeOf(slide, drawPause(random, parameters, {0.5, 1.5}));
}

Episode makePalm(Random &random, const Parameters &parameters) {
    const bool isPalm = random.chance(0.6);
    const ContactKind kind = isPalm ? ContactKind::Palm : ContactKind::Broad;
    const double width = isPalm ? parameters.palmWidth : parameters.broadWidth;
    Contact palm = drawContact(kind, width, kPalmPress, random);
    palm.stopAt(drawOnSensor(random), 0, 0);
    return episodeOf(palm, drawPause(random, parameters, {0.4, 1.2}));
}

Episode makeThumb(Random &random, const Parameters &parameters) {
    Contact thumb = drawContact(ContactKind::Thumb, parameters.thumbWidth, kThumbPress, random);
    const bool isLeft = random.chance(0.5);
    const Point from{.x = isLeft ? 1.0 : kSensorWidthMm - 1, .y = random.between(3, kSensorHeightMm - 3)};
    const Point creep = drawAround(from, random, parameters);
    thumb.stopAt(from, 0, 0);
    thumb.stopAt(creep, thumb.duration, thumb.duration);
    Episode episode = episodeOf(thumb, drawPause(random, parameters, {0.5, 1.5}));
    if (random.chance(0.3)) {
        Contact tap = drawFinger(ContactKind::Tap, random.pick(kRegions), kTapPress, random, parameters);
        tap.start = thumb.duration / 2;
        episode.contacts.push_back(tap);
    }
    return episode;
}

Episode makeGraze(Random &random, const Parameters &parameters) {
    Contact graze = drawContact(ContactKind::Graze, parameters.fingerWidth, kGrazePress, random);
    const Point from{.x = random.chance(0.5) ? 0.0 : kSensorWidthMm, .y = random.between(0, kSensorHeightMm)};
    const Point to{.x = kSensorWidthMm - from.x, .y = random.between(0, kSensorHeightMm)};
    graze.stopAt(from, 0, 0);
    graze.stopAt(to, graze.duration, graze.duration);
    return episodeOf(graze, drawPause(random, parameters, {0.3, 1}));
}

Episode makeWater(Random &random, const Parameters &parameters) {
    Episode episode;
    for (std::size_t drops = 1 + random.below(4); drops > 0; --drops) {
        Contact drop = drawContact(ContactKind::Water, parameters.waterWidth, kDropPress, random);
        drop.start = drawTime(random, {0, 2});
        const Point from = drawOnSensor(random);
        const Point to{.x = from.x, .y = from.y + random.between(0, 4)};
        drop.stopAt(from, 0, 0);
        drop.stopAt(to, drop.duration, drop.duration);
        episode.contacts.push_back(drop);
    }
    episode.pause = drawPause(random, parameters, {0.5, 1.5});
    return episode;
}

Episode makeReset(Random &random, const Parameters &parameters) {
    constexpr std::array<EpisodeMaker, 3> kMakers{makeTap, makeHold, makePalm};
    Episode episode = random.pick(kMakers)(random, parameters);
    const Contact &contact = episode.contacts.front();
    episode.reset = microseconds(static_cast<double>(contact.duration) * 1e-6 * random.between(0.2, 0.8));
    episode.pause += microseconds(parameters.bootTime / 1000);
    return episode;
}

Episode makeTapOrHold(Random &random, const Parameters &parameters) {
    return random.chance(0.7) ? makeTap(random, parameters) : makeHold(random, parameters);
}

Episode makeNothing(Random &random, const Parameters &parameters) {
    Episode episode;
    episode.pause = std::max<Microseconds>(drawPause(random, parameters, {5, 10}), 1'000'000);
    return episode;
}

Episode makeAnything(Random &random, const Parameters &parameters) {
    struct Share {
        EpisodeMaker make;
        std::size_t percent;
    };
    constexpr std::array<Share, 10> kShares{{{makeTap, 32},
                                             {makeDoubleTap, 8},
                                             {makeHold, 14},
                                             {makeSlide, 8},
                                             {makePalm, 10},
                                             {makeThumb, 7},
                                             {makeGraze, 12},
                                             {makeWater, 4},
                                             {makeLongHold, 3},
                                             {makeReset, 2}}};
    std::size_t drawn = random.below(100);
    std::size_t at = 0;
    while (drawn >= kShares[at].percent)
        drawn -= kShares[at++].percent;
    Episode episode = kShares[at].make(random, parameters);
    episode.pause += drawPause(random, parameters, {1, 8});
    return episode;
}

} // namespace ZorvaTouch::Synth
