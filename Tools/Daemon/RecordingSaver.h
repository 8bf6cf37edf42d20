#pragma once

#include "Shared/FrameList.h"
#include "Tools/Daemon/RecordingNotes.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <stdexcept>
#include <stop_token>
#include <string>
#include <vector>

/// Recordings as files.
namespace ZorvaTouch::Tools {

/// A recording that was not saved, or not as it was made. `what()` is one line that begins with the file's
/// name.
class SavingError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// A surface's recording, taken at one time and not yet put together.
struct SurfaceRecording {
    std::string text;         ///< what the service's property "Recording" gives
    FrameList history;        ///< the surface's reports; those that the text no longer has are put in front
    RecordingNotes notes;     ///< come first
    std::uint64_t timeNs = 0; ///< of the notes, if there is no frame
};

/// Checks whether recordings can be saved there, as far as that can be found out beforehand: rather at the
/// start than when it is too late.
/// @param files  In one folder.
/// @throws SavingError
void requireSavable(std::span<const std::string> files);

/// Saves a recording, for nobody but its owner: it shows what somebody did. An older file is replaced only
/// when the new one is complete, and has been read again and compared; a file that is not regular is not
/// replaced, nor is a symbolic link followed.
/// @param mostBytes  A longer file is not written.
/// @param abandoned  Once it is requested, nothing is saved any more.
/// @return The input reports in it.
/// @throws SavingError, std::bad_alloc
std::size_t saveRecordingFile(const std::string &file, const SurfaceRecording &recording,
                              std::uint64_t mostBytes, const std::stop_token &abandoned = {});

/// Removes the oldest recordings, by the time of their last change, until all of them together are no longer
/// than allowed. Only regular files count.
/// @param files  Where recordings may be.
/// @param kept   The one among them that stays.
/// @return The removed ones, oldest first.
/// @throws std::bad_alloc
[[nodiscard]] std::vector<std::string>
removeOldestRecordings(std::span<const std::string> files, const std::string &kept, std::uint64_t mostBytes);

} // namespace ZorvaTouch::Tools
