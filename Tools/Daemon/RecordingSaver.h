#pragma once

#include <cstddef>
#include <stdexcept>
#include <string>
#include <string_view>

/// Recordings as files.
namespace ZorvaTouch::Tools {

/// A recording that was not saved, or not as it was made. `what()` is one line that begins with the file's
/// name.
class SavingError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Where the recording of a surface goes: the first one's to the file itself, and those of the others to
/// names of their own, "touch.json", "touch-2.json", "touch-3.json".
/// @param number  Of the surface, from 1, by the order in which they came.
[[nodiscard]] std::string fileOfSurface(const std::string &file, std::size_t number);

/// Whether recordings can be saved there, as far as that can be told beforehand: rather at the start than
/// when it is too late.
/// @throws SavingError
void requireSavable(const std::string &file);

/// Saves a recording, for nobody but its owner: it shows what somebody did. An older file is replaced only
/// when the new one is complete, and has been read again and compared; what is no regular file is not
/// replaced, nor is a symbolic link followed.
/// @param text  What the service's property "Recording" gives.
/// @return The input reports in it.
/// @throws SavingError, std::bad_alloc
std::size_t saveRecordingFile(const std::string &file, std::string_view text);

} // namespace ZorvaTouch::Tools
