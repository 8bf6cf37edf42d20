#include "Tests/Support/Channels.h"

#include "Shared/VirtualImage.h"

#include <algorithm>
#include <stdexcept>

namespace ZorvaTouch::Testing {
namespace {

void raise(Pixel &pixel, std::int32_t value) {
    pixel.value = value;
    pixel.normalizedValue = static_cast<float>(value) / 200.0f;
    pixel.maxNormalizedValue = pixel.normalizedValue;
    pixel.isAboveFloor = true;
    pixel.wasAboveFloor = true;
}

} // namespace

Channels::Channels() : pixels(makePixels()), virtualPixels(makeVirtualPixels(VirtualImage())) {}

Pixel &Channels::electrode(char letter) { return pixels.at(static_cast<std::size_t>(letter - 'A')); }

VirtualPixel &Channels::group(std::string_view name) {
    const auto found = std::find_if(virtualPixels.begin(), virtualPixels.end(),
                                    [name](const VirtualPixel &pixel) { return pixel.name == name; });
    if (found == virtualPixels.end())
        throw std::out_of_range("no such group");
    return *found;
}

Channels &Channels::press(char letter, std::int32_t value) {
    raise(electrode(letter), value);
    electrode(letter).isTouched = true;
    electrode(letter).wasTouched = true;
    return *this;
}

Channels &Channels::brush(char letter, std::int32_t value) {
    raise(electrode(letter), value);
    return *this;
}

Channels &Channels::remember(char letter, float maxNormalizedValue) {
    electrode(letter).maxNormalizedValue = maxNormalizedValue;
    return *this;
}

Channels &Channels::remember(std::string_view name, float maxNormalizedValue) {
    group(name).maxNormalizedValue = maxNormalizedValue;
    return *this;
}

} // namespace ZorvaTouch::Testing
