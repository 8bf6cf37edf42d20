#include "Tools/Cli/ShowCommand.h"

#include "Shared/InputReport.h"
#include "Shared/SensorPicture.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/Documents.h"

#include <algorithm>
#include <optional>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

using InputReport::Image;

std::optional<Image> imageIn(const FrameView &frame) {
    return Image::parse(frame.data.data(), frame.data.size());
}

/// What a frame is, if it is no image.
std::string_view kindOf(const FrameView &frame) {
    switch (frame.type) {
    case FrameType::State:
        return "a state write";
    case FrameType::Metadata:
        return "a metadata item";
    case FrameType::InputReport:
        break;
    }
    const bool isFirmwareEvent =
        InputReport::FirmwareEvent::parse(frame.data.data(), frame.data.size()).has_value();
    return isFirmwareEvent ? "a firmware event" : "an unhandled report";
}

Image imageAt(const FrameList &frames, std::uint64_t index, const std::string &title) {
    const std::string place = title + ": frame " + std::to_string(index) + ": ";
    if (index >= frames.size())
        throw CliError(place + "there is none; the recording has " + std::to_string(frames.size()) +
                       " frames");
    const FrameView frame = frames[index];
    if (const auto image = imageIn(frame))
        return *image;
    throw CliError(place + "it is no image but " + std::string(kindOf(frame)));
}

std::int16_t largestSignal(const Image &image) {
    return *std::max_element(image.signals.begin(), image.signals.end());
}

/// The image with the largest signal; the first of equals.
Image strongestImage(const FrameList &frames, const std::string &title) {
    std::optional<Image> strongest;
    for (const FrameView &frame : frames) {
        const auto image = imageIn(frame);
        if (image && (!strongest || largestSignal(*image) > largestSignal(*strongest)))
            strongest = image;
    }
    if (!strongest)
        throw CliError(title + ": there is no image");
    return *strongest;
}

} // namespace

ExitStatus runShow(const ShowOptions &options, Environment &environment) {
    const std::string title = inputTitle(options.file);
    const FrameList frames = readRecording(options.file, environment).frames;
    const Image image =
        options.frame ? imageAt(frames, *options.frame, title) : strongestImage(frames, title);
    environment.output.write(Util::stringFromImage(image, options.raw));
    return kExitDone;
}

} // namespace ZorvaTouch::Tools
