#include "Tools/Cli/Documents.h"

#include "Host/Runtime/Files.h"
#include "Tools/Cli/CliError.h"

#include <optional>

namespace ZorvaTouch::Tools {
namespace {

std::string shown(const std::string &name) { return name.empty() ? "''" : name; }

std::string placeOf(const std::string &name, std::optional<std::size_t> frameIndex) {
    std::string place = inputTitle(name) + ": ";
    if (frameIndex)
        place.append("frame ").append(std::to_string(*frameIndex)).append(": ");
    return place;
}

} // namespace

std::string inputTitle(const std::string &name) {
    return name == kStandardStreamName ? "standard input" : shown(name);
}

std::string readDocument(const std::string &name, Environment &environment) {
    try {
        return name == kStandardStreamName ? environment.readInput() : Host::readFile(name);
    } catch (const Host::FileFailure &failure) {
        throw fileError(inputTitle(name), failure);
    }
}

RecordingContainer readRecording(const std::string &name, Environment &environment) {
    const std::string text = readDocument(name, environment);
    try {
        return readRecordingContainer(text);
    } catch (const FrameError &error) {
        throw CliError(placeOf(name, error.frameIndex) + error.what());
    } catch (const ContainerError &error) {
        const std::string reason = error.reason.empty() ? "" : " (" + error.reason + ")";
        throw CliError(placeOf(name, error.frameIndex) + error.what() + reason);
    } catch (const std::invalid_argument &error) {
        throw CliError(placeOf(name, std::nullopt) + error.what());
    }
}

void writeDocument(const std::string &name, std::string_view text, Environment &environment) {
    if (name == kStandardStreamName)
        return environment.output.write(text);
    try {
        Host::replaceFile(name, text);
    } catch (const Host::FileFailure &failure) {
        throw fileError(shown(name), failure);
    }
}

} // namespace ZorvaTouch::Tools
