#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {

/// Bounds of the recordings that are kept as files; the oldest go first.
struct RecordingLimits {
    std::size_t count = 16;                        ///< files, from 1
    std::uint64_t bytes = std::uint64_t{64} << 20; ///< of all files
};

/// The name of a recording's file: the first one has the name itself, and the others names of their own,
/// "touch.json", "touch-2.json", "touch-3.json".
/// @param number  From 1.
[[nodiscard]] std::string fileOfRecording(const std::string &file, std::size_t number);

/// Assigns files to recordings. A surface's first recording has its number by the order in which surfaces
/// came; a surface that comes back gets a further number, so that the recording of what made it go stays.
/// When there are as many as there may be, the oldest recording's number is used again, first that of a
/// surface that no longer writes to it.
///
/// Threads: one at a time.
class RecordingFiles {
public:
    /// @param count  From 1.
    RecordingFiles(std::string file, std::size_t count);

    /// Assigns a file to a surface that has none yet.
    void expect(const std::string &surface);
    /// The file that the surface's recording goes to until `finish`.
    /// @param hasReports  Whether there is anything in the recording.
    /// @return Nothing: the surface has come back, its recording is empty, and an older one exists.
    [[nodiscard]] std::optional<std::string> fileFor(const std::string &surface, bool hasReports);
    /// The recording is complete: the surface's next one goes to another file.
    void finish(const std::string &surface);

    /// The names of all files that there may be.
    [[nodiscard]] std::vector<std::string> names() const;

private:
    /// A file, by its place in the list.
    struct Slot {
        std::string surface;
        std::uint64_t order; ///< rises with each assignment
        bool isFinished = false;
    };

    [[nodiscard]] Slot *current(const std::string &surface);
    [[nodiscard]] bool isKnown(const std::string &surface) const;
    Slot &assign(const std::string &surface);
    [[nodiscard]] Slot &oldest();

    const std::string _file;
    const std::size_t _count;
    std::vector<Slot> _slots;
    std::uint64_t _assigned = 0;
};

} // namespace ZorvaTouch::Tools
