#include "Tools/Daemon/RecordingSaver.h"

#include "Host/Runtime/Files.h"
#include "Shared/RecordingContainer.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/LiveReport.h"

#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// @throws SavingError
FrameList framesOfText(const std::string &file, std::string_view text) {
    try {
        return readRecordingContainer(text).frames;
    } catch (const std::bad_alloc &) {
        throw;
    } catch (const std::exception &error) {
        throw SavingError(file + ": not written, since the service's recording is none: " + error.what());
    }
}

} // namespace

std::string fileOfSurface(const std::string &file, std::size_t number) {
    if (number <= 1)
        return file;
    const std::size_t name = file.rfind('/') + 1; // 0 without a folder
    const std::size_t dot = file.rfind('.');
    const bool hasEnding = dot != std::string::npos && dot > name;
    std::string result = file;
    return result.insert(hasEnding ? dot : file.size(), "-" + std::to_string(number));
}

void requireSavable(const std::string &file) {
    try {
        Host::requireReplaceable(file);
    } catch (const Host::FileFailure &failure) {
        throw SavingError(fileError(file, failure).what());
    }
}

std::size_t saveRecordingFile(const std::string &file, std::string_view text) {
    const FrameList recorded = framesOfText(file, text);
    try {
        Host::replacePrivateFile(file, text);
    } catch (const Host::FileFailure &failure) {
        throw SavingError(fileError(file, failure).what());
    }
    return countReports(recorded);
}

} // namespace ZorvaTouch::Tools
