#include "Tools/Cli/Documents.h"

#include "Host/Runtime/Files.h"
#include "Tools/Cli/CliError.h"

#include <cerrno>
#include <cstdint>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

std::string shown(const std::string &name) { return name.empty() ? "''" : name; }

std::string frameError(const std::string &name, std::size_t index, const char *problem) {
    return inputTitle(name) + ": frame " + std::to_string(index) + ": " + problem;
}

std::string notARecording(const std::string &name, const std::string &reason) {
    return inputTitle(name) + ": not a ZorvaTouch recording (" + reason + ")";
}

std::string reasonOf(const ContainerError &error) {
    return error.reason.empty() ? error.problem : error.reason + ", byte " + std::to_string(error.offset);
}

Host::Input openDocument(const std::string &name, Environment &environment) {
    return name == kStandardStreamName ? environment.openInput() : Host::openInput(name);
}

/// The pieces of a text, counted on a bar.
Util::TextPieces watchedPieces(Host::Input input, Progress &progress) {
    progress.begin("reading", input.size);
    return [read = std::move(input.read), &progress, done = std::uint64_t{0}](char *to,
                                                                              std::size_t size) mutable {
        const std::size_t count = read(to, size);
        progress.update(done += count);
        return count;
    };
}

} // namespace

std::string inputTitle(const std::string &name) {
    return name == kStandardStreamName ? "standard input" : shown(name);
}

std::string readDocument(const std::string &name, Environment &environment) {
    try {
        return Host::readAll(openDocument(name, environment));
    } catch (const Host::FileFailure &failure) {
        throw fileError(inputTitle(name), failure);
    }
}

RecordingContainer readRecording(const std::string &name, Environment &environment, Progress &progress) {
    try {
        return readRecordingContainer(watchedPieces(openDocument(name, environment), progress));
    } catch (const Host::FileFailure &failure) {
        throw fileError(inputTitle(name), failure);
    } catch (const FrameError &error) {
        throw CliError(frameError(name, error.frameIndex, error.what()));
    } catch (const ContainerError &error) {
        if (error.frameIndex)
            throw CliError(frameError(name, *error.frameIndex, error.problem.c_str()));
        throw CliError(notARecording(name, reasonOf(error)));
    } catch (const std::invalid_argument &error) {
        throw CliError(notARecording(name, error.what()));
    }
}

RecordingContainer readRecording(const std::string &name, Environment &environment) {
    Progress progress(environment, inputTitle(name));
    return readRecording(name, environment, progress);
}

void writeDocument(const std::string &name, std::string_view text, Environment &environment) {
    if (name == kStandardStreamName)
        return environment.output.write(text);
    try {
        Host::replaceFile(name, text);
    } catch (const Host::FileFailure &failure) {
        if (failure.code().value() == EPIPE)
            throw ClosedPipe();
        throw fileError(shown(name), failure);
    }
}

void writeRecording(const std::string &name, const FrameList &frames, Environment &environment,
                    Progress &progress) {
    ContainerWriter writer;
    std::size_t done = 0;
    progress.begin("writing", frames.size());
    for (const FrameView &frame : frames) {
        writer.append(frame);
        progress.update(++done);
    }
    writer.finish();
    writeDocument(name, writer.text(), environment);
}

} // namespace ZorvaTouch::Tools
