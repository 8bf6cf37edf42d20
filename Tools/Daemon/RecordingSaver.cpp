#include "Tools/Daemon/RecordingSaver.h"

#include "Host/Runtime/Files.h"
#include "Shared/RecordingContainer.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Cli/LiveReport.h"
#include "Tools/Daemon/ReportHistory.h"

#include <algorithm>
#include <filesystem>
#include <new>
#include <system_error>

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

/// @throws SavingError  With the file's name in front.
template <typename Use> void named(const std::string &file, const Use &use) {
    try {
        use();
    } catch (const Host::FileFailure &failure) {
        throw SavingError(fileError(file, failure).what());
    }
}

struct FoundFile {
    std::string name;
    std::uint64_t bytes;
    std::filesystem::file_time_type time;
};

/// The regular files of these names.
std::vector<FoundFile> findFiles(std::span<const std::string> files) {
    std::vector<FoundFile> found;
    for (const std::string &name : files) {
        std::error_code error;
        if (!std::filesystem::is_regular_file(std::filesystem::symlink_status(name, error)))
            continue;
        const std::uint64_t bytes = std::filesystem::file_size(name, error);
        if (error)
            continue;
        const auto time = std::filesystem::last_write_time(name, error);
        if (!error)
            found.push_back({name, bytes, time});
    }
    return found;
}

} // namespace

void requireSavable(std::span<const std::string> files) {
    for (const std::string &file : files)
        named(file, [&] { Host::requireReplaceableName(file); });
    if (!files.empty())
        named(files.front(), [&] { Host::requireReplaceable(files.front()); });
}

std::size_t saveRecordingFile(const std::string &file, const SurfaceRecording &recording,
                              std::uint64_t mostBytes, const std::stop_token &abandoned) {
    if (abandoned.stop_requested())
        throw SavingError(file + ": not written, since saving was ended");
    const FrameList frames = withOlderReports(framesOfText(file, recording.text), recording.history);
    const std::string text = writeRecordingContainer(withNotes(recording.notes, frames, recording.timeNs));
    if (text.size() > mostBytes)
        throw SavingError(file + ": not written, since its " + std::to_string(text.size()) +
                          " bytes are more than the " + std::to_string(mostBytes) +
                          " that --save-bytes allows");
    named(file, [&] { Host::replacePrivateFile(file, text, abandoned); });
    return countReports(frames);
}

std::vector<std::string> removeOldestRecordings(std::span<const std::string> files, const std::string &kept,
                                                std::uint64_t mostBytes) {
    std::vector<FoundFile> found = findFiles(files);
    std::ranges::sort(found, {}, &FoundFile::time);
    std::uint64_t bytes = 0;
    for (const FoundFile &file : found)
        bytes += file.bytes;
    std::vector<std::string> removed;
    for (const FoundFile &file : found) {
        if (bytes <= mostBytes)
            break;
        std::error_code error;
        if (file.name == kept || !std::filesystem::remove(file.name, error))
            continue;
        bytes -= file.bytes;
        removed.push_back(file.name);
    }
    return removed;
}

} // namespace ZorvaTouch::Tools
