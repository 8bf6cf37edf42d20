#include "Tools/Cli/LiveReport.h"

#include "Shared/RecordingContainer.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Cli/Layout.h"
#include "Tools/Cli/OptionValues.h"

#include <algorithm>
#include <exception>
#include <filesystem>

namespace ZorvaTouch::Tools {
namespace {

/// A part of a property that is a dictionary; null if there is none.
PropertyValue partOf(const std::optional<PropertyValue> &property, std::string_view key) {
    const PropertyValue *const part = property ? property->find(key) : nullptr;
    return part ? *part : PropertyValue();
}

std::string recordingText(const HostedService &service) {
    const auto recording = service.property("Recording");
    const std::string *const text = recording ? recording->asString() : nullptr;
    if (!text)
        throw CliError(service.file() + ": the service has no recording");
    return *text;
}

} // namespace

std::string titleOf(const SimulatedFinger &finger) {
    std::string text("simulated finger, scenario ");
    text.append(finger.scenario->name).append(", seed ");
    Util::appendUnsigned(text, finger.seed);
    return text.append(", ").append(finger.seconds ? numberText(*finger.seconds) + " s" : "until Ctrl-C");
}

void writeHeading(const HostedService &service, const std::string &device, Environment &environment) {
    const std::string heading =
        std::filesystem::path(service.file()).filename().string() + ", service version " + service.version();
    appendColoured(environment.output.text(), heading, Colour::Bold, environment.usesColour);
    environment.output.write("\n" + device + "\n");
    environment.output.flush();
}

Counters readCounters(const HostedService &service, const GestureCounts &gestures) {
    const auto pipeline = service.property("Pipeline.DebugInfo");
    return {.gestures = gestures,
            .eventStats = partOf(service.property("Pipeline.Algs.DebugInfo"), "EventStats"),
            .resets = partOf(pipeline, "ResetCount").toUnsigned(),
            .disjointImages = partOf(pipeline, "DisjointImageCount").toUnsigned()};
}

FrameList saveRecording(const HostedService &service, const std::string &file, Environment &environment) {
    const std::string text = recordingText(service);
    writeDocument(file, text, environment);
    if (file != kStandardStreamName)
        return readRecording(file, environment).frames;
    try {
        return readRecordingContainer(text).frames;
    } catch (const std::exception &error) {
        throw CliError(service.file() + ": the recording cannot be read: " + error.what());
    }
}

std::size_t countReports(const FrameList &recording) {
    return static_cast<std::size_t>(
        std::count_if(recording.begin(), recording.end(),
                      [](const FrameView &frame) { return frame.type == FrameType::InputReport; }));
}

} // namespace ZorvaTouch::Tools
