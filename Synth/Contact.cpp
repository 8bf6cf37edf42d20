#include "Synth/Contact.h"

#include <algorithm>
#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

/// In the order of ContactKind.
constexpr std::array<std::string_view, 9> kKindNames{"Tap",   "DoubleTap", "Hold",  "Palm",     "Broad",
                                                     "Thumb", "Graze",     "Water", "Remainder"};

/// (1 - q)^3 is 1/2 at q = 1 - 2^(-1/3) = 0.2062995; q grows with the distance squared.
constexpr double kHalfHeightQ = 0.2062994740159002;

/// The way from `from` to `to`, 0 before and 1 after, with a smooth start and end: 3u^2 - 2u^3.
double smoothStep(Microseconds time, Microseconds from, Microseconds to) noexcept {
    if (time >= to)
        return 1;
    if (time <= from)
        return 0;
    const double u = static_cast<double>(time - from) / static_cast<double>(to - from);
    return u * u * (3 - 2 * u);
}

/// A wave between -1 and 1 that is made of parabolas and near to a sine.
/// @param turns  0 or more.
double wave(double turns) noexcept {
    const double u = 2 * (turns - std::floor(turns));
    return u < 1 ? 4 * u * (1 - u) : -4 * (u - 1) * (2 - u);
}

Point between(Point from, Point to, double part) noexcept {
    return {.x = from.x + (to.x - from.x) * part, .y = from.y + (to.y - from.y) * part};
}

} // namespace

std::string_view nameOf(ContactKind kind) noexcept { return kKindNames[static_cast<std::size_t>(kind)]; }

double Blob::at(Point place) const noexcept {
    const double dx = place.x - centre.x;
    const double dy = place.y - centre.y;
    const double halfWidth = width / 2;
    const double q = (dx * dx + dy * dy) * kHalfHeightQ / (halfWidth * halfWidth);
    const double rest = 1 - q;
    return rest > 0 ? height * rest * rest * rest : 0;
}

void Contact::stopAt(Point place, Microseconds arrival, Microseconds departure, PixelRegion region) noexcept {
    stops[stopCount++] = {.arrival = arrival, .departure = departure, .place = place, .region = region};
}

Point Contact::centreAt(Microseconds time) const noexcept {
    std::size_t at = 0;
    while (at + 1 < stopCount && time > stops[at].departure)
        ++at;
    if (at == 0 || time >= stops[at].arrival)
        return stops[at].place;
    return between(stops[at - 1].place, stops[at].place,
                   smoothStep(time, stops[at - 1].departure, stops[at].arrival));
}

double Contact::pressureAt(Microseconds time, const Parameters &parameters) const noexcept {
    if (time >= duration)
        return 0;
    const double rise = smoothStep(time, 0, attack);
    const double fall = 1 - smoothStep(time, duration - release, duration);
    const double sagged = 1 - sag * (static_cast<double>(time) / static_cast<double>(duration));
    const double shaken =
        1 + parameters.tremor / 100 * wave(static_cast<double>(time) * 1e-6 * parameters.tremorRate);
    return pressure * rise * fall * sagged * shaken;
}

Blob Contact::blobAt(Microseconds time, const Parameters &parameters) const noexcept {
    const double pressed = pressureAt(time, parameters);
    const double light = parameters.lightWidth / 100;
    return {.centre = centreAt(time),
            .width = width * (light + (1 - light) * std::sqrt(pressed)),
            .height = pressed};
}

} // namespace ZorvaTouch::Synth
